#pragma once

#include <string>
#include <string_view>

#include "recogniser.h"
#include "zrparsersql/db_types.h"
#include "zrparsersql/wide_string.h"

namespace zr::tool {

struct Dialect {
    std::string_view name;
    const Grammar* grammar;
    DBTypes kind;  // DB_NONE: there is no analysis
    // What the analysis does to a text before it is parsed; null: nothing.
    CString (*prepare)(const CString& text) = nullptr;
};

// Null for a name that is no dialect's.
const Dialect* findDialect(std::string_view name);

// The dialect by which a kind of database is analysed; null for a kind that has none.
const Dialect* findDialect(DBTypes kind);

// All names, or those with an analysis, for help and messages.
std::string dialectNames(bool withAnalysis = false);

}  // namespace zr::tool
