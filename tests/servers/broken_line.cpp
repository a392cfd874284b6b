#include "broken_line.h"

#include <arpa/inet.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <stdexcept>

namespace zr::test {

namespace {

constexpr int kLookMilliseconds = 20;

sockaddr_in loopback(unsigned port) {
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    address.sin_port = htons(static_cast<std::uint16_t>(port));
    return address;
}

bool sendAll(int to, const char* bytes, std::size_t count) {
    while (count > 0) {
        const ssize_t sent = send(to, bytes, count, MSG_NOSIGNAL);
        if (sent <= 0) return false;
        bytes += sent;
        count -= static_cast<std::size_t>(sent);
    }
    return true;
}

}  // namespace

BrokenLine::BrokenLine(unsigned serverPort, std::size_t bytes, Break way)
    : serverPort_(serverPort), bytes_(bytes), way_(way), listener_(socket(AF_INET, SOCK_STREAM, 0)) {
    sockaddr_in address = loopback(0);
    socklen_t size = sizeof address;
    if (bind(listener_, reinterpret_cast<sockaddr*>(&address), size) != 0 || listen(listener_, 8) != 0 ||
        getsockname(listener_, reinterpret_cast<sockaddr*>(&address), &size) != 0)
        throw std::runtime_error("no port to listen on");
    port_ = ntohs(address.sin_port);
    carrier_ = std::thread([this] { carry(); });
}

BrokenLine::~BrokenLine() {
    isOver_ = true;
    carrier_.join();
    close(listener_);
}

// One connection after the other.
void BrokenLine::carry() {
    while (!isOver_) {
        pollfd caller{listener_, POLLIN, 0};
        if (poll(&caller, 1, kLookMilliseconds) <= 0) continue;
        const int client = accept(listener_, nullptr, nullptr);
        const int server = socket(AF_INET, SOCK_STREAM, 0);
        const sockaddr_in address = loopback(serverPort_);
        bool isOpen = connect(server, reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0;
        std::size_t left = bytes_;
        while (isOpen && !isOver_) {
            pollfd ends[2] = {{client, POLLIN, 0}, {server, POLLIN, 0}};
            if (poll(ends, 2, kLookMilliseconds) <= 0) continue;
            char block[4096];
            if (ends[0].revents != 0) {
                const ssize_t count = recv(client, block, sizeof block, 0);
                isOpen = count > 0 && sendAll(server, block, static_cast<std::size_t>(count));
            }
            if (isOpen && ends[1].revents != 0) {
                const ssize_t count = recv(server, block, sizeof block, 0);
                const std::size_t some =
                    std::min(left, static_cast<std::size_t>(std::max<ssize_t>(count, 0)));
                isOpen = count > 0 && sendAll(client, block, some);
                left -= some;
                if (left == 0 && way_ == Break::Cut) isOpen = false;
            }
        }
        close(client);
        close(server);
    }
}

}  // namespace zr::test
