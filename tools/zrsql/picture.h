#pragma once

#include <string>

#include "analyst.h"
#include "zrparsersql/query_info.h"

namespace zr::tool {

// Appends what a person wants to see of an analysed query, as UTF-8 lines: the text, the result columns with
// where each comes from, the sources, the clauses, then the same for each nested query. When the text was not
// read to its end, the last line tells where the reading stopped.
void drawPicture(std::string& out, const CString& text, const CZRQueryInfo& query, const ReadPlace& place);

}  // namespace zr::tool
