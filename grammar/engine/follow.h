#pragma once

#include <bit>
#include <cstdint>

#include "grammar/engine/derivation.h"
#include "grammar/engine/tables.h"
#include "grammar/engine/text_index.h"

/// What the searches that try one reading behind the other have in common: how they go along a reading.
namespace zr::engine {

/// Whether a rule can start at a place, as far as the next tokens tell.
inline bool canCall(const ParserTable& table, TextIndex& text, const NodeRow& call, std::uint32_t& low,
                    std::uint32_t& high) {
    if (!text.settle(low, high)) return false;
    if (!table.rules[call.arg].nullable || (call.flags & kNonEmpty)) {
        if (!text.inSet(table.firstSetBase + call.arg, text.classAt(low))) return false;
    }
    return text.guarded(call, low);
}

/// Goes on from a place until the whole rule is over, which gives true, or the way fails. `Place` holds the
/// place in the text, `low` and `high`, and the `node` to go on at; `Search` moves it:
///
///     choose(place, node, branches)   to one of these branches, as TextIndex::viable tells them
///     call(place, node)               into a rule that can start there
///     isOver(place)                   says whether the rule at work, which is over, is the whole one
///     comeBack(place)                 out of it
template <class Search, class Place>
inline bool follow(Search& search, Place& place) {
    Place here = place;
    for (;;) {
        bool goesOn = false;
        const NodeRow& node = search.table_.nodes[here.node];
        switch (node.op) {
            case Op::Choice: {
                const std::uint32_t branches = search.text_.viable(node, here.low, here.high);
                goesOn = branches != 0 && search.choose(here, node, branches);
                if (!goesOn) break;
                continue;
            }
            case Op::Call:
                goesOn = canCall(search.table_, search.text_, node, here.low, here.high) &&
                         search.call(here, node);
                break;
            case Op::End:
                if (search.isOver(here)) {
                    place = here;
                    return true;
                }
                goesOn = search.comeBack(here);
                break;
            default:
                goesOn = search.text_.take(node, here.low, here.high);
                here.node = node.run;
                break;
        }
        if (!goesOn) break;
    }
    place = here;
    return false;
}

/// The first of these branches, which isn't among them any more.
inline std::uint32_t takeFirst(std::uint32_t& branches) {
    const auto branch = static_cast<std::uint32_t>(std::countr_zero(branches));
    branches &= branches - 1;
    return branch;
}

/// A choice that has branches left, and how much of the derivation had been written down there.
struct OpenChoice {
    struct Place {
        std::uint32_t low, high;
        std::uint32_t part, depth;
        std::uint16_t node;
    };
    Place place;
    std::uint32_t branches, choices, parts;

    /// Takes back from a derivation what was written down since.
    const Place& backIn(Derivation& derivation) const {
        derivation.choices.resize(choices);
        derivation.parts.resize(parts);
        return place;
    }
};

/// Where a reading should end, and where one ended instead.
struct ReadingEnd {
    std::uint32_t goal = 0;
    std::uint32_t furthest = 0;  ///< ahead of the goal
    bool hasFurthest = false;

    /// Whether a reading that ends at a position gets to the goal; notes where it ends instead.
    bool isGoal(std::uint32_t position) {
        if (position == goal) return true;
        if (!hasFurthest || position > furthest) furthest = position;
        hasFurthest = true;
        return false;
    }
};

}  // namespace zr::engine
