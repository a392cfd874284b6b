#include "grammar/compiler/error.h"
#include "grammar/compiler/readers.h"
#include "grammar/compiler/source.h"

namespace zr::gc {
namespace {

class ParserReader {
 public:
    ParserReader(Cursor in, const Vocabulary& vocabulary, ParserGrammar& grammar)
        : in_(std::move(in)), vocabulary_(vocabulary), grammar_(grammar) {}

    void read() {
        if (in_.expectName() != "parser") in_.fail("expected 'parser NAME;'");
        const std::string name = in_.expectName();
        if (!grammar_.name.empty() && grammar_.name != name)
            in_.fail("this file is of grammar " + name + ", the files before it are of " + grammar_.name);
        grammar_.name = name;
        in_.expect(";");
        while (in_.peek().kind != Item::Kind::End) readOne();
    }

    struct Words {
        std::string rule, file;
        int line;
    };
    std::vector<Words> entries;
    std::string start, recover, island, islandToken;
    int startLine = 0, recoverLine = 0, islandLine = 0;

 private:
    void readOne() {
        const Item first = in_.peek();
        const std::string name = in_.expectName();
        if (in_.peek().text != ":") {
            readDirective(name, first.line);
            return;
        }
        in_.expect(":");
        Rule rule;
        rule.name = name;
        rule.file = in_.file();
        rule.line = first.line;
        rule.alternatives = readAlternatives(true);
        in_.expect(";");
        if (!grammar_.indexOf.emplace(name, static_cast<int>(grammar_.rules.size())).second)
            in_.failAt(first.line, "rule " + name + " stands twice");
        grammar_.rules.push_back(std::move(rule));
    }

    void readDirective(const std::string& word, int line) {
        if (word == "start") {
            start = in_.expectName();
            startLine = line;
        } else if (word == "recover") {
            recover = in_.expectName();
            recoverLine = line;
        } else if (word == "entry") {
            entries.push_back({in_.expectName(), in_.file(), line});
        } else if (word == "island") {
            island = in_.expectName();
            islandToken = in_.next().text;
            islandLine = line;
        } else {
            in_.failAt(line, "expected ':' behind rule name " + word);
        }
        in_.expect(";");
    }

    std::vector<Alternative> readAlternatives(bool ofRule) {
        std::vector<Alternative> alternatives;
        do {
            Alternative alternative;
            alternative.line = in_.peek().line;
            while (!atEndOfAlternative()) alternative.elements.push_back(readElement());
            if (alternative.elements.empty()) in_.fail("empty alternative before '" + in_.peek().text + "'");
            if (in_.peek().text == "=>") {
                if (!ofRule) in_.fail("a tree clause stands behind a rule's alternative, not inside a group");
                readTreeClause(alternative);
            }
            alternatives.push_back(std::move(alternative));
        } while (in_.accept("|"));
        return alternatives;
    }

    bool atEndOfAlternative() const {
        const Item& item = in_.peek();
        return item.kind == Item::Kind::End ||
               (item.kind == Item::Kind::Punct &&
                (item.text == "|" || item.text == ")" || item.text == ";" || item.text == "=>"));
    }

    void readTreeClause(Alternative& alternative) {
        const int line = in_.peek().line;
        in_.expect("=>");
        in_.expect("^");
        in_.expect("(");
        const std::string root = in_.expectName();
        alternative.root = token(root, line);
        std::vector<Element> repeated;
        while (!in_.accept(")")) repeated.push_back(readElement());
        std::string want, have;
        for (const Element& e : alternative.elements) want += text(e) + " ";
        for (const Element& e : repeated) have += text(e) + " ";
        if (want != have)
            in_.failAt(line, "the tree clause differs from its alternative: ^(" + root + " " + have +
                                 ") against " + want);
    }

    /// An element written out plainly, without marks: what a tree clause has to repeat.
    std::string text(const Element& e) const {
        std::string body;
        if (e.kind == Element::Kind::Rule) {
            body = e.rule;
        } else if (e.kind == Element::Kind::Tokens) {
            for (int t : e.tokens) body += "#" + std::to_string(t);
        } else if (e.alternatives.size() == 1 && e.alternatives[0].elements.size() == 1 &&
                   e.alternatives[0].elements[0].repeat == Repeat::Once) {
            body = text(e.alternatives[0].elements[0]);
        } else {
            for (const Alternative& a : e.alternatives) {
                body += body.empty() ? "(" : "|";
                for (const Element& inner : a.elements) body += text(inner) + " ";
            }
            body += ")";
        }
        return body + (e.repeat == Repeat::Optional ? "?"
                       : e.repeat == Repeat::Star   ? "*"
                       : e.repeat == Repeat::Plus   ? "+"
                                                    : "");
    }

    int token(const std::string& name, int line) const {
        if (name == "EOF") return kEof;
        const auto found = vocabulary_.numberOf.find(name);
        if (found == vocabulary_.numberOf.end())
            in_.failAt(line, "token " + name + " is not in the vocabulary");
        return found->second;
    }

    std::set<int> allTokens() const {
        std::set<int> all;
        for (const auto& entry : vocabulary_.entries) all.insert(entry.number);
        return all;
    }

    static bool isTokenName(const Item& item) {
        return item.kind == Item::Kind::Single ||
               (item.kind == Item::Kind::Name &&
                item.text.find_first_of("abcdefghijklmnopqrstuvwxyz") == std::string::npos);
    }

    Element readElement() {
        const Item item = in_.next();
        Element element(Element::Kind::Tokens);
        element.line = item.line;
        if (isTokenName(item)) {
            element.tokens = {token(item.text, item.line)};
            element.single = true;
        } else if (item.kind == Item::Kind::Name) {
            element.kind = Element::Kind::Rule;
            element.rule = item.text;
        } else if (item.text == "." && item.kind == Item::Kind::Punct) {
            element.tokens = allTokens();
        } else if (item.text == "~" && item.kind == Item::Kind::Punct) {
            element.tokens = allTokens();
            const bool group = in_.accept("(");
            do {
                const Item excluded = in_.next();
                if (!isTokenName(excluded)) in_.failAt(excluded.line, "'~' takes tokens");
                element.tokens.erase(token(excluded.text, excluded.line));
            } while (group && in_.accept("|"));
            if (group) in_.expect(")");
        } else if (item.text == "(" && item.kind == Item::Kind::Punct) {
            element.kind = Element::Kind::Group;
            in_.openGroup();
            element.alternatives = readAlternatives(false);
            in_.closeGroup();
        } else {
            in_.failAt(item.line, "unexpected '" + item.text + "' in a rule");
        }
        readMarks(element);
        return element;
    }

    void readMarks(Element& element) {
        if (in_.accept("!"))
            element.mark = Mark::Drop;
        else if (in_.accept("^"))
            element.mark = Mark::Root;
        if (in_.accept("?"))
            element.repeat = Repeat::Optional;
        else if (in_.accept("*"))
            element.repeat = Repeat::Star;
        else if (in_.accept("+"))
            element.repeat = Repeat::Plus;
    }

    Cursor in_;
    const Vocabulary& vocabulary_;
    ParserGrammar& grammar_;
};

}  // namespace

ParserGrammar readParser(const std::vector<std::string>& paths, const Vocabulary& vocabulary) {
    ParserGrammar grammar;
    struct Directive {
        std::string name, token, file;
        int line = 0;
    } start, recover, island;
    std::vector<ParserReader::Words> entries;
    for (const std::string& path : paths) {
        ParserReader reader(Cursor(path, scan(path, readFile(path))), vocabulary, grammar);
        reader.read();
        entries.insert(entries.end(), reader.entries.begin(), reader.entries.end());
        if (!reader.start.empty()) start = {reader.start, "", path, reader.startLine};
        if (!reader.recover.empty()) recover = {reader.recover, "", path, reader.recoverLine};
        if (!reader.island.empty()) island = {reader.island, reader.islandToken, path, reader.islandLine};
    }
    const auto find = [&](const Directive& d, const char* what) {
        const auto found = grammar.indexOf.find(d.name);
        if (found == grammar.indexOf.end())
            throw GrammarError(d.file, d.line, std::string(what) + " rule " + d.name + " is not defined");
        return found->second;
    };
    if (start.name.empty()) throw GrammarError(paths.at(0), 1, "no 'start RULE;'");
    grammar.start = find(start, "start");
    if (!recover.name.empty()) grammar.recoverRule = find(recover, "recover");
    for (const auto& e : entries) grammar.entryRules.push_back(find({e.rule, "", e.file, e.line}, "entry"));
    if (!island.name.empty()) {
        grammar.islandRule = find(island, "island");
        const auto number = vocabulary.numberOf.find(island.token);
        if (number == vocabulary.numberOf.end())
            throw GrammarError(island.file, island.line,
                               "token " + island.token + " is not in the vocabulary");
        grammar.islandToken = number->second;
    }
    return grammar;
}

}  // namespace zr::gc
