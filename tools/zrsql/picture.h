#pragma once

#include <string>

#include "analyst.h"
#include "zrparsersql/query_info.h"

namespace zr::tool {

// Appends what a person wants to see of an analysed query, as UTF-8 lines: the text, the result columns with
// where each comes from, the sources, the clauses, then the same for each nested query. When the text was not
// read to its end, the last line tells where the reading stopped.
void drawPicture(std::string& out, const CString& text, const CZRQueryInfo& query, const ReadPlace& place);

// The lines of a text, indented.
void appendSql(std::u16string& out, std::u16string_view text);
// That line about the place where the reading stopped, with an empty one before it; nothing when it did not.
void appendStop(std::u16string& out, const ReadPlace& place);

}  // namespace zr::tool
