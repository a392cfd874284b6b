#include "interrupt_watch.h"

#include <unistd.h>

#include <cerrno>
#include <system_error>

namespace zr::tool {

namespace {

sigset_t interrupts() {
    sigset_t set;
    sigemptyset(&set);
    sigaddset(&set, SIGINT);
    return set;
}

bool isPassedOver() {
    struct sigaction now {};
    return sigaction(SIGINT, nullptr, &now) == 0 && now.sa_handler == SIG_IGN;
}

}  // namespace

InterruptWatch::InterruptWatch(std::function<void()> onInterrupt) : onInterrupt_(std::move(onInterrupt)) {
    if (pipe(pipe_.data()) != 0) throw std::system_error(errno, std::generic_category(), "no pipe");
    const sigset_t set = interrupts();
    pthread_sigmask(SIG_BLOCK, &set, &before_);
    if (!isPassedOver()) thread_ = std::thread([this] { watch(); });
}

InterruptWatch::~InterruptWatch() {
    if (thread_.joinable()) {
        isOver_ = true;
        pthread_kill(thread_.native_handle(), SIGINT);  // ends its waiting
        thread_.join();
    }
    pthread_sigmask(SIG_SETMASK, &before_, nullptr);
    close(pipe_[0]);
    close(pipe_[1]);
}

// False when there is nothing to wait for any more.
bool InterruptWatch::waitForInterrupt() const {
    const sigset_t set = interrupts();
    int signal = 0;
    sigwait(&set, &signal);
    return !isOver_;
}

void InterruptWatch::watch() {
    if (!waitForInterrupt()) return;
    interrupted_ = true;
    onInterrupt_();
    // Without room in the pipe something stands in it, which does as well.
    [[maybe_unused]] const ssize_t written = write(pipe_[1], "", 1);
    if (!waitForInterrupt()) return;
    const sigset_t set = interrupts();
    pthread_sigmask(SIG_UNBLOCK, &set, nullptr);
    raise(SIGINT);
}

}  // namespace zr::tool
