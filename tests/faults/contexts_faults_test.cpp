// The recognisers as hosts in C call them, with each allocation of this library failing in turn. What the
// runtime allocates by itself is another matter: docs/limits.md.
#include <gtest/gtest.h>
#include <zrparsersql/input_stream.h>
#include <zrparsersql/recognizers/MSAccessSQL_v3.h>
#include <zrparsersql/recognizers/MSSQL.h>
#include <zrparsersql/recognizers/MSSQLfrom.h>
#include <zrparsersql/recognizers/MySQLSelect.h>
#include <zrparsersql/recognizers/Oracle.h>
#include <zrparsersql/recognizers/PostgreSQL.h>

#include <string>
#include <string_view>

#include "tests/faults/failing_heap.h"

namespace zr::faults {
namespace {

/// Type numbers of a tree in preorder: what a reading comes to.
std::string outline(pANTLR3_BASE_TREE root) {
    std::string text;
    std::vector<pANTLR3_BASE_TREE> open{root};
    while (!open.empty()) {
        const pANTLR3_BASE_TREE node = open.back();
        open.pop_back();
        text += std::to_string(node->getType(node)) + ' ';
        for (ANTLR3_UINT32 i = node->getChildCount(node); i-- > 0;)
            open.push_back(static_cast<pANTLR3_BASE_TREE>(node->getChild(node, i)));
    }
    return text;
}

/// Sets the contexts up, runs the start rule and takes all down, with a failure from `successes` on. Gives
/// the outline of the tree, nothing where there is none.
template <auto NewLexer, auto NewParser>
std::string read(std::u16string_view text, long successes, Failure::Lasts lasts, bool& happened) {
    std::string outcome;
    const pANTLR3_INPUT_STREAM input =
        zrNewUtf16InPlaceStream(text.data(), static_cast<std::uint32_t>(text.size()));
    {
        const Failure failing(successes, lasts);
        if (auto* const lexer = NewLexer(input)) {
            if (const pANTLR3_COMMON_TOKEN_STREAM tokens =
                    antlr3CommonTokenStreamSourceNew(1025, lexer->pLexer->rec->state->tokSource)) {
                if (auto* const parser = NewParser(tokens)) {
                    const pANTLR3_BASE_TREE tree = parser->start_rule(parser).tree;
                    happened = failing.happened();
                    // Whoever reads the tree has memory again.
                    const Failure none(1L << 40);
                    if (tree) outcome = outline(tree);
                    parser->free(parser);
                }
                tokens->free(tokens);
            }
            lexer->free(lexer);
        }
    }
    input->close(input);
    return outcome;
}
