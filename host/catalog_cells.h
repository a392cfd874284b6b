#pragma once

#include <charconv>
#include <optional>
#include <string>
#include <vector>

#include "zrparsersql/wide_string.h"

namespace zr::host {

// The cells of a row that a database answers with, as UTF-8; one that is null is none.
using Cells = std::vector<std::optional<std::string>>;

inline CString textIn(const std::optional<std::string>& cell) {
    return CString::fromUtf8(cell.value_or(std::string()));
}

// 0 for what is no number.
inline int numberIn(const std::optional<std::string>& cell) {
    int number = 0;
    if (cell) std::from_chars(cell->data(), cell->data() + cell->size(), number);
    return number;
}

}  // namespace zr::host
