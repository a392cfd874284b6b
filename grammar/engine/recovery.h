#pragma once

#include <cstdint>

#include "grammar/engine/full_search.h"
#include "grammar/engine/options.h"
#include "grammar/engine/tables.h"
#include "grammar/engine/text_index.h"

/// Where a statement that can't be read may leave its recover rule out, and how far.
namespace zr::engine {

/// The last place where the statement that starts at `start` itself asks for its recover rule, as long as the
/// text up to there can be read; 0xFFFFFFFF for none. A place where the rule reads anything by itself is none
/// either: then it stands for that. Uses `search` for the rules on the way; `text` must not be cut, and isn't
/// afterwards.
std::uint32_t recoveryPlace(const ParserTable& table, TextIndex& text, const Options& options,
                            FullSearch& search, std::uint16_t rule, std::uint32_t start);

/// Where skipping ends that starts at a position in place of the recover rule: the first token that can
/// follow it at the same parenthesis depth, or the end of the full text.
std::uint32_t skippedTo(const ParserTable& table, const TextIndex& text, std::uint32_t position);

}  // namespace zr::engine
