#include "grammar/compiler/source.h"

#include <cctype>
#include <fstream>
#include <sstream>

#include "grammar/compiler/error.h"

namespace zr::gc {

std::string readFile(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    if (!in) throw GrammarError(path, 0, "can't read the file");
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
}

std::vector<Item> scan(const std::string& file, const std::string& text) {
    std::vector<Item> items;
    int line = 1;
    std::size_t i = 0;
    const auto delimited = [&](char close, Item::Kind kind, const char* what) {
        std::size_t j = i + 1;
        while (j < text.size() && text[j] != close && text[j] != '\n') j += text[j] == '\\' ? 2 : 1;
        if (j >= text.size() || text[j] != close)
            throw GrammarError(file, line, std::string("unclosed ") + what);
        items.push_back({kind, text.substr(i, j + 1 - i), line});
        i = j + 1;
    };
    while (i < text.size()) {
        const char c = text[i];
        if (c == '\n') {
            ++line;
            ++i;
        } else if (std::isspace(static_cast<unsigned char>(c))) {
            ++i;
        } else if (text.compare(i, 2, "//") == 0) {
            while (i < text.size() && text[i] != '\n') ++i;
        } else if (std::isalpha(static_cast<unsigned char>(c)) || c == '_') {
            std::size_t j = i;
            while (j < text.size() && (std::isalnum(static_cast<unsigned char>(text[j])) || text[j] == '_'))
                ++j;
            items.push_back({Item::Kind::Name, text.substr(i, j - i), line});
            i = j;
        } else if (std::isdigit(static_cast<unsigned char>(c))) {
            std::size_t j = i;
            while (j < text.size() && std::isdigit(static_cast<unsigned char>(text[j]))) ++j;
            items.push_back({Item::Kind::Number, text.substr(i, j - i), line});
            i = j;
        } else if (c == '\'') {
            delimited('\'', Item::Kind::Single, "quote");
        } else if (c == '"') {
            delimited('"', Item::Kind::Double, "double quote");
        } else if (c == '[') {
            delimited(']', Item::Kind::Set, "character set");
        } else if (text.compare(i, 2, "=>") == 0 || text.compare(i, 2, "->") == 0) {
            items.push_back({Item::Kind::Punct, text.substr(i, 2), line});
            i += 2;
        } else if (std::string("=:;|()?*+!^~.,").find(c) != std::string::npos) {
            items.push_back({Item::Kind::Punct, std::string(1, c), line});
            ++i;
        } else {
            throw GrammarError(file, line, std::string("unexpected character '") + c + "'");
        }
    }
    items.push_back({Item::Kind::End, "end of file", line});
    return items;
}

const Item& Cursor::peek(std::size_t ahead) const {
    return items_[std::min(at_ + ahead, items_.size() - 1)];
}

Item Cursor::next() {
    const Item item = peek();
    if (at_ + 1 < items_.size()) ++at_;
    return item;
}

bool Cursor::accept(const std::string& punct) {
    if (peek().kind != Item::Kind::Punct || peek().text != punct) return false;
    next();
    return true;
}

void Cursor::expect(const std::string& punct) {
    if (!accept(punct)) fail("expected '" + punct + "' before '" + peek().text + "'");
}

std::string Cursor::expectName() {
    if (peek().kind != Item::Kind::Name) fail("expected a name before '" + peek().text + "'");
    return next().text;
}

void Cursor::openGroup() {
    constexpr int kGroups = 100;
    if (++openGroups_ > kGroups) fail("more than " + std::to_string(kGroups) + " groups inside each other");
}

void Cursor::closeGroup() {
    expect(")");
    --openGroups_;
}

int Cursor::expectNumber(const std::string& after) {
    constexpr std::size_t kDigits = 9;
    if (peek().kind != Item::Kind::Number)
        fail("expected a number behind '" + after + "', not '" + peek().text + "'");
    if (peek().text.size() > kDigits) fail("number " + peek().text + " is too large");
    return std::stoi(next().text);
}

void Cursor::fail(const std::string& what) const {
    failAt(peek().line, what);
}
void Cursor::failAt(int line, const std::string& what) const {
    throw GrammarError(file_, line, what);
}

}  // namespace zr::gc
