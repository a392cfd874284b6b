#include "json_line.h"

#include <algorithm>
#include <cstdint>
#include <stdexcept>
#include <vector>

#include "json_text.h"
#include "zrparsersql/wide_string.h"

namespace zr::tool {

namespace {

class NoJson : public std::runtime_error {
 public:
    using std::runtime_error::runtime_error;
};

bool isDigit(char character) {
    return character >= '0' && character <= '9';
}

// A reader of one JSON text. A library's reader would not do: it refuses unpaired surrogates, which are a
// legal part of a query's text here.
class Reader {
 public:
    explicit Reader(std::string_view text) : text_(text) {}

    JsonLine line() {
        static constexpr std::string_view byteOrderMark = "\xEF\xBB\xBF";
        if (text_.starts_with(byteOrderMark)) at_ = byteOrderMark.size();
        JsonLine result;
        skipBlanks();
        expect('{', "a line has to be one JSON object");
        if (!take('}')) {
            do {
                member(result);
            } while (take(','));
            expect('}', "\"}\" or \",\" is missing");
        }
        if (at_ != text_.size()) fail("there is something behind the object");
        return result;
    }

 private:
    void member(JsonLine& result) {
        const std::u16string name = string();
        expect(':', "\":\" is missing");
        if (name == u"id") {
            result.id.clear();
            value(&result.id);
        } else if (name == u"sql" && peek() == '"') {
            result.sql = string();
        } else {
            if (name == u"sql") result.sql.reset();
            value(nullptr);
        }
    }

    // Any value; its text in plain form goes to copy where one is given. Open brackets stand on a stack of
    // their own.
    void value(std::string* copy) {
        std::vector<char> open;
        for (;;) {
            const char next = peek();
            if (next == '{' || next == '[') {
                expect(next, "");
                put(copy, next);
                const char closing = next == '{' ? '}' : ']';
                if (!take(closing)) {
                    open.push_back(closing);
                    if (closing == '}') memberName(copy);
                    continue;
                }
                put(copy, closing);
            } else {
                scalar(copy);
            }
            while (!open.empty() && take(open.back())) {
                put(copy, open.back());
                open.pop_back();
            }
            if (open.empty()) return;
            expect(',', "\",\" or a closing bracket is missing");
            put(copy, ',');
            if (open.back() == '}') memberName(copy);
        }
    }

    void memberName(std::string* copy) {
        const std::u16string name = string();
        if (copy) appendJsonString(*copy, name);
        expect(':', "\":\" is missing");
        put(copy, ':');
    }

    void scalar(std::string* copy) {
        if (peek() == '"') {
            const std::u16string text = string();
            if (copy) appendJsonString(*copy, text);
            return;
        }
        const std::size_t start = at_;
        if (!word("true") && !word("false") && !word("null")) number();
        if (copy) copy->append(text_.substr(start, at_ - start));
        skipBlanks();
    }

    bool word(std::string_view expected) {
        if (text_.substr(at_, expected.size()) != expected) return false;
        at_ += expected.size();
        return true;
    }

    void number() {
        if (peek() == '-') ++at_;
        const bool leadingZero = peek() == '0';
        const std::size_t start = at_;
        digits();
        if (leadingZero && at_ - start > 1) fail("a number may not begin with 0");
        if (peek() == '.') {
            ++at_;
            digits();
        }
        if (peek() == 'e' || peek() == 'E') {
            ++at_;
            if (peek() == '+' || peek() == '-') ++at_;
            digits();
        }
    }

    void digits() {
        if (!isDigit(peek())) fail("there is no value where one has to be");
        while (isDigit(peek())) ++at_;
    }

    // A string, in UTF-16, with the blanks behind it.
    std::u16string string() {
        expectQuote();
        std::u16string result;
        for (;;) {
            const std::size_t start = at_;
            while (at_ < text_.size() && isPlain(text_[at_])) ++at_;
            appendUtf8(result, text_.substr(start, at_ - start));
            if (at_ == text_.size()) fail("a string has no end");
            const char character = text_[at_++];
            if (character == '"') break;
            if (character != '\\') fail("a control character stands in a string");
            result += escape();
        }
        skipBlanks();
        return result;
    }

    static bool isPlain(char character) {
        return static_cast<unsigned char>(character) >= 0x20 && character != '"' && character != '\\';
    }

    static void appendUtf8(std::u16string& out, std::string_view bytes) {
        for (const char byte : bytes) {
            if (static_cast<unsigned char>(byte) >= 0x80) {
                out += CString::fromUtf8(bytes).View();
                return;
            }
        }
        out.append(bytes.begin(), bytes.end());
    }

    char16_t escape() {
        if (at_ == text_.size()) fail("a string has no end");
        switch (text_[at_++]) {
            case '"':
                return u'"';
            case '\\':
                return u'\\';
            case '/':
                return u'/';
            case 'b':
                return u'\b';
            case 'f':
                return u'\f';
            case 'n':
                return u'\n';
            case 'r':
                return u'\r';
            case 't':
                return u'\t';
            case 'u':
                return hexUnit();
            default:
                fail("there is no such escape in a string");
        }
    }

    char16_t hexUnit() {
        std::uint32_t unit = 0;
        for (int count = 0; count < 4; ++count) {
            const char digit = at_ < text_.size() ? text_[at_] : '\0';
            ++at_;
            if (isDigit(digit))
                unit = unit * 16 + static_cast<std::uint32_t>(digit - '0');
            else if (digit >= 'a' && digit <= 'f')
                unit = unit * 16 + static_cast<std::uint32_t>(digit - 'a' + 10);
            else if (digit >= 'A' && digit <= 'F')
                unit = unit * 16 + static_cast<std::uint32_t>(digit - 'A' + 10);
            else
                fail("four hexadecimal digits have to follow \\u");
        }
        return static_cast<char16_t>(unit);
    }

    char peek() const { return at_ < text_.size() ? text_[at_] : '\0'; }

    bool take(char character) {
        if (at_ == text_.size() || text_[at_] != character) return false;
        ++at_;
        skipBlanks();
        return true;
    }

    void expect(char character, const char* complaint) {
        if (!take(character)) fail(complaint);
    }

    // Without skipping: blanks behind the opening quote belong to the string.
    void expectQuote() {
        if (peek() != '"') fail("a string is missing");
        ++at_;
    }

    void skipBlanks() {
        while (at_ < text_.size() &&
               (text_[at_] == ' ' || text_[at_] == '\t' || text_[at_] == '\r' || text_[at_] == '\n'))
            ++at_;
    }

    static void put(std::string* copy, char character) {
        if (copy) *copy += character;
    }

    [[noreturn]] void fail(const std::string& complaint) const {
        throw NoJson("no JSON: " + complaint + " (at byte " +
                     std::to_string(std::min(at_, text_.size()) + 1) + ")");
    }

    std::string_view text_;
    std::size_t at_ = 0;
};

}  // namespace

JsonLine readJsonLine(std::string_view line) {
    try {
        JsonLine result = Reader(line).line();
        if (!result.sql) result.error = "the line has no text \"sql\"";
        return result;
    } catch (const NoJson& problem) {
        JsonLine result;
        result.error = problem.what();
        return result;
    }
}

}  // namespace zr::tool
