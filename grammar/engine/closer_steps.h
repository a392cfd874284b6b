#pragma once

#include <cstdint>
#include <vector>

#include "grammar/engine/derivation.h"
#include "grammar/engine/tables.h"

/// The part of a path on which places are intervals (docs/recogniser.md, runs of closers), settled.
namespace zr::engine {

/// One element of a path with its exact place in the tokens.
struct Step {
    std::uint16_t node;
    std::uint32_t low, high;     ///< possible positions ahead of it
    std::uint32_t at;            ///< the position it really starts at
    std::uint32_t part, choice;  ///< of a Call: what it calls, and the first choice in there
};

/// The run of closers that was looked at last. Parts inside each other mostly end in one run: each would go
/// through it again.
class CloserRun {
 public:
    CloserRun(const std::vector<std::uint16_t>& types, std::uint16_t closer)
        : types_(types), closer_(closer) {}

    /// Where the run of closers that starts at a position ends.
    std::uint32_t endFrom(std::uint32_t position);

 private:
    const std::vector<std::uint16_t>& types_;
    const std::uint16_t closer_;
    std::uint32_t from_ = 0, to_ = 0;
};

/// Where somebody is who follows a derivation: the choice and the part that come next.
struct Cursor {
    std::uint32_t choice, part;
};

/// Writes the rest of a part out as steps, from `node` at `position` to an end at `exact`; `cursor` is where
/// it goes on.
void settleSteps(const ParserTable& table, const Derivation& derivation, CloserRun& run, std::uint16_t node,
                 std::uint32_t position, std::uint32_t exact, Cursor cursor, std::vector<Step>& steps);

}  // namespace zr::engine
