#pragma once

#include <string>
#include <string_view>

namespace zr {

// As CString::fromUtf8 and CString::toUtf8 promise it.
std::u16string utf8ToUtf16(std::string_view bytes);
std::string utf16ToUtf8(std::u16string_view units);

}  // namespace zr
