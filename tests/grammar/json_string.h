#pragma once

#include <string>
#include <string_view>

namespace zr::test {

/// `"..."` with every unit beyond ASCII as \uXXXX, one escape a unit: an unpaired surrogate comes out as it
/// is.
std::string quoteJson(std::u16string_view text);

/// Reads a JSON string at the start of `in` and moves `in` behind it. UTF-8 and \uXXXX both become UTF-16
/// units. Throws std::runtime_error when there is none.
std::u16string readJsonString(std::string_view& in);

/// UTF-8 to UTF-16; throws std::runtime_error on malformed input.
std::u16string fromUtf8(std::string_view text);

}  // namespace zr::test
