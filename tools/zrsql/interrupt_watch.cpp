#include "interrupt_watch.h"

#include <unistd.h>

#include <cerrno>
#include <system_error>

namespace zr::tool {

namespace {

// Those that end a program which does nothing about them.
sigset_t interruptsThatCount() {
    sigset_t set;
    sigemptyset(&set);
    for (const int signal : {SIGINT, SIGTERM}) {
        struct sigaction now {};
        if (sigaction(signal, nullptr, &now) == 0 && now.sa_handler != SIG_IGN) sigaddset(&set, signal);
    }
    return set;
}

int lastOf(const sigset_t& set) {
    return sigismember(&set, SIGTERM) ? SIGTERM : sigismember(&set, SIGINT) ? SIGINT : 0;
}

}  // namespace

InterruptWatch::InterruptWatch(std::function<void()> onInterrupt)
    : interrupts_(interruptsThatCount()), last_(lastOf(interrupts_)), onInterrupt_(std::move(onInterrupt)) {
    if (pipe(pipe_.data()) != 0) throw std::system_error(errno, std::generic_category(), "no pipe");
    pthread_sigmask(SIG_BLOCK, &interrupts_, &before_);
    if (last_) thread_ = std::thread([this] { watch(); });
}

InterruptWatch::~InterruptWatch() {
    if (thread_.joinable()) {
        isOver_ = true;
        pthread_kill(thread_.native_handle(), last_);  // ends its waiting
        thread_.join();
    }
    pthread_sigmask(SIG_SETMASK, &before_, nullptr);
    close(pipe_[0]);
    close(pipe_[1]);
}

// The signal, or 0 when there is nothing to wait for any more.
int InterruptWatch::waitForInterrupt() const {
    int signal = 0;
    sigwait(&interrupts_, &signal);
    return isOver_ ? 0 : signal;
}

void InterruptWatch::watch() {
    if (!waitForInterrupt()) return;
    interrupted_ = true;
    onInterrupt_();
    // Without room in the pipe something stands in it, which does as well.
    [[maybe_unused]] const ssize_t written = write(pipe_[1], "", 1);
    const int second = waitForInterrupt();
    if (!second) return;
    pthread_sigmask(SIG_UNBLOCK, &interrupts_, nullptr);
    raise(second);
}

}  // namespace zr::tool
