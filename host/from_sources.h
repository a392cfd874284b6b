#pragma once

#include <vector>

#include "zrparsersql/query_info.h"

namespace zr::host {

// Something that a FROM clause names: a table (or what is named like one), or a nested query.
struct FromSource {
    const SelectItemField* table = nullptr;
    const CZRQueryInfo* query = nullptr;
    CString alias;  // empty: none
    // A bare name behind both sides of a join, as MySQL's grammar leaves the last alias of joins without ON.
    bool isBehindJoin = false;
};

// The sources of a query's FROM clause, in order. Of any depth.
std::vector<FromSource> fromSources(const CZRQueryInfo& query);

}  // namespace zr::host
