#pragma once

#include <antlr3.h>

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "grammar/engine/tables.h"
#include "tests/grammar/syntax_dump.h"

namespace zr::test {

struct TokenText {
    int type;
    std::u16string text;   ///< without what the lexer cuts from its ends
    std::size_t from, to;  ///< where it stands in the text, uncut
    bool operator==(const TokenText&) const = default;
};

/// The text of a node of the runtime.
std::u16string textOf(pANTLR3_BASE_TREE node);

/// What lexer and parser of one grammar make of a text, copied out of the runtime's objects, which are gone.
struct Reading {
    std::vector<TokenText> tokens;  ///< without the end of input
    SyntaxDump tree;                ///< what the start rule returns
    SyntaxDump statement;           ///< the same without the tail where the root is a list of both
    bool rootIsList = false;
    bool wellFormed = true;  ///< no node stands in the tree twice
    std::size_t taken = 0;   ///< tokens that the statement's own rule takes
    bool hasErrorNode = false;
};

/// A grammar as the tests see it.
struct Grammar {
    std::string_view corpus;  ///< folder under tests/corpus
    const char* (*tokenName)(int type);
    std::vector<TokenText> (*lex)(std::u16string_view text);
    Reading (*read)(std::u16string_view text);
    /// The same, with lexer, token stream and parser asked twice: what the second call returns.
    Reading (*readAgain)(std::u16string_view text);
    const engine::GrammarTable& (*tables)();
    /// The statement's tree alone, with these bounds on the quick search: what hard texts come to. With none
    /// the full search reads the whole.
    SyntaxDump (*readBounded)(std::u16string_view text, std::uint32_t quickSteps,
                              std::uint32_t rememberingSteps);
};

/// Every test that is about all grammars goes over this list.
extern const Grammar kGrammars[];
extern const std::size_t kGrammarCount;

}  // namespace zr::test
