#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <system_error>

namespace zr::tool {

class ReadError : public std::system_error {
 public:
    using std::system_error::system_error;
};

// Some whole lines of an input.
struct LineChunk {
    std::string lines;            // each with its line end, but for the last of an input that has none
    std::uint64_t firstLine = 0;  // its number in the input, from 1
};

struct SkippedLines {
    std::uint64_t lines = 0;
    std::uint64_t bytes = 0;
};

// Reads the lines of an open file or pipe in chunks. A chunk holds what is there: no line waits for input
// that comes behind it. Memory is bounded by the chunk and the longest line.
class LineChunks {
 public:
    static constexpr std::size_t kMostLines = 32;
    static constexpr std::size_t kMostBytes = 1 << 16;  // a chunk ends with the line that reaches this

    // Neither is closed. The reading ends as soon as `interrupt` can be read from; -1: never.
    LineChunks(int input, int interrupt) : input_(input), interrupt_(interrupt) {}

    // Passes lines over, as many as there are. Throws ReadError.
    SkippedLines skip(std::uint64_t lines);
    // The next chunk, or nothing at the end and after an interrupt. Throws ReadError.
    std::optional<LineChunk> next();

 private:
    std::optional<LineChunk> nextUpTo(std::uint64_t lines);
    std::optional<LineChunk> cut(std::uint64_t mostLines);
    LineChunk take(std::size_t end, std::uint64_t lines);
    bool fill();

    const int input_;
    const int interrupt_;
    std::string buffer_;
    std::size_t start_ = 0;    // of what was not given yet
    std::size_t scanned_ = 0;  // between start_ and here is no line end
    std::uint64_t nextLine_ = 1;
    bool ended_ = false;
    bool interrupted_ = false;
};

}  // namespace zr::tool
