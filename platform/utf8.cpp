#include "platform/utf8.h"

#include <cstdint>

namespace zr {
namespace {

constexpr char16_t kReplacement = 0xFFFD;

constexpr bool isLead(char16_t unit) {
    return (unit & 0xFC00) == 0xD800;
}
constexpr bool isTrail(char16_t unit) {
    return (unit & 0xFC00) == 0xDC00;
}

void appendCodePoint(std::u16string& units, std::uint32_t codePoint) {
    if (codePoint < 0x10000) {
        units += static_cast<char16_t>(codePoint);
        return;
    }
    units += static_cast<char16_t>(0xD7C0 + (codePoint >> 10));
    units += static_cast<char16_t>(0xDC00 + (codePoint & 0x3FF));
}

// What a first byte says: how many bytes follow, and the range of the first of them, which keeps out overlong
// forms and numbers beyond U+10FFFF. The three-byte forms of surrogates are let through.
struct Form {
    int following;
    std::uint8_t low;
    std::uint8_t high;
};

constexpr Form formOf(std::uint8_t first) {
    if (first >= 0xC2 && first <= 0xDF) return {1, 0x80, 0xBF};
    if (first == 0xE0) return {2, 0xA0, 0xBF};
    if (first >= 0xE1 && first <= 0xEF) return {2, 0x80, 0xBF};
    if (first == 0xF0) return {3, 0x90, 0xBF};
    if (first >= 0xF1 && first <= 0xF3) return {3, 0x80, 0xBF};
    if (first == 0xF4) return {3, 0x80, 0x8F};
    return {0, 0, 0};
}

}  // namespace

std::u16string utf8ToUtf16(std::string_view bytes) {
    std::u16string units;
    units.reserve(bytes.size());
    for (std::size_t at = 0; at < bytes.size();) {
        const auto first = static_cast<std::uint8_t>(bytes[at++]);
        if (first < 0x80) {
            units += static_cast<char16_t>(first);
            continue;
        }
        Form form = formOf(first);
        std::uint32_t codePoint = first & (0x3F >> form.following);
        bool complete = form.following > 0;
        for (int left = form.following; left > 0; --left) {
            const std::uint8_t next =
                at < bytes.size() ? static_cast<std::uint8_t>(bytes[at]) : std::uint8_t{0};
            if (next < form.low || next > form.high) {
                complete = false;
                break;
            }
            codePoint = codePoint << 6 | (next & 0x3F);
            form.low = 0x80;
            form.high = 0xBF;
            ++at;
        }
        if (complete)
            appendCodePoint(units, codePoint);
        else
            units += kReplacement;
    }
    return units;
}

std::string utf16ToUtf8(std::u16string_view units) {
    std::string bytes;
    bytes.reserve(units.size());
    for (std::size_t at = 0; at < units.size(); ++at) {
        std::uint32_t codePoint = units[at];
        if (codePoint < 0x80) {
            bytes += static_cast<char>(codePoint);
            continue;
        }
        if (isLead(units[at]) && at + 1 < units.size() && isTrail(units[at + 1]))
            codePoint = ((codePoint - 0xD7C0) << 10) + (units[++at] - 0xDC00u);
        if (codePoint < 0x800) {
            bytes += static_cast<char>(0xC0 | codePoint >> 6);
        } else {
            if (codePoint < 0x10000) {
                bytes += static_cast<char>(0xE0 | codePoint >> 12);
            } else {
                bytes += static_cast<char>(0xF0 | codePoint >> 18);
                bytes += static_cast<char>(0x80 | (codePoint >> 12 & 0x3F));
            }
            bytes += static_cast<char>(0x80 | (codePoint >> 6 & 0x3F));
        }
        bytes += static_cast<char>(0x80 | (codePoint & 0x3F));
    }
    return bytes;
}

}  // namespace zr
