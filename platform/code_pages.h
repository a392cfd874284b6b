#pragma once

#include <array>
#include <cstdint>
#include <string>
#include <string_view>

namespace zr {

// A single-byte encoding: the code point of each byte, 0 for bytes that have none.
using CodeTable = std::array<char16_t, 256>;
// The byte of each code point, '?' for those that have none.
using ReverseCodeTable = std::array<unsigned char, 65536>;

// The table of a filter value's encoding (filter_info.h): 3 to 26 by name, ISO 8859-1 for anything else.
// Tables are made when first asked for, never change and live as long as the process; any thread may ask. All
// here throw std::bad_alloc without memory.
const CodeTable& codeTable(int encoding);
const ReverseCodeTable& reverseCodeTable(int encoding);

// From and to the system's own encoding of narrow text. What it cannot hold becomes '?'; bytes that are no
// text become U+FFFD.
std::u16string systemToUtf16(std::string_view bytes);
std::string utf16ToSystem(std::u16string_view units);

}  // namespace zr
