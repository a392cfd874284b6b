#pragma once

#include <zrparsersql/input_stream.h>
#include <zrparsersql/recognizers/MSSQL.h>
#include <zrparsersql/recognizers/MSSQL_tokens.h>

#include <cstdint>
#include <string_view>

namespace zr::test {

/// The SQL Server contexts over one text, as a host sets them up.
class Contexts {
 public:
    explicit Contexts(std::u16string_view text)
        : input(zrNewUtf16InPlaceStream(text.data(), static_cast<std::uint32_t>(text.size()))),
          lexer(MSSQLLexerNew(input)),
          tokens(antlr3CommonTokenStreamSourceNew(1025, lexer->pLexer->rec->state->tokSource)),
          parser(MSSQLParserNew(tokens)) {}
    Contexts(const Contexts&) = delete;
    Contexts& operator=(const Contexts&) = delete;
    ~Contexts() {
        parser->free(parser);
        tokens->free(tokens);
        lexer->free(lexer);
        input->close(input);
    }

    pANTLR3_BASE_TREE start() { return parser->start_rule(parser).tree; }

    /// Tokens of the text; asking fills the stream.
    std::size_t tokenCount() {
        tokens->tstream->_LT(tokens->tstream, 1);
        return tokens->tokens->count;
    }
    std::size_t position() const {
        return static_cast<std::size_t>(tokens->tstream->istream->index(tokens->tstream->istream));
    }
    void moveTo(std::size_t position) {
        tokens->tstream->istream->seek(tokens->tstream->istream, static_cast<ANTLR3_MARKER>(position));
    }
    std::uint32_t parserErrors() const { return parser->pParser->rec->state->errorCount; }
    std::uint32_t lexerErrors() const { return lexer->pLexer->rec->state->errorCount; }

    pANTLR3_INPUT_STREAM input;
    pMSSQLLexer lexer;
    pANTLR3_COMMON_TOKEN_STREAM tokens;
    pMSSQLParser parser;
};

}  // namespace zr::test
