#pragma once

#include <antlr3.h>

#include "grammar/engine/lexer_match.h"
#include "grammar/engine/options.h"
#include "grammar/engine/tables.h"

/// Runs the tables of one lexer over the runtime's character stream.
namespace zr::engine {

/// The part of a lexer context that hosts don't see.
struct LexerState {
    const LexerTable* table = nullptr;
    Options options;
    std::uint32_t tokens = 0;  ///< that were taken since the start of the text
    LexerDeadEnds deadEnds;
};

/// The token dispatch behind the runtime's nextToken: takes the longest match over all rules, the first rule
/// of equal ones. Characters that start no token are counted as recognition errors, reported when somebody
/// listens, and dropped.
///
/// Of a text with more units than the options allow no token is taken; one with more tokens ends behind the
/// first that is too many. Either is an error, and the stream then stands at its end.
void nextToken(LexerState& state, pANTLR3_LEXER lexer);

/// Takes one token of one rule at the stream's position; a mismatch is a recognition error and takes nothing.
void matchRule(const LexerTable& table, std::uint32_t rule, pANTLR3_LEXER lexer);

}  // namespace zr::engine
