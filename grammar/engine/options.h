#pragma once

#include <cstddef>
#include <cstdint>

namespace zr::engine {

/// Bounds of one recogniser run. Over a bound is a clean recognition error or the furthest reading found,
/// never a crash or a hang.
struct Options {
    /// Rules at work inside each other. A parenthesis costs about four, a sub-query about ten.
    std::uint32_t maxDepth = 200000;
    /// Search steps for a text that can't be read to its end: a fixed part and a part for each token. Text
    /// that is read to its end never comes near it.
    std::uint64_t baseSteps = 200000;
    std::uint64_t stepsPerToken = 600;
    /// Tokens of one text.
    std::uint32_t maxTokens = 20000000;
};

}  // namespace zr::engine
