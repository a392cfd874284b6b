#include "tests/grammar/json_string.h"

#include <cstdint>
#include <cstdio>
#include <stdexcept>

namespace zr::test {
namespace {

/// Takes one code point off the front of UTF-8 text.
char32_t takeCodePoint(std::string_view& in) {
    const auto lead = static_cast<unsigned char>(in.front());
    const std::size_t length = lead < 0x80 ? 1 : lead >= 0xF0 ? 4 : lead >= 0xE0 ? 3 : lead >= 0xC0 ? 2 : 0;
    if (length == 0 || in.size() < length) throw std::runtime_error("malformed UTF-8");
    char32_t point = length == 1 ? lead : lead & (0x3FU >> (length - 1));
    for (std::size_t i = 1; i < length; ++i) {
        const auto unit = static_cast<unsigned char>(in[i]);
        if ((unit & 0xC0) != 0x80) throw std::runtime_error("malformed UTF-8");
        point = (point << 6) | (unit & 0x3F);
    }
    in.remove_prefix(length);
    return point;
}

void append(std::u16string& out, char32_t point) {
    if (point < 0x10000) {
        out += static_cast<char16_t>(point);
        return;
    }
    point -= 0x10000;
    out += static_cast<char16_t>(0xD800 + (point >> 10));
    out += static_cast<char16_t>(0xDC00 + (point & 0x3FF));
}

char16_t takeHex(std::string_view& in) {
    if (in.size() < 4) throw std::runtime_error("\\u wants four digits");
    unsigned value = 0;
    for (int i = 0; i < 4; ++i) {
        const char c = in[static_cast<std::size_t>(i)];
        const bool letter = (c >= 'a' && c <= 'f') || (c >= 'A' && c <= 'F');
        if (!letter && (c < '0' || c > '9')) throw std::runtime_error("\\u wants four digits");
        value = value * 16 + static_cast<unsigned>(letter ? (c | 0x20) - 'a' + 10 : c - '0');
    }
    in.remove_prefix(4);
    return static_cast<char16_t>(value);
}

}  // namespace

std::string quoteJson(std::u16string_view text) {
    constexpr std::string_view kPlain = "\b\f\n\r\t\"\\";
    constexpr std::string_view kEscaped = "bfnrt\"\\";
    std::string out = "\"";
    for (const char16_t unit : text) {
        const auto found = unit < 0x80 ? kPlain.find(static_cast<char>(unit)) : std::string_view::npos;
        if (found != std::string_view::npos) {
            out += '\\';
            out += kEscaped[found];
        } else if (unit < 0x20 || unit >= 0x80) {
            char escape[8];
            std::snprintf(escape, sizeof escape, "\\u%04x", static_cast<unsigned>(unit));
            out += escape;
        } else {
            out += static_cast<char>(unit);
        }
    }
    return out + '"';
}

std::u16string readJsonString(std::string_view& in) {
    constexpr std::string_view kEscapes = "bfnrt\"\\/";
    constexpr std::string_view kUnits = "\b\f\n\r\t\"\\/";
    if (in.empty() || in.front() != '"') throw std::runtime_error("expected a JSON string");
    in.remove_prefix(1);
    std::u16string out;
    while (!in.empty()) {
        if (in.front() == '"') {
            in.remove_prefix(1);
            return out;
        }
        if (in.front() != '\\') {
            append(out, takeCodePoint(in));
            continue;
        }
        in.remove_prefix(1);
        const char escape = in.empty() ? '\0' : in.front();
        if (!in.empty()) in.remove_prefix(1);
        if (escape == 'u') {
            out += takeHex(in);
        } else if (const auto at = kEscapes.find(escape); at != std::string_view::npos) {
            out += static_cast<char16_t>(kUnits[at]);
        } else {
            throw std::runtime_error("unknown escape in a JSON string");
        }
    }
    throw std::runtime_error("a JSON string without its end");
}

std::u16string fromUtf8(std::string_view text) {
    std::u16string out;
    while (!text.empty()) append(out, takeCodePoint(text));
    return out;
}

}  // namespace zr::test
