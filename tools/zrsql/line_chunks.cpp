#include "line_chunks.h"

#include <poll.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>

namespace zr::tool {

SkippedLines LineChunks::skip(std::uint64_t lines) {
    SkippedLines skipped;
    while (skipped.lines < lines) {
        const auto chunk = nextUpTo(lines - skipped.lines);
        if (!chunk) break;
        skipped.lines += nextLine_ - chunk->firstLine;
        skipped.bytes += chunk->lines.size();
    }
    return skipped;
}

std::optional<LineChunk> LineChunks::next() {
    return nextUpTo(kMostLines);
}

std::optional<LineChunk> LineChunks::nextUpTo(std::uint64_t lines) {
    while (!interrupted_) {
        if (auto chunk = cut(std::min<std::uint64_t>(lines, kMostLines))) return chunk;
        if (!fill()) break;
    }
    if (interrupted_ || start_ == buffer_.size()) return std::nullopt;
    return take(buffer_.size(), 1);
}

std::optional<LineChunk> LineChunks::cut(std::uint64_t mostLines) {
    std::size_t end = start_;
    std::uint64_t lines = 0;
    while (lines < mostLines && end - start_ < kMostBytes) {
        const std::size_t lineEnd = buffer_.find('\n', scanned_);
        if (lineEnd == std::string::npos) {
            scanned_ = buffer_.size();
            break;
        }
        scanned_ = end = lineEnd + 1;
        ++lines;
    }
    if (lines == 0) return std::nullopt;
    return take(end, lines);
}

LineChunk LineChunks::take(std::size_t end, std::uint64_t lines) {
    LineChunk chunk{buffer_.substr(start_, end - start_), nextLine_};
    start_ = end;
    nextLine_ += lines;
    return chunk;
}

// False at the end and after an interrupt.
bool LineChunks::fill() {
    if (ended_) return false;
    buffer_.erase(0, start_);
    scanned_ -= start_;
    start_ = 0;
    pollfd waiting[] = {{input_, POLLIN, 0}, {interrupt_, POLLIN, 0}};
    while (poll(waiting, 2, -1) < 0)
        if (errno != EINTR) throw ReadError(errno, std::generic_category());
    if (waiting[1].revents) {
        interrupted_ = true;
        return false;
    }
    const std::size_t before = buffer_.size();
    buffer_.resize(before + kMostBytes);
    ssize_t count;
    do count = read(input_, buffer_.data() + before, kMostBytes);
    while (count < 0 && errno == EINTR);
    const int problem = errno;
    buffer_.resize(before + static_cast<std::size_t>(count > 0 ? count : 0));
    if (count < 0) throw ReadError(problem, std::generic_category());
    ended_ = count == 0;
    return !ended_;
}

}  // namespace zr::tool
