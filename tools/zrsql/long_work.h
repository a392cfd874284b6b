#pragma once

#include <chrono>
#include <csignal>
#include <cstddef>
#include <stdexcept>
#include <string>

namespace zr::tool {

// The user has interrupted a piece of work; the message tells how far it was.
class Interrupted : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

// A piece of work of many steps. While it lives an interrupt (SIGINT, SIGTERM) lets the next step raise
// Interrupted, and a second one ends the program at once. On a terminal standard error shows how far it is.
// One at a time.
class LongWork {
 public:
    // What is being done, such as "analysing shop.json".
    explicit LongWork(std::string what);
    ~LongWork();
    LongWork(const LongWork&) = delete;
    LongWork& operator=(const LongWork&) = delete;

    void step(std::size_t done, std::size_t all);

 private:
    void show(std::size_t done, std::size_t all);

    const std::string what_;
    const bool isShown_;
    bool hasLine_ = false;
    std::chrono::steady_clock::time_point next_;
    struct sigaction oldInterrupt_ = {};
    struct sigaction oldEnd_ = {};
};

}  // namespace zr::tool
