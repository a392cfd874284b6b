#pragma once

#include <cstddef>
#include <string_view>

namespace zr {

// Unicode's simple case mappings: every code point maps to one of the same length in UTF-16, so texts keep
// their length. The locale plays no part. Unpaired surrogates stay as they are.
void makeLower(char16_t* text, std::size_t length) noexcept;
void makeUpper(char16_t* text, std::size_t length) noexcept;

// Whether makeLower (makeUpper) would leave the text as it is. False when it is not known without mapping it.
bool isLowerAscii(std::u16string_view text) noexcept;
bool isUpperAscii(std::u16string_view text) noexcept;

// Below 0, 0 or above 0, by code points after simple case folding.
int compareNoCase(std::u16string_view left, std::u16string_view right) noexcept;

// Replaces the text by its simple case folding: texts that differ in case alone become equal.
void foldCase(char16_t* text, std::size_t length) noexcept;

bool isWhiteSpace(char16_t unit) noexcept;

}  // namespace zr
