#pragma once

#include <string>
#include <string_view>

#include "recogniser.h"
#include "zrparsersql/db_types.h"

namespace zr::tool {

struct Dialect {
    std::string_view name;
    const Grammar* grammar;  // null: not part of this build
    DBTypes kind;            // DB_NONE: there is no analysis
};

// Null for a name that is no dialect's.
const Dialect* findDialect(std::string_view name);

// All names, for help and messages.
std::string dialectNames();

}  // namespace zr::tool
