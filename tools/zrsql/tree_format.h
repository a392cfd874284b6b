#pragma once

#include <string>

#include "recogniser.h"

namespace zr::tool {

enum class TreeFormat { Sexpr, Json, Dot, Pretty };

// Appends the tree of the grammar's start rule over the text. Sexpr and Json are one line without its end;
// Dot and Pretty are whole lines. Trees may be of any depth.
void appendTree(std::string& out, TreeFormat format, const Grammar& grammar, std::u16string_view text);

}  // namespace zr::tool
