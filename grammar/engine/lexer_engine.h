#pragma once

#include <antlr3.h>

#include "grammar/engine/tables.h"

/// Runs the tables of one lexer over the runtime's character stream.
namespace zr::engine {

/// The token dispatch behind the runtime's nextToken: takes the longest match over all rules, the first rule
/// of equal ones. Characters that start no token are counted as recognition errors, reported when somebody
/// listens, and dropped.
void nextToken(const LexerTable& table, pANTLR3_LEXER lexer);

/// Takes one token of one rule at the stream's position; a mismatch is a recognition error and takes nothing.
void matchRule(const LexerTable& table, std::uint32_t rule, pANTLR3_LEXER lexer);

}  // namespace zr::engine
