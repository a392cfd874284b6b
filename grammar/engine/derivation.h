#pragma once

#include <cstdint>
#include <vector>

/// How a derivation is written down: what a search leaves and the tree builder reads.
namespace zr::engine {

/// A point of a path that the walk back needs: a branch taken, or a call that came back.
struct PathState {
    std::uint32_t low, high;
    std::uint32_t before;  ///< state before it on the path
    std::uint32_t child;   ///< entry whose end leads here, or kNone for a branch
    std::uint32_t childEnd;
    std::uint16_t node;  ///< where the path goes on
};

/// One end of an entry. Inside a run of closing tokens several ends stand for one: every position from
/// `low` to `high` can be the end, and who of the optional closers took which is settled afterwards.
struct PathEnd {
    std::uint32_t low, high;
    std::uint32_t state;   ///< last state of the path that leads here; kNone for tokens that were skipped
    std::uint8_t stopped;  ///< tail loops that stopped here although a round could start
    std::uint32_t next;    ///< next end of the same entry
};

/// A derivation by itself, without what the search for it knew besides.
struct Derivation {
    struct Part {
        std::uint16_t rule;
        std::uint32_t position;
        bool recovered;  ///< stands for tokens that were skipped where its rule didn't parse
    };
    std::vector<Part> parts;  ///< the first one is the whole
    std::vector<PathEnd> ends;
    std::vector<PathState> states;
    std::uint32_t endState = 0xFFFFFFFF;  ///< last state of the whole
};

}  // namespace zr::engine
