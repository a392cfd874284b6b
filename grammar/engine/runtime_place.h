#pragma once

#include <antlr3.h>

#include "grammar/engine/reports.h"

namespace zr::engine {

/// The place that the runtime means: it counts the columns of the first line from -1.
inline TextPlace placeOf(ANTLR3_UINT32 line, ANTLR3_INT32 column) {
    return {line, static_cast<std::uint32_t>(column + (line == 1 ? 1 : 0))};
}

}  // namespace zr::engine
