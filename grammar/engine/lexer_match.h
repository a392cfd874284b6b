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

/// The longest match over all rules at `at`, the first rule of equal ones.
inline LexerMatch longestMatch(const LexerTable& table, const char16_t* at, const char16_t* end) {
    LexerMatch best{kNone16, at};
    const std::uint16_t* const next = table.next;
    const std::uint16_t* const accept = table.accept;
    const std::size_t classes = table.classes;
    std::uint16_t state = 0;
    for (; at < end; ++at) {
        state = next[state * classes + lexerClassOf(table, *at)];
        if (state == kNone16) break;
        if (const std::uint16_t rule = accept[state]; rule != kNone16) best = {rule, at + 1};
    }
    return best;
}

}  // namespace zr::engine
