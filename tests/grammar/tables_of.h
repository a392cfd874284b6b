#pragma once

#include "grammar/engine/contexts.h"

namespace zr::test {

/// The tables that a grammar's parser runs on. They have no name outside their generated source, but every
/// context of the grammar holds them.
template <typename Parser>
const engine::GrammarTable& tablesOf(Parser* parser) {
    return *reinterpret_cast<typename engine::ParserGlue<Parser>::Holder*>(parser)->state.grammar;
}

/// The bounds of a lexer, to be changed ahead of its first token.
template <typename Lexer>
engine::Options& lexerOptionsOf(Lexer* lexer) {
    return reinterpret_cast<typename engine::LexerGlue<Lexer>::Holder*>(lexer)->state.options;
}

/// The bounds of a context's runs, to be changed ahead of one.
template <typename Parser>
engine::Options& optionsOf(Parser* parser) {
    return reinterpret_cast<typename engine::ParserGlue<Parser>::Holder*>(parser)->state.options;
}

}  // namespace zr::test
