#pragma once

#include <cstddef>
#include <cstdint>
#include <vector>

#include "grammar/engine/tables.h"

/// How a derivation is written down: what a search leaves and the tree builder reads.
namespace zr::engine {

/// What a search has come to.
enum class SearchOutcome { Found, NotFound, TooDeep, OverBudget };

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
    std::vector<std::uint16_t> choices;  ///< the branch that is taken, see BranchRow
    std::vector<Part> parts;

    /// The bytes of memory that it keeps.
    std::size_t capacity() const {
        return parts.capacity() * sizeof(Part) + choices.capacity() * sizeof(std::uint16_t);
    }

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

/// The targets that the choices of a branch go on at, one behind the other.
class BranchPath {
 public:
    /// The target of the choice at hand: of the next in the branch at work, or of the first in another one,
    /// which `choice` then counts.
    std::uint16_t next(const ParserTable& table, const Derivation& derivation, std::uint32_t& choice) {
        if (at_ == end_) {
            const BranchRow& branch = table.branches[derivation.choices[choice++]];
            at_ = table.paths + branch.path;
            end_ = at_ + branch.length;
        }
        return *at_++;
    }

 private:
    const std::uint16_t* at_ = nullptr;
    const std::uint16_t* end_ = nullptr;
};

}  // namespace zr::engine
