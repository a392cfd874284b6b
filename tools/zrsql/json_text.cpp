#include "json_text.h"

#include <charconv>

namespace zr::tool {

namespace {

void appendEscaped(std::string& out, char16_t unit) {
    switch (unit) {
        case u'"':
            out += "\\\"";
            return;
        case u'\\':
            out += "\\\\";
            return;
        case u'\b':
            out += "\\b";
            return;
        case u'\f':
            out += "\\f";
            return;
        case u'\n':
            out += "\\n";
            return;
        case u'\r':
            out += "\\r";
            return;
        case u'\t':
            out += "\\t";
            return;
        default:
            break;
    }
    static constexpr char digits[] = "0123456789abcdef";
    const char escape[] = {
        '\\', 'u', digits[unit >> 12], digits[unit >> 8 & 15], digits[unit >> 4 & 15], digits[unit & 15]};
    out.append(escape, sizeof escape);
}

bool isPlain(char16_t unit) {
    return unit >= 0x20 && unit < 0x80 && unit != u'"' && unit != u'\\';
}

template <class Text>
void appendString(std::string& out, Text text) {
    out += '"';
    for (const auto character : text) {
        const auto unit = static_cast<char16_t>(character);
        if (isPlain(unit))
            out += static_cast<char>(unit);
        else
            appendEscaped(out, unit);
    }
    out += '"';
}

}  // namespace

void appendJsonString(std::string& out, std::u16string_view text) {
    appendString(out, text);
}
void appendJsonString(std::string& out, std::string_view asciiText) {
    appendString(out, asciiText);
}

void appendNumber(std::string& out, std::int64_t number) {
    char digits[24];
    const auto end = std::to_chars(digits, digits + sizeof digits, number).ptr;
    out.append(digits, end);
}

template <class Text>
void JsonMembers::writeName(Text name) {
    if (!first_) out_ += ',';
    first_ = false;
    appendString(out_, name);
    out_ += ':';
}

void JsonMembers::name(std::string_view name) {
    writeName(name);
}
void JsonMembers::name(std::u16string_view name) {
    writeName(name);
}

void JsonMembers::text(std::string_view name, std::u16string_view value) {
    this->name(name);
    appendJsonString(out_, value);
}

void JsonMembers::text(std::u16string_view name, std::u16string_view value) {
    this->name(name);
    appendJsonString(out_, value);
}

void JsonMembers::ascii(std::string_view name, std::string_view value) {
    this->name(name);
    appendJsonString(out_, value);
}

void JsonMembers::number(std::string_view name, std::int64_t value) {
    this->name(name);
    appendNumber(out_, value);
}

}  // namespace zr::tool
