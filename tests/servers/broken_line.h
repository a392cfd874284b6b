#pragma once

#include <atomic>
#include <cstddef>
#include <string>
#include <thread>

namespace zr::test {

// A line to a server on 127.0.0.1 that breaks: behind a count of the server's bytes it is cut, or stays open
// and carries nothing more.
class BrokenLine {
 public:
    enum class Break { Cut, Silent };
    BrokenLine(unsigned serverPort, std::size_t bytes, Break way);
    ~BrokenLine();
    BrokenLine(const BrokenLine&) = delete;
    BrokenLine& operator=(const BrokenLine&) = delete;

    std::string port() const { return std::to_string(port_); }

 private:
    void carry();

    unsigned serverPort_;
    std::size_t bytes_;
    Break way_;
    int listener_ = -1;
    unsigned port_ = 0;
    std::atomic<bool> isOver_ = false;
    std::thread carrier_;
};

}  // namespace zr::test
