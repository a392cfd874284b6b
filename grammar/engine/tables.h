#pragma once

#include <cstdint>

/// The contract between the grammar compiler and the engine: what the generated sources hold and the engine
/// reads. Everything is constant data; nothing here knows a dialect. The layout carries a version, so that an
/// engine never runs tables of another layout.
namespace zr::engine {

constexpr std::uint32_t kTableVersion = 10;

constexpr std::uint16_t kNone16 = 0xFFFF;

// ---- lexer
// -------------------------------------------------------------------------------------------------

struct LexRuleRow {
    std::uint16_t token;
    std::uint8_t hidden;    ///< goes to the hidden channel 99
    std::uint8_t cutFront;  ///< UTF-16 units cut from the token's text
    std::uint8_t cutBack;
    std::int32_t entry;  ///< first instruction of the rule's own program, -1: never matches
    const char* name;
};

/// One instruction of a rule's own program, run for single-rule calls: take a unit of [low, high] and go on
/// at `next`; or go on at both `next` and `other`; or accept.
struct LexInstructionRow {
    enum Op : std::uint8_t { Range, Split, Accept };
    Op op;
    std::uint16_t low, high;
    std::int32_t next, other;
};

struct UnitRange {
    std::uint16_t low, high;
    std::uint8_t cls;
};

struct LexerTable {
    std::uint32_t version;
    const LexRuleRow* rules;
    std::uint32_t ruleCount;
    const LexInstructionRow* code;
    std::uint32_t codeCount;
    // The automaton for the longest match over all rules: next[state * classes + class], kNone16 for none.
    const std::uint8_t* asciiClass;  ///< 128 entries
    const UnitRange* ranges;         ///< the units from 128 up, in order, without gaps
    std::uint32_t rangeCount;
    std::uint32_t classes;
    const std::uint16_t* next;
    const std::uint16_t* accept;  ///< by state: rule, or kNone16
};

// ---- parser
// ------------------------------------------------------------------------------------------------

enum class Op : std::uint8_t {
    Token,
    Set,
    Call,
    Choice,
    Soft,
    SoftStar,
    Hard,  ///< a Token that takes the closer where it must stand
    Root,
    ScopeBegin,
    ScopeEnd,
    End
};

enum class Mark : std::uint8_t { None, Drop, Root };

struct NodeRow {
    Op op;
    Mark mark;
    std::uint8_t flags;      ///< NodeFlags
    std::uint16_t arg;       ///< token number, set, rule (of a Call or an End), choice
    std::uint16_t next;      ///< next node of the path
    std::uint16_t run;       ///< next node that the recogniser stops at
    std::uint16_t guard;     ///< Call: guard or kNone16
    std::uint16_t required;  ///< Call: one past the class of a token that must still come, 0 for none
};

enum NodeFlags : std::uint8_t {
    kBehindCall = 1,  ///< a Call goes on here
    kNonEmpty = 2,    ///< Call: only results that take a token count
    kOwnSpan = 4,     ///< Token, Set: notes its span, as the whole tree of a rule does
};

struct RuleRow {
    const char* name;
    std::uint16_t entry;
    std::uint8_t nullable;
};

struct ChoiceRow {
    std::uint32_t firstTarget, firstBranch;
    std::uint16_t targets, branches;  ///< how many; at most 31 branches, and 65,536 of all choices
};

/// One of the ways that a search can go on at a Choice, through the choices right behind it.
struct BranchRow {
    std::uint32_t path;    ///< in ParserTable::paths: the target taken by each of these choices
    std::uint16_t length;  ///< of the path
    std::uint16_t stop;    ///< the node that a search stops at then
};

/// Class sets, see ParserTable::classSets.
struct GuardRow {
    std::uint16_t follow, last, outside;
};

struct ParserTable {
    std::uint32_t version;
    const NodeRow* nodes;
    const RuleRow* rules;
    std::uint32_t ruleCount;
    const ChoiceRow* choices;
    std::uint32_t choiceCount;
    const std::uint16_t* targets;
    const BranchRow* branches;
    const std::uint16_t* paths;
    /// [choice * classes + class]: bit i set when branch i can go on there, or kMoreTokens and a row of
    /// `aheadRows`.
    const std::uint32_t* choiceMask;
    /// [row * (classes + 1) + class]: the same by class of the token behind; the last entry of a row are the
    /// branches that can go on whatever comes there. The end of the text decides.
    const std::uint32_t* aheadRows;
    std::uint32_t tokensAhead;    ///< so many tokens are looked at
    const std::uint8_t* classOf;  ///< by token number; 0 is end of file
    std::uint32_t classes;        ///< at most 256
    std::uint32_t maxToken;
    const std::uint64_t*
        classSets;  ///< four words a set; sets of nodes first, then FIRST of each rule, then others
    std::uint32_t firstSetBase;  ///< FIRST of rule r is set firstSetBase + r
    std::uint32_t openerSet;     ///< tokens behind which a guard's barrier says nothing
    std::uint32_t recoverFollowSet;
    const GuardRow* guards;
    std::uint32_t guardCount;
    /// [guard * classes + class of the last token]: class set of what can stand in front of it, kNone16 for
    /// anything.
    const std::uint16_t* guardBefore;
    std::uint16_t closer;  ///< token number or 0
    std::uint16_t startRule, statementRule;
    std::uint16_t recoverRule;            ///< rule or kNone16
    std::uint16_t leftParen, rightParen;  ///< token numbers for "the same parenthesis depth", 0 for none
    std::uint8_t keepTail;
    /// Nodes that a search stops at. They stand first, each behind those that can come after it without a
    /// token in between.
    std::uint32_t stops;
    std::uint32_t statementStops;  ///< those, in front, that the statement rule can come to
    /// [state * outlineColumns + outlineColumn[class]]: an automaton that takes all that the statement can
    /// read, and more. Twice the next state, and one more where the statement can end there; 0 where nothing
    /// can come any more.
    const std::uint16_t* outlineNext;
    const std::uint8_t* outlineColumn;
    std::uint32_t outlineColumns;  ///< 0: there is no outline
    std::uint16_t outlineStart;
};

constexpr std::uint32_t kMoreTokens = 0x80000000u;

/// The first node at or behind one that a search stops at: those that only shape the tree are passed over.
inline std::uint16_t searchedFrom(const ParserTable& table, std::uint16_t node) {
    const NodeRow& row = table.nodes[node];
    const bool shapes = row.op == Op::Root || row.op == Op::ScopeBegin || row.op == Op::ScopeEnd;
    return shapes ? row.run : node;
}

/// Which of all branches a branch of a Choice is.
inline std::uint16_t branchOf(const ParserTable& table, const NodeRow& choice, std::uint32_t branch) {
    return static_cast<std::uint16_t>(table.choices[choice.arg].firstBranch + branch);
}
/// Where it goes on.
inline std::uint16_t branchStop(const ParserTable& table, const NodeRow& choice, std::uint32_t branch) {
    return table.branches[branchOf(table, choice, branch)].stop;
}

struct GrammarTable {
    const char* name;
    const char* lexerFile;
    const char* parserFile;
    const char* const* tokenNames;  ///< by token number; the runtime's own names for 0 to 3
    const LexerTable* lexer;
    const ParserTable* parser;
};

}  // namespace zr::engine
