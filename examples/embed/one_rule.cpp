// Runs one rule of a grammar by itself, over a text that is no whole query: here SQL Server's `expression`.
#include <zrparsersql/input_stream.h>
#include <zrparsersql/recognizers/MSSQL.h>

#include <cstdio>
#include <string_view>

int main() {
    constexpr std::u16string_view text = u"price * 2 + tax , next";
    pANTLR3_INPUT_STREAM input =
        zrNewUtf16InPlaceStream(text.data(), static_cast<std::uint32_t>(text.size()));
    pMSSQLLexer lexer = MSSQLLexerNew(input);
    pANTLR3_COMMON_TOKEN_STREAM tokens =
        antlr3CommonTokenStreamSourceNew(ANTLR3_SIZE_HINT, lexer->pLexer->rec->state->tokSource);
    pMSSQLParser parser = MSSQLParserNew(tokens);

    const ZRRuleReturn sum = parser->expression(parser);
    pANTLR3_INT_STREAM place = tokens->tstream->istream;
    std::printf("root %s over %u operands\n", MSSQL_token_name(static_cast<int>(sum.tree->getType(sum.tree))),
                static_cast<unsigned>(sum.tree->getChildCount(sum.tree)));
    std::printf("tokens taken: %d\n", static_cast<int>(place->index(place)));
    std::printf("next token: %s\n", MSSQL_token_name(static_cast<int>(place->_LA(place, 1))));
    std::printf("errors: %u\n", static_cast<unsigned>(parser->pParser->rec->state->errorCount));

    // The tree belongs to the parser. What was made last goes first.
    parser->free(parser);
    tokens->free(tokens);
    lexer->free(lexer);
    input->close(input);
}
