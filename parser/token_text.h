#pragma once

#include <antlr3.h>

#include <string_view>

#include "zrparsersql/wide_string.h"

namespace zr {

// The units that a token covers in the text it was read from, in place; empty for a token that was not read.
std::u16string_view tokenUnits(const ANTLR3_COMMON_TOKEN& token);

// What the runtime answers for the text of a token and of a tree node, without leaving a copy in its string
// factory.
CString tokenText(ANTLR3_COMMON_TOKEN& token);
CString nodeText(ANTLR3_BASE_TREE& node);

}  // namespace zr
