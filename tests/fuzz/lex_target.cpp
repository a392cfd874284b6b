// Any text is cut into tokens that stand one behind the other in it, each of the vocabulary.

#include "tests/fuzz/check.h"
#include "tests/fuzz/sql.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using zr::fuzz::require;
    const std::u16string text = zr::fuzz::unitsOf(data, size);
    const zr::test::Grammar& grammar = zr::fuzz::grammarOfTarget();
    const std::vector<zr::test::TokenText> tokens = grammar.lex(text);
    const auto lastType = static_cast<int>(grammar.tables().parser->maxToken);
    std::size_t done = 0;
    for (const zr::test::TokenText& token : tokens) {
        require(token.type > 0 && token.type <= lastType, "a token of the vocabulary");
        require(token.from >= done && token.to > token.from && token.to <= text.size(), "tokens in order");
        require(token.text.size() <= token.to - token.from, "the text of a token within it");
        done = token.to;
    }
    require(grammar.lex(text) == tokens, "the same tokens again");
    return 0;
}
