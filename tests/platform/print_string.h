#pragma once

#include <ostream>
#include <string>

#include "zrparsersql/wide_string.h"

// Lets a failed expectation show text instead of bytes.
inline void PrintTo(const CString& text, std::ostream* out) {
    *out << '"' << text.toUtf8() << '"';
}
