#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>

#include "grammar/engine/tables.h"

/// The one place where the automaton of a lexer runs.
namespace zr::engine {

struct LexerMatch {
    std::uint16_t rule;  ///< kNone16 when no token starts here
    const char16_t* end;
};

inline std::uint32_t lexerClassOf(const LexerTable& table, char16_t unit) {
    if (unit < 128) return table.asciiClass[unit];
    return std::upper_bound(table.ranges, table.ranges + table.rangeCount, unit,
                            [](char16_t u, const UnitRange& r) { return u < r.low; })[-1]
        .cls;
}

/// What a text has shown to lead nowhere: quotes that nothing closes. A match that stayed in one state up to
/// the end of the text and took nothing by it tells that every other one that comes into this state behind
/// the same place does so too. Without that, a text of opening quotes would be gone over once for each of
/// them.
class LexerDeadEnds {
 public:
    bool holds(std::uint16_t state, const char16_t* at) const {
        for (std::uint32_t i = 0; i < count_; ++i)
            if (ends_[i].state == state && ends_[i].from <= at) return true;
        return false;
    }
    /// Notes a match from `at` that came to the end.
    void note(const LexerTable& table, const char16_t* at, const char16_t* end) {
        constexpr std::ptrdiff_t kFewUnits = 16;
        if (end - at < kFewUnits) return;
        DeadEnd last{0, at};
        for (; at < end; ++at) {
            const std::uint16_t state = table.next[last.state * table.classes + lexerClassOf(table, *at)];
            if (state != last.state) last = {state, at};
        }
        if (table.accept[last.state] != kNone16 || end - last.from < kFewUnits) return;
        ends_[noted_++ % kMost] = last;
        count_ = std::min(noted_, kMost);
    }

 private:
    struct DeadEnd {
        std::uint16_t state;
        const char16_t* from;
    };
    /// As many kinds of quotes as a grammar may be expected to have.
    static constexpr std::uint32_t kMost = 4;

    DeadEnd ends_[kMost] = {};
    std::uint32_t count_ = 0, noted_ = 0;
};

/// The longest match where the automaton stops behind a whole token after a few units, as it nearly always
/// does: no place that it passes on its way needs to be noted. No rule else.
inline LexerMatch shortMatch(const LexerTable& table, const char16_t* at, const char16_t* end) {
    constexpr std::ptrdiff_t kFewUnits = 32;
    const char16_t* const start = at;
    const char16_t* const few = end - at > kFewUnits ? at + kFewUnits : end;
    const std::uint16_t* const next = table.next;
    const std::size_t classes = table.classes;
    std::uint16_t state = 0;
    for (; at < few; ++at) {
        const std::uint16_t to = next[state * classes + lexerClassOf(table, *at)];
        if (to == kNone16) return {at == start ? kNone16 : table.accept[state], at};
        state = to;
    }
    return {at == end && at != start ? table.accept[state] : kNone16, at};
}

/// The longest match over all rules at `at`, the first rule of equal ones. The dead ends are those of the
/// text.
inline LexerMatch longestMatch(const LexerTable& table, const char16_t* at, const char16_t* end,
                               LexerDeadEnds& deadEnds) {
    if (const LexerMatch match = shortMatch(table, at, end); match.rule != kNone16) return match;
    LexerMatch best{kNone16, at};
    const char16_t* const start = at;
    const std::uint16_t* const next = table.next;
    const std::uint16_t* const accept = table.accept;
    const std::size_t classes = table.classes;
    std::uint16_t state = 0;
    for (; at < end; ++at) {
        state = next[state * classes + lexerClassOf(table, *at)];
        if (state == kNone16) break;
        if (const std::uint16_t rule = accept[state]; rule != kNone16)
            best = {rule, at + 1};
        else if (deadEnds.holds(state, at))
            return best;
    }
    if (at == end && best.end != end) deadEnds.note(table, start, end);
    return best;
}

}  // namespace zr::engine
