#pragma once

#include <chrono>
#include <cstdint>
#include <cstdio>
#include <optional>
#include <string>

namespace zr::tool {

// How far a run over many lines is.
struct BatchState {
    std::uint64_t skipped = 0;              // lines passed over ahead of the run
    std::uint64_t done = 0;                 // lines that have their answer
    std::uint64_t failed = 0;               // lines answered with an error, not among those
    std::uint64_t bytes = 0;                // of the input, answered
    std::optional<std::uint64_t> allBytes;  // where the input's size is known
    std::chrono::milliseconds elapsed{0};
    bool interrupted = false;
};

// "1500 queries, 300/s, 0:25 left"; without the time where the size is not known.
std::string progressText(const BatchState& state);

// "1498 done, 2 failed, 0:30 (50/s)", with "interrupted: " ahead where that is so, and then with the option
// that goes on.
std::string summaryText(const BatchState& state);

// Shows how far a piece of work is, not more often than a person can read: in one line of a terminal, else in
// lines of their own.
class Progress {
 public:
    Progress(std::FILE* shownOn, bool isTerminal) : out_(shownOn), isTerminal_(isTerminal) {}

    // Whether it is time to show something.
    bool isDue(std::chrono::milliseconds elapsed) const;
    void show(std::chrono::milliseconds elapsed, const std::string& text);
    // The last line.
    void end(const std::string& text);
    // Takes away what stands in a terminal's line.
    void clear();

 private:
    void write(const std::string& text, bool isLast);

    std::FILE* out_;
    const bool isTerminal_;
    std::optional<std::chrono::milliseconds> shown_;
    std::size_t width_ = 0;  // of what stands in the terminal's line
};

}  // namespace zr::tool
