#pragma once

#include "grammar/compiler/grammar_model.h"

/// The three readers: file text to model. Each throws GrammarError with file and line.
namespace zr::gc {

/// NAME.tokens: `NAME=number` or `'literal'=number`, one entry a line.
Vocabulary readVocabulary(const std::string& path);

/// NAME.lexer: see docs/grammars.md for the notation. Literal tokens are expanded where `literals;` stands.
LexerGrammar readLexer(const std::string& path, const Vocabulary& vocabulary);

/// The parser rules of several files, in this order. Names of tokens are resolved, names of rules are not.
ParserGrammar readParser(const std::vector<std::string>& paths, const Vocabulary& vocabulary);

}  // namespace zr::gc
