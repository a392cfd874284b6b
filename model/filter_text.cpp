#include "model/filter_text.h"

#include <cstring>

#include "platform/code_pages.h"
#include "zrparsersql/filter_info.h"

namespace zr {
namespace {

constexpr char16_t kUnmapped = u'?';

// Up to this many characters the result gets the largest room it can need; beyond, it is measured first.
constexpr std::size_t kMeasureAbove = 20'000'000;

// Each UTF-16 unit by itself, so that surrogates take three bytes each. The code points 128 and 2048 are
// dropped: intended, stored projects rely on it.
std::size_t utf8Length(char16_t unit) {
    if (unit < 128) return 1;
    if (unit > 128 && unit < 2048) return 2;
    return unit > 2048 ? 3 : 0;
}

std::string encodeUtf8(std::u16string_view units) {
    std::size_t room = units.size() * 4;
    if (units.size() > kMeasureAbove) {
        room = 0;
        for (char16_t unit : units) room += utf8Length(unit);
    }
    std::string bytes;
    bytes.reserve(room);
    for (char16_t unit : units) {
        switch (utf8Length(unit)) {
            case 1:
                bytes += static_cast<char>(unit);
                break;
            case 2:
                bytes += static_cast<char>(0xC0 | unit >> 6);
                bytes += static_cast<char>(0x80 | (unit & 0x3F));
                break;
            case 3:
                bytes += static_cast<char>(0xE0 | unit >> 12);
                bytes += static_cast<char>(0x80 | (unit >> 6 & 0x3F));
                bytes += static_cast<char>(0x80 | (unit & 0x3F));
                break;
            default:
                break;
        }
    }
    return bytes;
}

std::u16string decodeUtf8(std::string_view bytes) {
    std::u16string units;
    units.reserve(bytes.size());
    for (std::size_t at = 0; at < bytes.size();) {
        const auto first = static_cast<unsigned char>(bytes[at++]);
        const std::size_t following = first < 0xC0   ? 0
                                      : first < 0xE0 ? 1
                                      : first < 0xF0 ? 2
                                      : first < 0xF8 ? 3
                                                     : 0;
        if (first < 0x80) {
            units += static_cast<char16_t>(first);
            continue;
        }
        std::size_t read = 0;
        std::uint32_t codePoint = following ? first & (0x3Fu >> following) : 0;
        for (; read < following && at < bytes.size(); ++read, ++at) {
            const auto next = static_cast<unsigned char>(bytes[at]);
            if ((next & 0xC0) != 0x80) break;
            codePoint = codePoint << 6 | (next & 0x3F);
        }
        // Four-byte forms are cut to 16 bits: intended, stored projects rely on it.
        units += following && read == following ? static_cast<char16_t>(codePoint) : kUnmapped;
    }
    return units;
}

std::u16string decodeTable(std::string_view bytes, const CodeTable& table) {
    std::u16string units;
    units.reserve(bytes.size());
    for (char byte : bytes) {
        const char16_t unit = table[static_cast<unsigned char>(byte)];
        units += unit ? unit : kUnmapped;
    }
    return units;
}

std::string encodeTable(std::u16string_view units, const ReverseCodeTable& table) {
    std::string bytes;
    bytes.reserve(units.size());
    for (char16_t unit : units) bytes += static_cast<char>(table[unit]);
    return bytes;
}

}  // namespace

std::u16string decodeFilterText(std::string_view bytes, int encoding) {
    switch (encoding) {
        case FE_UTF8:
            return decodeUtf8(bytes);
        case FE_ANSI:
            return systemToUtf16(bytes);
        case FE_UTF16: {
            std::u16string units(bytes.size() / sizeof(char16_t), u'\0');
            std::memcpy(units.data(), bytes.data(), units.size() * sizeof(char16_t));
            return units;
        }
        default:
            return decodeTable(bytes, codeTable(encoding));
    }
}

std::string encodeFilterText(std::u16string_view units, int encoding) {
    switch (encoding) {
        case FE_UTF8:
            return encodeUtf8(units);
        case FE_ANSI:
            return utf16ToSystem(units);
        case FE_UTF16:
            return std::string(reinterpret_cast<const char*>(units.data()), units.size() * sizeof(char16_t));
        default:
            return encodeTable(units, reverseCodeTable(encoding));
    }
}

}  // namespace zr
