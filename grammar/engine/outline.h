#pragma once

#include <cstdint>

#include "grammar/engine/tables.h"
#include "grammar/engine/text_index.h"

namespace zr::engine {

/// Where a statement that starts with the text can end at most, kNone where it can't be read at all: no
/// reading ends further on, but there may be none that ends there either. The grammar compiler's outline of
/// the statement tells it, in one step for each token.
inline std::uint32_t furthestEndByOutline(const ParserTable& table, const TextIndex& text) {
    const std::uint32_t count = text.count();
    if (table.outlineColumns == 0) return count;
    std::uint32_t state = table.outlineStart;
    std::uint32_t end = state & 1 ? 0 : TextIndex::kNone;
    for (std::uint32_t i = 0; i < count; ++i) {
        state = table.outlineNext[(state >> 1) * table.outlineColumns + table.outlineColumn[text.classAt(i)]];
        if (state == 0) break;
        if (state & 1) end = i + 1;
    }
    return end;
}

}  // namespace zr::engine
