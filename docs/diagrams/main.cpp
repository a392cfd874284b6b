// zrdiagrams: what a person may want to see of a grammar.
//
//     zrdiagrams svg   NAME.tokens NAME.lexer NAME.grammar...   its rules as one picture
//     zrdiagrams words NAME.tokens NAME.lexer NAME.grammar...   its words, as lines of Markdown

#include <algorithm>
#include <iostream>
#include <map>
#include <set>

#include "docs/diagrams/railroad.h"
#include "grammar/compiler/error.h"
#include "grammar/compiler/readers.h"

namespace {

using namespace zr::gc;

// The tokens that some rule takes by name.
std::set<int> takenTokens(const ParserGrammar& grammar) {
    std::set<int> taken;
    std::vector<const std::vector<Alternative>*> open;
    for (const Rule& rule : grammar.rules) open.push_back(&rule.alternatives);
    while (!open.empty()) {
        const std::vector<Alternative>& alternatives = *open.back();
        open.pop_back();
        for (const Alternative& alternative : alternatives)
            for (const Element& element : alternative.elements) {
                if (element.kind == Element::Kind::Group) open.push_back(&element.alternatives);
                if (element.single) taken.insert(element.tokens.begin(), element.tokens.end());
            }
    }
    return taken;
}

// Text that is written one way, and is ASCII.
std::string soleSpelling(const LexRule& rule) {
    std::string text;
    if (rule.fragment || rule.alternatives.size() != 1) return text;
    for (const LexElement& element : rule.alternatives.front()) {
        if (element.kind != LexElement::Kind::Text || element.repeat != LexElement::Repeat::Once) return {};
        for (const char16_t unit : element.text) {
            if (unit <= u' ' || unit > u'~') return {};
            text += static_cast<char>(unit);
        }
    }
    return text;
}

bool isWord(const std::string& text) {
    return text.size() > 1 &&
           text.find_first_not_of("ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz_0123456789 ") ==
               std::string::npos;
}

void writeWords(const char* heading, const std::set<std::string>& words) {
    std::cout << heading << " (" << words.size() << "):";
    const char* before = " ";
    for (const std::string& word : words) {
        std::cout << before << '`' << word << '`';
        before = ", ";
    }
    std::cout << "\n";
}

}  // namespace

int main(int argc, char** argv) {
    const std::string what = argc > 1 ? argv[1] : "";
    if (argc < 5 || (what != "svg" && what != "words")) {
        std::cerr << "usage: zrdiagrams svg|words NAME.tokens NAME.lexer NAME.grammar...\n";
        return 2;
    }
    try {
        const Vocabulary vocabulary = readVocabulary(argv[2]);
        const LexerGrammar lexer = readLexer(argv[3], vocabulary);
        ParserGrammar grammar = readParser({argv + 4, argv + argc}, vocabulary);
        // Whole queries ahead of their expressions, whatever the order of the files.
        const std::string first = grammar.rules.at(static_cast<std::size_t>(grammar.start)).file;
        std::stable_partition(grammar.rules.begin(), grammar.rules.end(),
                              [&first](const Rule& rule) { return rule.file == first; });

        std::map<int, std::string> spellings;
        for (const LexRule& rule : lexer.rules)
            if (const std::string text = soleSpelling(rule); !text.empty()) spellings[rule.token] = text;
        const auto spelling = [&](int token) {
            if (const auto found = spellings.find(token); found != spellings.end()) return found->second;
            for (const Vocabulary::Entry& entry : vocabulary.entries)
                if (entry.number == token) return entry.name;
            return std::to_string(token);
        };

        if (what == "svg") {
            std::cout << zr::diagrams::drawRules(grammar, vocabulary, spelling);
            return 0;
        }
        const std::set<int> taken = takenTokens(grammar);
        std::set<std::string> read;
        std::set<std::string> passedOver;
        for (const auto& [token, text] : spellings)
            if (isWord(text)) (taken.contains(token) ? read : passedOver).insert(text);
        // A word that stands for two tokens is read where one of them is.
        for (const std::string& word : read) passedOver.erase(word);
        writeWords("Words that its rules read", read);
        if (!passedOver.empty()) {
            std::cout << "\n";
            writeWords("Words that it knows and no rule reads", passedOver);
        }
        return 0;
    } catch (const GrammarError& error) {
        std::cerr << error.what() << "\n";
        return 1;
    }
}
