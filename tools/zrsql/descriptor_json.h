#pragma once

#include <string>

#include "zrparsersql/query_info.h"

namespace zr::tool {

// Appends a query's descriptor as one JSON object with the members under their own names, nested queries and
// items included, however deep. Maps are written with their keys in order of units, so that equal descriptors
// give equal texts.
void appendQuery(std::string& out, const CZRQueryInfo& query);

// The same order and form for a map from text to text.
void appendTextMap(std::string& out, const CMapStringToString& map);

}  // namespace zr::tool
