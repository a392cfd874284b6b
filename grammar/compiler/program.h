#pragma once

#include <cstdint>
#include <map>
#include <set>
#include <string>
#include <vector>

#include "grammar/compiler/grammar_model.h"

/// The lowered form: what the tables will hold, still with readable containers.
namespace zr::gc {

enum class Op : std::uint8_t {
    Token,       ///< takes the token `arg`
    Set,         ///< takes a token of set `arg`
    Call,        ///< runs rule `arg`
    Choice,      ///< tries the targets in order
    Soft,        ///< takes the closer if it is there; decided later (see docs/recogniser.md)
    SoftStar,    ///< the same, any number, dropped
    Root,        ///< the tree so far becomes the children of an imaginary node `arg`
    ScopeBegin,  ///< an inlined rule starts: marks inside work on its own tree
    ScopeEnd,    ///< and ends: its tree goes to the outer one by the mark of its ScopeBegin
    End          ///< rule `arg` is done
};

/// One of the ways that a search can go on at a Choice.
struct Branch {
    int stop;               ///< the node where it goes on
    std::vector<int> path;  ///< what the choices up to there go on at, one behind the other
};

struct Node {
    explicit Node(Op o) : op(o) {}
    Op op;
    Mark mark = Mark::None;
    int arg = 0;
    bool nonEmpty = false;  ///< Call: only results that take a token count
    bool ownSpan = false;   ///< Token, Set: is the whole tree of a rule and notes its span
    int next = -1;
    std::vector<int> targets;  ///< Choice
    // filled by analyse()
    int run = -1;             ///< next node that the recogniser stops at (Root and Scope nodes passed over)
    bool behindCall = false;  ///< a call goes on here
    bool canEnd = false;
    std::set<int> first;
    int guard = -1;                ///< Call: index into guards, or -1
    int required = -1;             ///< Call: a token that must still come behind it, or -1
    std::vector<Branch> branches;  ///< Choice, filled by findBranches()
    /// Choice, filled by lookAhead(), by class of the next token: the branches that fit as bits, or kMore and
    /// a row of Program::lookahead.
    std::vector<std::uint32_t> ahead;
};

/// What must be in the text for a Call to be worth running: a token of `follow` right behind a token of
/// `last`, before anything outside `outside`.
struct Guard {
    std::set<int> follow, last, outside;
    int rule;  ///< the one that is called
    /// By class of the last token, filled by lastPairs(): the classes of those that can stand in front of it;
    /// none for any.
    std::vector<std::set<int>> before;
    bool operator==(const Guard&) const = default;
};

/// An automaton that takes all that the statement can read, and more, by class of each token; state 0 is
/// where nothing can come any more. No states where a grammar would need too many.
struct Outline {
    int start = 0;
    std::vector<std::vector<int>> next;
    std::vector<bool> accepts;
};

struct Program {
    std::vector<Node> nodes;
    int stops = 0;           ///< nodes that a search stops at: they stand first, see numberNodes()
    int statementStops = 0;  ///< those among them, in front, that the statement can come to
    std::vector<int> entry;  ///< by rule: first node
    std::vector<std::set<int>> sets;
    std::vector<Guard> guards;
    /// By class of the token further on the same again, and last what fits whatever comes.
    std::vector<std::vector<std::uint32_t>> lookahead;
    static constexpr std::uint32_t kMore = 0x80000000u;
    static constexpr std::size_t kTargets = 31;  ///< of a Choice at most, one bit each beside kMore
    static constexpr int kLookahead = 4;         ///< tokens that decide at a Choice at most
    Outline outline;
    int closer = -1;
    int opener = -1;  ///< the left parenthesis
    std::set<int> recoverFollow;
    std::vector<int> classOf;  ///< by token number
    int classes = 0;

    static bool zeroWidth(Op op) { return op == Op::Root || op == Op::ScopeBegin || op == Op::ScopeEnd; }
    int skip(int node) const {
        while (zeroWidth(nodes[static_cast<std::size_t>(node)].op))
            node = nodes[static_cast<std::size_t>(node)].next;
        return node;
    }
};

/// One rule of the lexer as a small nondeterministic program.
struct LexInstruction {
    enum class Op : std::uint8_t { Range, Split, Accept };
    explicit LexInstruction(Op o) : op(o) {}
    Op op;
    int low = 0, high = 0;  ///< Range: UTF-16 units, inclusive
    int next = -1, other = -1;
};

struct LexerProgram {
    std::vector<LexInstruction> code;
    std::vector<int> entry;  ///< by rule; -1 for a rule with an empty body
    // the automaton
    std::vector<int> unitClass;  ///< by UTF-16 unit
    int classes = 0;
    std::vector<std::vector<int>> next;  ///< by state, by class; -1 none
    std::vector<int> accept;             ///< by state: rule index or -1
};

}  // namespace zr::gc
