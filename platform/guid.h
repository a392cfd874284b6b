#pragma once

#include "zrparsersql/wide_string.h"

namespace zr {

// A new random GUID as text in braces: 38 units, hexadecimal digits in upper case. 0, or the failure code of
// the system's service, with the text unchanged.
int createGuidText(CString& text);

}  // namespace zr
