#pragma once

#include <cstdint>
#include <vector>

#include "grammar/engine/recogniser.h"

/// The part of a path on which places are intervals (docs/recogniser.md, runs of closers), settled.
namespace zr::engine {

/// One element of a path with its exact place in the tokens.
struct Step {
    std::uint16_t node;
    std::uint32_t low, high;  ///< possible positions ahead of it
    std::uint32_t at;         ///< the position it really starts at
    std::uint32_t child, childEnd;
};

/// Writes the rest of a path out as steps, from `node` at `position` to an end at `exact`. `path` holds the
/// states still to come, the next one last; those that are used are taken off.
void settleSteps(const ParserTable& table, const Recogniser& recogniser,
                 const std::vector<std::uint16_t>& types, std::uint16_t node, std::uint32_t position,
                 std::uint32_t exact, std::vector<std::uint32_t>& path, std::vector<Step>& steps);

}  // namespace zr::engine
