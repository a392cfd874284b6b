#pragma once

#include <cstddef>
#include <cstdint>

namespace zr::engine {

/// Bounds of one recogniser run. Over a bound is a clean recognition error or the furthest reading found,
/// never a crash or a hang.
struct Options {
    /// Rules at work inside each other. A parenthesis costs about four, a sub-query about ten.
    std::uint32_t maxDepth = 200000;
    /// Rules called and ways that failed, in the search that tries one reading behind the other, since it
    /// last got further; past them one takes over that remembers. 0 leaves both out.
    std::uint32_t quickSteps = 16;
    /// Steps for each token of the text that this one may take.
    std::uint32_t rememberingSteps = 48;
    /// Steps of the search that takes over then: a fixed part and a part for each token. Most text needs less
    /// than a tenth of it. Where that isn't enough, only a first part of the text is read, and a notice goes
    /// to the diagnostics.
    std::uint64_t baseSteps = 2000000;
    std::uint64_t stepsPerToken = 1000;
    /// What one search may remember: places it was at, ends it found, steps of the way. Each takes some
    /// thirty bytes. Past them as past the steps.
    std::size_t maxMemo = 20000000;
    /// UTF-16 units of one text, and tokens in it. A text beyond either has no reading, and no more than this
    /// of it is cut into tokens.
    std::uint32_t maxUnits = std::uint32_t{32} << 20;
    std::uint32_t maxTokens = 2000000;
};

/// What a thread keeps at most of the memory of its last search, and of its last tree, for the next one. The
/// builder and the nodes that it joins have half of a tree's each.
constexpr std::size_t kSpareBytes = std::size_t{32} << 20;

}  // namespace zr::engine
