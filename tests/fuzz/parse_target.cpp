// Any text is read to a sound tree; reading it twice gives the same, and so does the search by sets.

#include "tests/fuzz/check.h"
#include "tests/fuzz/sql.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    using zr::fuzz::require;
    const std::u16string text = zr::fuzz::unitsOf(data, size);
    const zr::test::Grammar& grammar = zr::fuzz::grammarOfTarget();
    const zr::test::Reading reading = grammar.read(text);
    require(reading.wellFormed, "no node stands in the tree twice");
    require(!reading.tree.empty(), "there is a tree");
    require(reading.taken <= reading.tokens.size(), "a statement takes tokens of the text");
    const std::string tree = reading.tree.flat();
    if (reading.rootIsList)
        require(tree.starts_with("(0 \"nil\" (") && tree.ends_with(" (-1 \"<EOF>\"))"), "a list to the end");
    else if (tree.starts_with("(0 "))
        require(tree == "(0 \"Tree Error Node\")", "one error node or a statement");

    // Both cost more than the reading itself: on long texts they would keep the fuzzer from everything else.
    constexpr std::size_t kFewTokens = 60;
    if (reading.tokens.size() > kFewTokens) return 0;
    require(grammar.readAgain(text).tree.flat() == tree, "the same tree again");
    require(grammar.readBounded(text, 0, 0).flat() == reading.statement.flat(),
            "the same tree by the full search");
    require(grammar.readBounded(text, 1, 1000).flat() == reading.statement.flat(),
            "the same tree by a search that remembers all");
    return 0;
}
