#pragma once

#include "grammar/compiler/grammar_model.h"
#include "grammar/compiler/program.h"

/// The passes behind the readers, in the order in which compile.cpp runs them.
namespace zr::gc {

/// Resolves rule names, finds the statement rule, unwraps bodies that are one optional, and refuses what
/// can't work: undefined or unreachable rules, left recursion, loops over an empty body.
void resolve(ParserGrammar& grammar);

/// What every later pass asks about a rule. Sets hold token numbers, end of file as kEof.
struct Facts {
    std::vector<bool> nullable;
    std::vector<std::set<int>> first, last;
    /// What a rule can take while no opener has been taken: its tokens without those of nested statements
    /// (the island) and of complements such as `'\'' (~'\'')*`, which are only reached through their opener.
    std::vector<std::set<int>> outside;
    std::set<int> openers;

    bool nullableElement(const Element& e) const;
    bool nullableBody(const std::vector<Alternative>& alternatives) const;
    std::set<int> firstElement(const Element& e) const;
};
Facts collectFacts(const ParserGrammar& grammar);

/// Where an inlined rule needs a scope for its tree.
enum class ScopeNeed : std::uint8_t {
    Never,   ///< it is one token, which can carry the mark of whoever calls the rule
    Marked,  ///< only where it is called with a mark
    Always
};
/// By rule.
std::vector<ScopeNeed> scopeNeeds(const ParserGrammar& grammar);

/// Lowers the rules to one program of nodes; see program.h.
Program lower(const ParserGrammar& grammar, const Facts& facts);

/// Puts small rules in the place of calls that ask for nothing behind them.
void inlineCalls(Program& program, const ParserGrammar& grammar, const Facts& facts);

/// The token whose optional, dropped occurrences may be taken as a run (see docs/recogniser.md), or -1 when
/// the grammar doesn't allow it. Fills the reason why not.
int findCloser(const ParserGrammar& grammar, const Facts& facts, const Program& program, std::string& why);

/// Turns plain optional nodes of the closer into Soft nodes.
void applyCloser(Program& program, int closer);

/// By node: whether it is a Call that asks for what must follow it.
std::vector<bool> guardedCalls(Program program, const Facts& facts);

/// FIRST sets, guards, token classes: everything the tables hold that follows from the nodes.
void analyse(Program& program, const ParserGrammar& grammar, const Facts& facts, int maxToken);

/// Finds the branches of each choice, with those of choices that come right behind it. Of two that go on at
/// one node the first stays.
void findBranches(Program& program);

/// Leaves out the branches that read nothing which earlier ones of the same choice don't read.
void dropCovered(Program& program, const ParserGrammar& grammar);

/// Finds what a statement can look like from its front.
void findOutline(Program& program, const ParserGrammar& grammar);

/// Finds what can stand in front of the last token of what a guard waits for the end of.
void lastPairs(Program& program, const Facts& facts);

/// Puts the nodes that a search stops at first, those of the statement in front, each behind those that can
/// come after it without a token in between; those that only shape the tree follow. What nothing leads to
/// goes.
void numberNodes(Program& program, const Facts& facts, const ParserGrammar& grammar);

/// Finds which branches of each choice fit by the tokens ahead.
void lookAhead(Program& program);

/// Lexer: one automaton for the longest match over all rules, and one program a rule for single-rule calls.
LexerProgram buildLexer(const LexerGrammar& grammar);

struct Output {
    std::string headerDirectory, sourceFile;
};
void emit(const Vocabulary& vocabulary, const LexerGrammar& lexer, const LexerProgram& lexerProgram,
          const ParserGrammar& parser, const Facts& facts, const Program& program, const Output& output);

}  // namespace zr::gc
