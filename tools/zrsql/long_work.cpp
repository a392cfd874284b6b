#include "long_work.h"

#include <unistd.h>

#include <cstdio>

namespace zr::tool {

namespace {

constexpr auto kPatience = std::chrono::milliseconds(500);  // before the first line
constexpr auto kPause = std::chrono::milliseconds(100);     // between lines

// The one thing that a handler of signals may write.
volatile std::sig_atomic_t interrupts = 0;

void takeInterrupt(int) {
    interrupts = 1;
}

}  // namespace

LongWork::LongWork(std::string what)
    : what_(std::move(what)),
      isShown_(isatty(STDERR_FILENO) == 1),
      next_(std::chrono::steady_clock::now() + kPatience) {
    interrupts = 0;
    struct sigaction action = {};
    action.sa_handler = takeInterrupt;
    action.sa_flags = static_cast<int>(SA_RESETHAND | SA_RESTART);
    sigaction(SIGINT, &action, &oldInterrupt_);
    sigaction(SIGTERM, &action, &oldEnd_);
}

LongWork::~LongWork() {
    sigaction(SIGINT, &oldInterrupt_, nullptr);
    sigaction(SIGTERM, &oldEnd_, nullptr);
    if (hasLine_) std::fputs("\r\x1b[K", stderr);
}

void LongWork::step(std::size_t done, std::size_t all) {
    if (interrupts)
        throw Interrupted("interrupted while " + what_ + ": " + std::to_string(done) + " of " +
                          std::to_string(all) + " steps were done, and nothing was written");
    if (isShown_) show(done, all);
}

void LongWork::show(std::size_t done, std::size_t all) {
    const auto now = std::chrono::steady_clock::now();
    if (now < next_) return;
    next_ = now + kPause;
    hasLine_ = true;
    std::fprintf(stderr, "\rzrsql: %s: %zu of %zu steps\x1b[K", what_.c_str(), done, all);
    std::fflush(stderr);
}

}  // namespace zr::tool
