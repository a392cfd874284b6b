#include "grammar/compiler/error.h"
#include "grammar/compiler/readers.h"
#include "grammar/compiler/source.h"

namespace zr::gc {
namespace {

constexpr int kLastUnit = 0xFFFF;

CharSet complement(const CharSet& set) {
    std::vector<bool> taken(kLastUnit + 1, false);
    for (const auto& [low, high] : set.ranges)
        for (int c = low; c <= high; ++c) taken[static_cast<std::size_t>(c)] = true;
    CharSet rest;
    for (int c = 0; c <= kLastUnit; ++c) {
        if (taken[static_cast<std::size_t>(c)]) continue;
        int end = c;
        while (end < kLastUnit && !taken[static_cast<std::size_t>(end + 1)]) ++end;
        rest.ranges.emplace_back(c, end);
        c = end;
    }
    return rest;
}

CharSet readSet(const Cursor& in, const Item& item) {
    // A '-' that stands for itself is escaped in the file, so that every bare one is a range.
    std::vector<std::pair<char16_t, bool>> units;  // unit, escaped
    for (std::size_t i = 1; i + 1 < item.text.size(); ++i) {
        const std::size_t length = item.text[i] != '\\' ? 1 : item.text[i + 1] == 'u' ? 6 : 2;
        const std::string one = "'" + item.text.substr(i, length) + "'";
        units.emplace_back(unquote(one, in.file(), item.line).at(0), length > 1);
        i += length - 1;
    }
    CharSet set;
    for (std::size_t i = 0; i < units.size(); ++i) {
        const bool range = i + 2 < units.size() && units[i + 1].first == u'-' && !units[i + 1].second;
        const int low = units[i].first, high = range ? units[i + 2].first : low;
        if (high < low) in.failAt(item.line, "range runs backwards in " + item.text);
        set.ranges.emplace_back(low, high);
        if (range) i += 2;
    }
    return set;
}

class LexerReader {
 public:
    LexerReader(Cursor in, const Vocabulary& vocabulary) : in_(std::move(in)), vocabulary_(vocabulary) {}

    LexerGrammar read() {
        if (in_.expectName() != "lexer") in_.fail("expected 'lexer NAME;'");
        grammar_.name = in_.expectName();
        grammar_.file = in_.file();
        in_.expect(";");
        while (in_.peek().kind != Item::Kind::End) readOne();
        return std::move(grammar_);
    }

 private:
    void readOne() {
        if (in_.peek().text == "literals" && in_.peek(1).text == ";") {
            in_.next();
            in_.next();
            for (const auto& entry : vocabulary_.entries)
                if (Vocabulary::isLiteral(entry.name)) addLiteral(entry);
            return;
        }
        LexRule rule;
        rule.line = in_.peek().line;
        rule.fragment = in_.peek().text == "fragment" && in_.peek(1).kind == Item::Kind::Name;
        if (rule.fragment) in_.next();
        rule.name = in_.expectName();
        const auto number = vocabulary_.numberOf.find(rule.name);
        if (number == vocabulary_.numberOf.end())
            in_.failAt(rule.line, "token " + rule.name + " is not in the vocabulary");
        rule.token = number->second;
        for (const auto& other : grammar_.rules)
            if (other.name == rule.name) in_.failAt(rule.line, "rule " + rule.name + " stands twice");
        in_.expect(":");
        if (in_.peek().text != ";" && in_.peek().text != "->") rule.alternatives = readAlternatives();
        while (in_.accept("->")) readAction(rule);
        in_.expect(";");
        grammar_.rules.push_back(std::move(rule));
    }

    void addLiteral(const Vocabulary::Entry& entry) {
        LexRule rule;
        rule.name = entry.name;
        rule.token = entry.number;
        rule.line = entry.line;
        LexElement text(LexElement::Kind::Text);
        text.text = unquote(entry.name, vocabulary_.file, entry.line);
        rule.alternatives = {{text}};
        grammar_.rules.push_back(std::move(rule));
    }

    void readAction(LexRule& rule) {
        const std::string action = in_.expectName();
        if (action == "hidden") {
            rule.hidden = true;
        } else if (action == "cut") {
            in_.expect("(");
            rule.cutFront = in_.expectNumber("cut(");
            in_.expect(",");
            rule.cutBack = in_.expectNumber(",");
            in_.expect(")");
        } else {
            in_.fail("unknown action '" + action + "'");
        }
    }

    std::vector<std::vector<LexElement>> readAlternatives() {
        std::vector<std::vector<LexElement>> alternatives(1);
        for (;;) {
            const Item& item = in_.peek();
            if (item.kind == Item::Kind::Punct &&
                (item.text == ";" || item.text == ")" || item.text == "->" || item.text == "|")) {
                if (alternatives.back().empty()) in_.fail("empty alternative before '" + item.text + "'");
                if (item.text != "|") return alternatives;
                in_.next();
                alternatives.emplace_back();
                continue;
            }
            alternatives.back().push_back(readElement());
        }
    }

    LexElement readElement() {
        const Item item = in_.next();
        LexElement element(LexElement::Kind::Text);
        element.line = item.line;
        if (item.kind == Item::Kind::Single || item.kind == Item::Kind::Double) {
            element.text = unquote(item.text, in_.file(), item.line);
            element.anyCase = item.kind == Item::Kind::Double;
            if (element.text.empty()) in_.failAt(item.line, "empty text");
        } else if (item.kind == Item::Kind::Set) {
            element.kind = LexElement::Kind::Set;
            element.set = readSet(in_, item);
        } else if (item.kind == Item::Kind::Punct && item.text == "~") {
            const Item set = in_.next();
            element.kind = LexElement::Kind::Set;
            if (set.kind == Item::Kind::Set) {
                element.set = complement(readSet(in_, set));
            } else if (set.kind == Item::Kind::Single) {
                const auto text = unquote(set.text, in_.file(), set.line);
                if (text.size() != 1) in_.failAt(set.line, "'~' takes a set or one character");
                element.set = complement({{{text[0], text[0]}}});
            } else {
                in_.failAt(set.line, "'~' takes a set or one character");
            }
        } else if (item.kind == Item::Kind::Punct && item.text == ".") {
            element.kind = LexElement::Kind::Set;
            element.set.ranges = {{0, kLastUnit}};
        } else if (item.kind == Item::Kind::Name) {
            element.kind = LexElement::Kind::Rule;
            element.rule = item.text;
        } else if (item.kind == Item::Kind::Punct && item.text == "(") {
            element.kind = LexElement::Kind::Group;
            in_.openGroup();
            element.alternatives = readAlternatives();
            in_.closeGroup();
        } else {
            in_.failAt(item.line, "unexpected '" + item.text + "' in a lexer rule");
        }
        if (in_.accept("?"))
            element.repeat = LexElement::Repeat::Optional;
        else if (in_.accept("*"))
            element.repeat = LexElement::Repeat::Star;
        else if (in_.accept("+"))
            element.repeat = LexElement::Repeat::Plus;
        return element;
    }

    Cursor in_;
    const Vocabulary& vocabulary_;
    LexerGrammar grammar_;
};

}  // namespace

LexerGrammar readLexer(const std::string& path, const Vocabulary& vocabulary) {
    return LexerReader(Cursor(path, scan(path, readFile(path))), vocabulary).read();
}

}  // namespace zr::gc
