#pragma once

#include <zrparsersql/input_stream.h>

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <type_traits>

namespace zr::test {

/// The contexts of one grammar over one text, as a host sets them up. The functions are those that make a
/// context, with a shared state or without.
template <auto NewLexer, auto NewParser>
class ContextsOf {
    template <auto New, class Source>
    static auto make(Source source) {
        if constexpr (std::is_invocable_v<decltype(New), Source>)
            return New(source);
        else
            return New(source, nullptr);
    }

 public:
    explicit ContextsOf(std::u16string_view text)
        : input(zrNewUtf16InPlaceStream(text.data(), static_cast<std::uint32_t>(text.size()))),
          lexer(make<NewLexer>(input)),
          tokens(antlr3CommonTokenStreamSourceNew(1025, lexer->pLexer->rec->state->tokSource)),
          parser(make<NewParser>(tokens)) {}
    ContextsOf(const ContextsOf&) = delete;
    ContextsOf& operator=(const ContextsOf&) = delete;
    ~ContextsOf() {
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
    ANTLR3_MARKER position() const { return tokens->tstream->istream->index(tokens->tstream->istream); }
    void moveTo(std::size_t position) {
        tokens->tstream->istream->seek(tokens->tstream->istream, static_cast<ANTLR3_MARKER>(position));
    }
    ANTLR3_UINT32 parserErrors() const { return parser->pParser->rec->state->errorCount; }
    ANTLR3_UINT32 lexerErrors() const { return lexer->pLexer->rec->state->errorCount; }

    pANTLR3_INPUT_STREAM input;
    decltype(make<NewLexer>(pANTLR3_INPUT_STREAM{})) lexer;
    pANTLR3_COMMON_TOKEN_STREAM tokens;
    decltype(make<NewParser>(pANTLR3_COMMON_TOKEN_STREAM{})) parser;
};

}  // namespace zr::test
