#pragma once

#include <stdexcept>

#include "zrparsersql/db_types.h"
#include "zrparsersql/wide_string.h"

namespace zr::host {

class UnknownKind : public std::runtime_error {
 public:
    explicit UnknownKind(int kind)
        : std::runtime_error("there is no kind of database " + std::to_string(kind)) {}
};

// True for the kinds that have a name, apart from DB_NONE.
bool isKnownKind(DBTypes kind);

// The name in the quotes of the kind's dialect, with quotes inside of it doubled.
CString quoteName(const CString& name, DBTypes kind);

// The text as a literal.
CString quoteText(CString text);

}  // namespace zr::host
