#pragma once

#include <string>

#include "dialects.h"

namespace zr::tool {

// Appends a query's text as HTML with a span for each stretch of one clause, of class "c-select", "c-from",
// "c-where", "c-group", "c-having", "c-order", "c-union" or "c-limit". What stands from `readTo` on was not
// read and is "unread"; npos when all was. The text is the one that is parsed.
void appendColouredSql(std::string& out, const Dialect& dialect, const CString& text, std::size_t readTo);

}  // namespace zr::tool
