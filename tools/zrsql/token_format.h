#pragma once

#include <string>

#include "recogniser.h"

namespace zr::tool {

// One token a line: number, tab, name, tab, text as a JSON string.
void appendTokenLines(std::string& out, const Grammar& grammar, std::u16string_view text);

// A JSON list of lists [number, name, text].
void appendTokenJson(std::string& out, const Grammar& grammar, std::u16string_view text);

}  // namespace zr::tool
