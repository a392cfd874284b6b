#include "private_server.h"

#include <arpa/inet.h>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <csignal>
#include <filesystem>
#include <stdexcept>
#include <thread>

namespace zr::test {

namespace {

constexpr int kNotInstalled = 77;
constexpr auto kPatience = std::chrono::seconds(90);

void replaceAll(std::string& text, const std::string& from, const std::string& to) {
    for (std::size_t at = text.find(from); at != text.npos; at = text.find(from, at + to.size()))
        text.replace(at, from.size(), to);
}

}  // namespace

unsigned freePort() {
    const int descriptor = socket(AF_INET, SOCK_STREAM, 0);
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    socklen_t size = sizeof address;
    const bool isBound = bind(descriptor, reinterpret_cast<sockaddr*>(&address), size) == 0 &&
                         getsockname(descriptor, reinterpret_cast<sockaddr*>(&address), &size) == 0;
    close(descriptor);
    if (!isBound) throw std::runtime_error("there is no free port");
    return ntohs(address.sin_port);
}

void PrivateServer::start(const std::string& readyCheck) {
    folder_ = "/tmp/zrsql_server_XXXXXX";  // a socket's path has to be short
    if (!mkdtemp(folder_.data())) throw std::runtime_error("no folder for the server");
    port_ = freePort();
    const std::string log = folder_ + ".log";
    const std::string port = this->port();
    process_ = fork();
    if (process_ == 0) {
        const int output = open(log.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
        dup2(output, STDOUT_FILENO);
        dup2(output, STDERR_FILENO);
        execl(script_.c_str(), script_.c_str(), folder_.c_str(), port.c_str(), nullptr);
        _exit(126);
    }
    std::string check = readyCheck;
    replaceAll(check, "FOLDER", folder_);
    replaceAll(check, "PORT", port);
    const auto deadline = std::chrono::steady_clock::now() + kPatience;
    while (runShell(check).exitStatus != 0) {
        int status = 0;
        const bool isOver = waitpid(process_, &status, WNOHANG) == process_;
        if (isOver) process_ = 0;
        if (isOver && WIFEXITED(status) && WEXITSTATUS(status) == kNotInstalled)
            absence_ = readFile(log);
        else if (isOver || std::chrono::steady_clock::now() > deadline)
            ADD_FAILURE() << script_ << " started no server: " << readFile(log);
        else {
            std::this_thread::sleep_for(std::chrono::milliseconds(100));
            continue;
        }
        if (absence_.empty()) absence_ = "the server did not start";
        stop();
        return;
    }
}

void PrivateServer::stop() {
    if (process_ != 0) {
        kill(process_, SIGCONT);
        kill(process_, endSignal_);
        waitpid(process_, nullptr, 0);
        process_ = 0;
    }
    if (!folder_.empty()) {
        std::error_code ignored;
        std::filesystem::remove_all(folder_, ignored);
        std::filesystem::remove(folder_ + ".log", ignored);
    }
}

ProgramResult PrivateServer::shell(std::string line) const {
    replaceAll(line, "FOLDER", folder_);
    replaceAll(line, "PORT", port());
    ProgramResult result = runShell(line);
    EXPECT_EQ(result.exitStatus, 0) << line << "\n" << result.errors;
    return result;
}

}  // namespace zr::test
