#pragma once

#include <chrono>
#include <csignal>
#include <cstddef>
#include <functional>
#include <stdexcept>
#include <string>

#include "progress.h"
#include "summary.h"

namespace zr::tool {

// The user has interrupted a piece of work; the message tells how far it was.
class Interrupted : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

// A piece of work of many steps. While it lives an interrupt (SIGINT, SIGTERM) lets the next step raise
// Interrupted, and a second one of the kind ends the program at once; a program that was started to pass
// interrupts over passes them over. How far it is goes to standard error: on a terminal when it takes
// noticeably long, elsewhere when it is asked for. One at a time.
class LongWork {
 public:
    LongWork(std::string what, bool showsProgress);
    ~LongWork();
    LongWork(const LongWork&) = delete;
    LongWork& operator=(const LongWork&) = delete;

    // As long as nothing is worth being kept an interrupt may end the program at once, wherever it waits:
    // with this line and the status of interrupted programs.
    void endAtOnceWith(const std::string& line);
    // From here on it is the next step again that an interrupt ends.
    void endAtSteps();

    // Tells how far it is, such as "500 tables". Raises Interrupted.
    void step(const std::function<std::string()>& far);
    // Of work that writes nothing before its end: so many of the project's queries are "analysed".
    void step(const char* verb, std::size_t done, std::size_t all);

    std::chrono::milliseconds elapsed() const;

 private:
    const std::string what_;
    const bool isTerminal_;
    const bool isShown_;
    Progress progress_;
    const std::chrono::steady_clock::time_point start_ = std::chrono::steady_clock::now();
    struct sigaction oldInterrupt_ = {};
    struct sigaction oldEnd_ = {};
};

// The exit status of a program that was interrupted, as shells have it for SIGINT.
inline constexpr int kInterruptedStatus = 130;

}  // namespace zr::tool
