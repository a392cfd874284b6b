#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <set>
#include <string>
#include <vector>

/// The grammar as read from its files, before any lowering. Every pass of the compiler reads this model; only
/// the readers write it.
namespace zr::gc {

/// Numbers of nodes, rules and tokens are int, with -1 for none; this makes one an index.
constexpr std::size_t index(int number) {
    return static_cast<std::size_t>(number);
}

/// Token numbers: 0 stands for end of file in sets (the runtime's -1), 4 and up are the vocabulary's.
constexpr int kEof = 0;
constexpr int kFirstToken = 4;

struct Vocabulary {
    struct Entry {
        std::string name;  ///< as written, literal tokens with their quotes
        int number;
        int line;
    };
    std::string file;
    std::vector<Entry> entries;           ///< in number order
    std::map<std::string, int> numberOf;  ///< by name
    int maxNumber = 0;

    static bool isLiteral(const std::string& name) { return !name.empty() && name[0] == '\''; }
};

/// Text of a quoted entry with its escapes taken out, as UTF-16 units.
std::u16string unquote(const std::string& quoted, const std::string& file, int line);

// ---- lexer rules
// -------------------------------------------------------------------------------------------

struct CharSet {
    std::vector<std::pair<int, int>> ranges;  ///< inclusive, UTF-16 units
};

struct LexElement {
    enum class Kind { Text, Set, Rule, Group };
    explicit LexElement(Kind k) : kind(k) {}
    Kind kind;
    enum class Repeat { Once, Optional, Star, Plus } repeat = Repeat::Once;
    std::u16string text;                                ///< Text
    bool anyCase = false;                               ///< Text: ASCII letters match in either case
    CharSet set;                                        ///< Set
    std::string rule;                                   ///< Rule
    std::vector<std::vector<LexElement>> alternatives;  ///< Group
    int line = 0;
};

struct LexRule {
    std::string name;
    int token = 0;
    bool fragment = false;
    bool hidden = false;
    int cutFront = 0, cutBack = 0;
    std::vector<std::vector<LexElement>> alternatives;  ///< empty: never matches
    int line = 0;
};

struct LexerGrammar {
    std::string name, file;
    std::vector<LexRule> rules;  ///< in matching order, literal tokens expanded in their place
};

// ---- parser rules
// ------------------------------------------------------------------------------------------

enum class Mark : std::uint8_t { None, Drop, Root };
enum class Repeat : std::uint8_t { Once, Optional, Star, Plus };

struct Alternative;

struct Element {
    enum class Kind { Tokens, Rule, Group };
    explicit Element(Kind k);
    Element(const Element&);
    Element(Element&&) noexcept;
    Element& operator=(const Element&);
    Element& operator=(Element&&) noexcept;
    ~Element();
    Kind kind;
    Mark mark = Mark::None;
    Repeat repeat = Repeat::Once;
    std::set<int> tokens;  ///< Tokens: what it takes (a single token, a complement, or any)
    bool single = false;   ///< Tokens: exactly one token, written by its name
    std::string rule;      ///< Rule
    int ruleIndex = -1;
    std::vector<Alternative> alternatives;  ///< Group
    int line = 0;
};

struct Alternative {
    std::vector<Element> elements;
    int root = -1;  ///< token number of the imaginary root of a tree clause, or -1
    int line = 0;
};

// Element holds alternatives and these hold elements: what needs both complete stands behind both.
inline Element::Element(Kind k) : kind(k) {}
inline Element::Element(const Element&) = default;
inline Element::Element(Element&&) noexcept = default;
inline Element& Element::operator=(const Element&) = default;
inline Element& Element::operator=(Element&&) noexcept = default;
inline Element::~Element() = default;

struct Rule {
    std::string name, file;
    std::vector<Alternative> alternatives;
    int line = 0;
};

struct ParserGrammar {
    std::string name;
    std::vector<Rule> rules;
    std::map<std::string, int> indexOf;
    int start = -1;               ///< the start rule: statement rule, any tokens, end of file
    int statement = -1;           ///< first rule of the start rule
    bool keepTail = false;        ///< tail tokens and end of file stay in the tree (nil root)
    int recoverRule = -1;         ///< mandatory part that an error node may stand in for, or -1
    std::vector<int> entryRules;  ///< rules that hosts call and no other rule does
    int islandRule = -1;          ///< rule that every nested statement goes through, or -1
    int islandToken = -1;         ///< the token it can't do without and that nothing else takes
};

}  // namespace zr::gc
