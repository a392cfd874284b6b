#pragma once

#include <functional>
#include <string>

#include "zrparsersql/query_info.h"

namespace zr::tool {

// Gives the text that stands for a nested query, such as "(query 2)".
using NameQuery = std::function<std::u16string(const CZRQueryInfo&)>;

// The item as a person would write it in SQL, up to parentheses, which items don't keep. Of any depth.
std::u16string expressionText(const SelectItem& item, const NameQuery& nameQuery);

// The qualified name of a column, or of a table where no column is told.
std::u16string fieldText(const SelectItemField& field);

}  // namespace zr::tool
