#include "platform/case_mapping.h"

#include <unicode/uchar.h>
#include <unicode/utf16.h>

#include <algorithm>

namespace zr {
namespace {

constexpr bool isAscii(char16_t unit) {
    return unit < 0x80;
}
constexpr char16_t asciiLower(char16_t unit) {
    return unit >= u'A' && unit <= u'Z' ? static_cast<char16_t>(unit + 0x20) : unit;
}
constexpr char16_t asciiUpper(char16_t unit) {
    return unit >= u'a' && unit <= u'z' ? static_cast<char16_t>(unit - 0x20) : unit;
}

UChar32 fold(UChar32 codePoint) {
    return u_foldCase(codePoint, U_FOLD_CASE_DEFAULT);
}

template <class AsciiMap, class UnicodeMap>
void map(char16_t* text, std::size_t length, AsciiMap asciiMap, UnicodeMap unicodeMap) {
    for (std::size_t at = 0; at < length;) {
        if (isAscii(text[at])) {
            text[at] = asciiMap(text[at]);
            ++at;
            continue;
        }
        const std::size_t start = at;
        UChar32 codePoint;
        U16_NEXT(text, at, length, codePoint);
        const UChar32 mapped = unicodeMap(codePoint);
        // No simple mapping leads from one plane to another; should one ever do, the text keeps its length.
        if (mapped != codePoint && U16_LENGTH(mapped) == static_cast<int>(at - start)) {
            std::size_t out = start;
            U16_APPEND_UNSAFE(text, out, mapped);
        }
    }
}

}  // namespace

void makeLower(char16_t* text, std::size_t length) noexcept {
    map(text, length, asciiLower, [](UChar32 codePoint) { return u_tolower(codePoint); });
}

void makeUpper(char16_t* text, std::size_t length) noexcept {
    map(text, length, asciiUpper, [](UChar32 codePoint) { return u_toupper(codePoint); });
}

void foldCase(char16_t* text, std::size_t length) noexcept {
    map(text, length, asciiLower, fold);
}

bool isLowerAscii(std::u16string_view text) noexcept {
    return std::all_of(text.begin(), text.end(),
                       [](char16_t unit) { return isAscii(unit) && asciiLower(unit) == unit; });
}

bool isUpperAscii(std::u16string_view text) noexcept {
    return std::all_of(text.begin(), text.end(),
                       [](char16_t unit) { return isAscii(unit) && asciiUpper(unit) == unit; });
}

int compareNoCase(std::u16string_view left, std::u16string_view right) noexcept {
    const std::size_t common = std::min(left.size(), right.size());
    std::size_t at = 0;
    for (; at < common; ++at) {
        const char16_t a = left[at];
        const char16_t b = right[at];
        if (a == b) continue;
        if (!isAscii(a) || !isAscii(b)) break;
        const char16_t lowerA = asciiLower(a);
        const char16_t lowerB = asciiLower(b);
        if (lowerA != lowerB) return lowerA < lowerB ? -1 : 1;
    }
    if (at == common) return left.size() == right.size() ? 0 : left.size() < right.size() ? -1 : 1;

    // The first differing unit may be the second half of a pair whose first halves are equal.
    const auto isSecondHalf = [at](std::u16string_view text) {
        return at > 0 && U16_IS_TRAIL(text[at]) && U16_IS_LEAD(text[at - 1]);
    };
    if (isSecondHalf(left) || isSecondHalf(right)) --at;
    std::size_t a = at;
    std::size_t b = at;
    while (a < left.size() && b < right.size()) {
        UChar32 codePointA;
        UChar32 codePointB;
        U16_NEXT(left.data(), a, left.size(), codePointA);
        U16_NEXT(right.data(), b, right.size(), codePointB);
        if (codePointA == codePointB) continue;
        codePointA = fold(codePointA);
        codePointB = fold(codePointB);
        if (codePointA != codePointB) return codePointA < codePointB ? -1 : 1;
    }
    if (a == left.size() && b == right.size()) return 0;
    return a == left.size() ? -1 : 1;
}

bool isWhiteSpace(char16_t unit) noexcept {
    if (isAscii(unit)) return unit == u' ' || (unit >= u'\t' && unit <= u'\r');
    return u_isUWhiteSpace(unit);
}

}  // namespace zr
