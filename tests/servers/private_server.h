#pragma once

#include <sys/types.h>

#include <string>

#include "program.h"

namespace zr::test {

// A database server that runs for the tests of one program, with files and a port of its own. It ends with
// the object, or with the program.
class PrivateServer {
 public:
    // The script runs the server (run_*.sh); the signal ends it.
    PrivateServer(std::string script, int endSignal) : script_(std::move(script)), endSignal_(endSignal) {}
    ~PrivateServer() { stop(); }
    PrivateServer(const PrivateServer&) = delete;
    PrivateServer& operator=(const PrivateServer&) = delete;

    // Runs the script and waits until the line of shell succeeds; in it FOLDER and PORT stand for the
    // server's.
    void start(const std::string& readyCheck);
    void stop();

    // Why there is no server, where its programs are not installed; empty: it runs.
    const std::string& absence() const { return absence_; }
    const std::string& folder() const { return folder_; }
    std::string port() const { return std::to_string(port_); }
    pid_t process() const { return process_; }
    // A line of shell with FOLDER and PORT filled in. It fails the test when it does not end with status 0.
    ProgramResult shell(std::string line) const;

 private:
    std::string script_;
    int endSignal_;
    std::string absence_;
    std::string folder_;
    unsigned port_ = 0;
    pid_t process_ = 0;
};

// A port of 127.0.0.1 on which nobody listens now.
unsigned freePort();

}  // namespace zr::test
