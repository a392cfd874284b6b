#pragma once

#include <cstdint>
#include <vector>

/// How a derivation is written down: what a search leaves and the tree builder reads.
namespace zr::engine {

/// The choices and calls of a derivation, both in the order in which somebody who follows it from the first
/// token on comes to them. All else is in the grammar.
struct Derivation {
    /// A call of a rule, the first one of all the whole. Inside a run of closing tokens several ends stand
    /// for one: every position from `low` to `high` can be the end, and who of the optional closers took
    /// which is settled afterwards.
    struct Part {
        std::uint32_t outer;     ///< the part that calls it; of the whole its own
        std::uint32_t position;  ///< where it starts
        std::uint32_t low, high;
        std::uint32_t choices, parts;  ///< what comes behind it in either list
        std::uint16_t node;            ///< the Call; of the whole 0xFFFF
        bool recovered;                ///< stands for tokens that were skipped where its rule didn't parse
    };
    std::uint16_t rule = 0;              ///< of the whole
    std::vector<std::uint16_t> choices;  ///< the node that a Choice goes on at
    std::vector<Part> parts;

    void start(std::uint16_t startRule, std::uint32_t position) {
        rule = startRule;
        choices.clear();
        parts.assign(1, {0, position, position, position, 0, 1, 0xFFFF, false});
    }
    /// The part at work is over.
    void end(std::uint32_t part, std::uint32_t low, std::uint32_t high) {
        parts[part].low = low;
        parts[part].high = high;
        parts[part].choices = static_cast<std::uint32_t>(choices.size());
        parts[part].parts = static_cast<std::uint32_t>(parts.size());
    }
};

}  // namespace zr::engine
