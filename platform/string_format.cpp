#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>
#include <string>

#include "zrparsersql/wide_string.h"

namespace {

// A conversion as a picture writes it, behind its '%'.
struct Conversion {
    bool leftAligned = false;
    bool zeroFilled = false;
    char16_t sign = 0;  // '+' or ' ' in front of numbers that are not negative
    std::size_t width = 0;
    int precision = -1;
    int bits = 0;  // what h and hh cut an integer to; 0 for its own width
    char16_t letter = 0;
};

// Widths and precisions beyond any use would let a picture ask for gigabytes.
constexpr int kLargestNumber = 4096;

class PictureReader {
 public:
    explicit PictureReader(std::u16string_view picture) : rest_(picture) {}

    bool atEnd() const { return rest_.empty(); }
    std::u16string_view literal() {
        const std::size_t end = std::min(rest_.find(u'%'), rest_.size());
        const std::u16string_view text = rest_.substr(0, end);
        rest_.remove_prefix(end);
        return text;
    }
    Conversion conversion() {
        Conversion result;
        take(u"%");
        for (;; rest_.remove_prefix(1)) {
            const char16_t flag = next();
            if (flag == u'-')
                result.leftAligned = true;
            else if (flag == u'0')
                result.zeroFilled = true;
            else if (flag == u'+' || (flag == u' ' && result.sign == 0))
                result.sign = flag;
            else if (flag != u' ')
                break;
        }
        result.width = static_cast<std::size_t>(number());
        if (take(u".")) result.precision = number();
        if (take(u"hh"))
            result.bits = 8;
        else if (take(u"h"))
            result.bits = 16;
        else
            take(u"I64") || take(u"ll") || take(u"l");
        result.letter = next();
        if (!rest_.empty()) rest_.remove_prefix(1);
        return result;
    }

 private:
    char16_t next() const { return rest_.empty() ? u'\0' : rest_.front(); }
    bool take(std::u16string_view text) {
        if (!rest_.starts_with(text)) return false;
        rest_.remove_prefix(text.size());
        return true;
    }
    int number() {
        int value = 0;
        for (; next() >= u'0' && next() <= u'9'; rest_.remove_prefix(1))
            value = std::min(value * 10 + (next() - u'0'), kLargestNumber);
        return value;
    }

    std::u16string_view rest_;
};

void appendPadded(std::u16string& out, const Conversion& how, std::u16string_view sign,
                  std::u16string_view body) {
    const std::size_t length = sign.size() + body.size();
    const std::size_t padding = how.width > length ? how.width - length : 0;
    if (how.leftAligned) {
        out.append(sign).append(body).append(padding, u' ');
    } else if (how.zeroFilled) {
        out.append(sign).append(padding, u'0').append(body);
    } else {
        out.append(padding, u' ').append(sign).append(body);
    }
}

std::u16string widen(const char* begin, const char* end) {
    return std::u16string(begin, end);
}

std::u16string_view signOf(const Conversion& how, bool negative) {
    if (negative) return u"-";
    return how.sign == u'+' ? u"+" : how.sign == u' ' ? u" " : u"";
}

bool isInteger(const zr::FormatArgument& argument) {
    return argument.kind == zr::FormatArgument::Kind::Signed ||
           argument.kind == zr::FormatArgument::Kind::Unsigned;
}

void appendInteger(std::u16string& out, Conversion how, const zr::FormatArgument& argument) {
    const int bits = std::min(static_cast<int>(argument.bytes * 8), how.bits ? how.bits : 64);
    std::uint64_t value = argument.bits;
    if (bits < 64) value &= (std::uint64_t{1} << bits) - 1;
    bool negative = false;
    if (how.letter == u'd' || how.letter == u'i') {
        negative = value >> (bits - 1) & 1;
        if (negative) {
            if (bits < 64) value |= ~std::uint64_t{0} << bits;
            value = 0 - value;
        }
    } else {
        how.sign = 0;
    }
    std::array<char, 24> digits;
    const bool hexadecimal = how.letter == u'x' || how.letter == u'X';
    const char* end =
        std::to_chars(digits.data(), digits.data() + digits.size(), value, hexadecimal ? 16 : 10).ptr;
    std::u16string body = widen(digits.data(), end);
    if (how.letter == u'X')
        for (char16_t& digit : body)
            if (digit >= u'a') digit = static_cast<char16_t>(digit - 0x20);
    appendPadded(out, how, signOf(how, negative), body);
}

void appendFloating(std::u16string& out, Conversion how, double value) {
    std::array<char, 320 + kLargestNumber> digits;  // the greatest double has 309 digits before the point
    const char* end = std::to_chars(digits.data(), digits.data() + digits.size(), std::fabs(value),
                                    std::chars_format::fixed, how.precision < 0 ? 6 : how.precision)
                          .ptr;
    if (!std::isfinite(value)) how.zeroFilled = false;
    appendPadded(out, how, signOf(how, std::signbit(value)), widen(digits.data(), end));
}

void appendText(std::u16string& out, Conversion how, std::u16string_view text) {
    how.zeroFilled = false;
    if (how.precision >= 0) text = text.substr(0, static_cast<std::size_t>(how.precision));
    appendPadded(out, how, {}, text);
}

void appendConversion(std::u16string& out, const Conversion& how, const zr::FormatArgument& argument) {
    using Kind = zr::FormatArgument::Kind;
    switch (how.letter) {
        case u'd':
        case u'i':
        case u'u':
        case u'x':
        case u'X':
            if (isInteger(argument)) appendInteger(out, how, argument);
            break;
        case u'f':
            if (argument.kind == Kind::Floating) appendFloating(out, how, argument.floating);
            break;
        case u'c':
            if (isInteger(argument)) {
                const char16_t unit = static_cast<char16_t>(argument.bits);
                appendText(out, how, std::u16string_view(&unit, 1));
            }
            break;
        case u's':
            if (argument.kind == Kind::Text) appendText(out, how, argument.text);
            break;
        default:
            break;
    }
}

}  // namespace

void CString::format(std::u16string_view picture, const zr::FormatArgument* arguments, std::size_t count) {
    std::u16string out;
    PictureReader reader(picture);
    for (std::size_t used = 0; !reader.atEnd();) {
        out.append(reader.literal());
        if (reader.atEnd()) break;
        const Conversion how = reader.conversion();
        if (how.letter == u'%')
            out += u'%';
        else if (used < count)
            appendConversion(out, how, arguments[used++]);
    }
    *this = CString(out);
}
