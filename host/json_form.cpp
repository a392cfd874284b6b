#include "host/json_form.h"

#include <charconv>
#include <cstdint>
#include <iterator>
#include <limits>
#include <nlohmann/json.hpp>
#include <optional>

namespace zr::host {

namespace {

using Json = nlohmann::json;

constexpr char16_t kEscape = 0xFFFF;
constexpr int kEscapeDigits = 4;
constexpr char kHexDigits[] = "0123456789ABCDEF";

bool isHighSurrogate(char16_t unit) {
    return unit >= 0xD800 && unit < 0xDC00;
}
bool isLowSurrogate(char16_t unit) {
    return unit >= 0xDC00 && unit < 0xE000;
}

// One character, which is no surrogate, as two or three bytes.
void appendUnit(std::string& out, char16_t unit) {
    if (unit < 0x800) {
        out += static_cast<char>(0xC0 | unit >> 6);
    } else {
        out += static_cast<char>(0xE0 | unit >> 12);
        out += static_cast<char>(0x80 | (unit >> 6 & 0x3F));
    }
    out += static_cast<char>(0x80 | (unit & 0x3F));
}

void appendHex(std::string& out, char16_t unit) {
    for (int shift = 12; shift >= 0; shift -= 4) out += kHexDigits[unit >> shift & 15];
}

void appendPair(std::string& out, char16_t high, char16_t low) {
    const std::uint32_t character = 0x10000 + ((high & 0x3FFu) << 10) + (low & 0x3FFu);
    out += static_cast<char>(0xF0 | character >> 18);
    out += static_cast<char>(0x80 | (character >> 12 & 0x3F));
    out += static_cast<char>(0x80 | (character >> 6 & 0x3F));
    out += static_cast<char>(0x80 | (character & 0x3F));
}

void appendControl(std::string& out, char16_t unit) {
    switch (unit) {
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
            out += "\\u";
            appendHex(out, unit);
    }
}

// The character at a place that is not ASCII; goes to its last unit.
void appendWide(std::string& out, std::u16string_view text, std::size_t& at) {
    const char16_t unit = text[at];
    if (isHighSurrogate(unit) && at + 1 < text.size() && isLowSurrogate(text[at + 1])) {
        appendPair(out, unit, text[++at]);
    } else if (isHighSurrogate(unit) || isLowSurrogate(unit) || unit == kEscape) {
        appendUnit(out, kEscape);
        appendHex(out, unit);
    } else {
        appendUnit(out, unit);
    }
}

void appendText(std::string& out, std::u16string_view text) {
    out += '"';
    for (std::size_t at = 0; at < text.size(); ++at) {
        const char16_t unit = text[at];
        if (unit == u'"' || unit == u'\\') {
            out += '\\';
            out += static_cast<char>(unit);
        } else if (unit < 0x20) {
            appendControl(out, unit);
        } else if (unit < 0x80) {
            out += static_cast<char>(unit);
        } else {
            appendWide(out, text, at);
        }
    }
    out += '"';
}

// The text without its escapes, or nothing when one of them is broken.
std::optional<CString> unescaped(const CString& text) {
    if (text.Find(kEscape) < 0) return text;
    std::u16string units;
    for (std::u16string_view rest = text.View(); !rest.empty();) {
        const char16_t unit = rest.front();
        rest.remove_prefix(1);
        if (unit != kEscape) {
            units += unit;
            continue;
        }
        const std::string digits(rest.substr(0, kEscapeDigits).begin(), rest.substr(0, kEscapeDigits).end());
        std::uint16_t escaped = 0;
        const char* end = digits.data() + digits.size();
        if (digits.size() != kEscapeDigits || std::from_chars(digits.data(), end, escaped, 16).ptr != end)
            return std::nullopt;
        units += static_cast<char16_t>(escaped);
        rest.remove_prefix(kEscapeDigits);
    }
    return CString(units);
}

void appendValue(std::string& out, const StoredValue& value) {
    if (value.isText) {
        appendText(out, value.text.View());
        return;
    }
    char digits[16];
    out.append(digits, std::to_chars(digits, digits + sizeof digits, value.number).ptr);
}

// As deep as the tree, which kMostLevels bounds.
void appendSection(std::string& out, const StoredSection& section, std::size_t level) {
    if (section.values.empty() && section.children.empty()) {
        out += "{}";
        return;
    }
    auto beginMember = [&out, level, first = true](const CString& name) mutable {
        out += first ? "{\n" : ",\n";
        first = false;
        out.append(level + 1, ' ');
        appendText(out, name.View());
        out += ": ";
    };
    for (const StoredValue& value : section.values) {
        beginMember(value.name);
        appendValue(out, value);
    }
    for (const auto& child : section.children) {
        beginMember(child->name);
        appendSection(out, *child, level + 1);
    }
    out += '\n';
    out.append(level, ' ');
    out += '}';
}

// Goes through the bytes and counts the lines on the way.
class LineCounter {
 public:
    using iterator_category = std::input_iterator_tag;
    using value_type = char;
    using difference_type = std::ptrdiff_t;
    using pointer = const char*;
    using reference = const char&;

    LineCounter(const char* at, FilePlace* line) : at_(at), line_(line) {}
    reference operator*() const { return *at_; }
    LineCounter& operator++() {
        if (*at_++ == '\n') ++*line_;
        return *this;
    }
    bool operator==(const LineCounter& other) const { return at_ == other.at_; }
    bool operator!=(const LineCounter& other) const { return at_ != other.at_; }

 private:
    const char* at_;
    FilePlace* line_;
};

}  // namespace

// Builds the tree as the parser reports what it reads.
class JsonHandler : public nlohmann::json_sax<Json> {
 public:
    JsonHandler(JsonReader& reader, StoredSection& root, const FilePlace& line)
        : reader_(reader), root_(root), line_(line) {}

    bool null() override { wrongValue("null"); }
    bool boolean(bool value) override { wrongValue(value ? "true" : "false"); }
    bool number_float(number_float_t, const string_t& text) override { wrongValue(text); }
    bool binary(binary_t&) override { wrongValue("binary data"); }
    bool start_array(std::size_t) override { wrongValue("a list"); }
    bool end_array() override { return true; }

    bool number_integer(number_integer_t value) override {
        if (value < std::numeric_limits<int>::min()) wrongValue(std::to_string(value));
        addValue().number = static_cast<int>(value);
        return true;
    }
    bool number_unsigned(number_unsigned_t value) override {
        if (value > static_cast<number_unsigned_t>(std::numeric_limits<int>::max()))
            wrongValue(std::to_string(value));
        addValue().number = static_cast<int>(value);
        return true;
    }
    bool string(string_t& text) override {
        StoredValue& value = addValue();
        value.isText = true;
        auto plain = unescaped(CString::fromUtf8(text));
        if (!plain) fail("the text of \"" + value.name.toUtf8() + "\" has a broken escape");
        value.text = std::move(*plain);
        return true;
    }
    bool key(string_t& name) override {
        name_ = reader_.name(name);
        place_ = line_;
        StoredSection& section = *open_.back();
        if (section.values.size() >= kMostValues)
            fail("a section has more than " + std::to_string(kMostValues) + " values");
        if (section.findValue(name_) || section.findChild(name_))
            fail("\"" + name + "\" stands twice in a section");
        return true;
    }
    bool start_object(std::size_t) override {
        if (open_.empty()) {
            open_.push_back(&root_);
            return true;
        }
        if (open_.size() > kMostLevels)
            fail("sections are nested more than " + std::to_string(kMostLevels) + " deep");
        StoredSection& section = open_.back()->addChild(name_);
        section.place = place_;
        open_.push_back(&section);
        return true;
    }
    bool end_object() override {
        open_.pop_back();
        return true;
    }
    bool parse_error(std::size_t, const std::string&, const nlohmann::detail::exception& error) override {
        // The library's own number of the error stands in brackets in front.
        const std::string text = error.what();
        const std::size_t end = text.find("] ");
        throw StorageError(end == std::string::npos ? text : text.substr(end + 2));
    }

 private:
    [[noreturn]] void fail(const std::string& what) const {
        throw StorageError("line " + std::to_string(line_) + ": " + what);
    }
    [[noreturn]] void wrongValue(const std::string& what) const {
        if (open_.empty()) fail("there is " + what + " where a section has to be");
        fail("\"" + name_.toUtf8() + "\" has to be a text or a whole number of 32 bits, and is " + what);
    }
    StoredValue& addValue() {
        if (open_.empty()) fail("there is a value where a section has to be");
        StoredValue& value = open_.back()->values.emplace_back();
        value.name = name_;
        value.place = place_;
        return value;
    }

    JsonReader& reader_;
    StoredSection& root_;
    const FilePlace& line_;
    std::vector<StoredSection*> open_;
    CString name_;
    FilePlace place_ = 0;
};

std::string nameInUtf8(const CString& name) {
    const std::u16string_view text = name.View();
    std::string utf8;
    for (std::size_t at = 0; at < text.size(); ++at) {
        if (text[at] < 0x80)
            utf8 += static_cast<char>(text[at]);
        else
            appendWide(utf8, text, at);
    }
    return utf8;
}

void appendJson(std::string& out, const StoredSection& section) {
    appendSection(out, section, 0);
}

void appendValuesJson(std::string& out, const StoredSection& section) {
    out += '{';
    for (const StoredValue& value : section.values) {
        if (out.back() != '{') out += ", ";
        appendText(out, value.name.View());
        out += ": ";
        appendValue(out, value);
    }
    out += '}';
}

const CString& JsonReader::name(const std::string& utf8) {
    const auto [place, isNew] = names_.try_emplace(utf8);
    if (isNew) {
        auto plain = unescaped(CString::fromUtf8(utf8));
        if (!plain) throw StorageError("the name \"" + utf8 + "\" has a broken escape");
        place->second = std::move(*plain);
    }
    return place->second;
}

void JsonReader::read(std::string_view json, StoredSection& section) {
    FilePlace line = 1;
    JsonHandler handler(*this, section, line);
    const char* end = json.data() + json.size();
    Json::sax_parse(LineCounter(json.data(), &line), LineCounter(end, &line), &handler);
}

}  // namespace zr::host
