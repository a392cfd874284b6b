#pragma once

#include <signal.h>

#include <array>
#include <atomic>
#include <functional>
#include <thread>

namespace zr::tool {

// For its time makes the first interrupt (SIGINT, SIGTERM) a call of a function, on a thread of its own; the
// second one ends the program as usual. Threads that are to be left alone by the signals are started after
// it. A program that was started to pass interrupts over passes them over.
class InterruptWatch {
 public:
    explicit InterruptWatch(std::function<void()> onInterrupt);
    ~InterruptWatch();
    InterruptWatch(const InterruptWatch&) = delete;
    InterruptWatch& operator=(const InterruptWatch&) = delete;

    bool wasInterrupted() const { return interrupted_; }
    // Can be read from once there was an interrupt.
    int descriptor() const { return pipe_[0]; }

 private:
    void watch();
    int waitForInterrupt() const;

    const sigset_t interrupts_;
    const int last_;  // of them; 0 when there is none
    const std::function<void()> onInterrupt_;
    std::array<int, 2> pipe_{};
    sigset_t before_{};
    std::atomic<bool> interrupted_ = false;
    std::atomic<bool> isOver_ = false;
    std::thread thread_;
};

}  // namespace zr::tool
