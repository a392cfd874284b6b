#pragma once

#include <antlr3.h>

#include <memory>
#include <utility>

#include "parser/recognizers.h"

namespace zr {

constexpr ANTLR3_UINT32 kTokenStreamSizeHint = 1025;

// Lexer, token stream, parser and result of one parse of an input stream, which it neither owns nor closes.
// The tree lives as long as this object.
template <class Grammar>
class Pipeline {
 public:
    // Null when a piece can't be made; what was made before it is freed.
    static std::unique_ptr<Pipeline> run(pANTLR3_INPUT_STREAM input) {
        std::unique_ptr<Pipeline> pipeline(new Pipeline);
        pipeline->m_lexer = Grammar::newLexer(input);
        if (!pipeline->m_lexer) return nullptr;
        pipeline->m_tokens = antlr3CommonTokenStreamSourceNew(
            kTokenStreamSizeHint, pipeline->m_lexer->pLexer->rec->state->tokSource);
        if (!pipeline->m_tokens) return nullptr;
        pipeline->m_parser = Grammar::newParser(pipeline->m_tokens);
        if (!pipeline->m_parser) return nullptr;
        pipeline->m_result = Grammar::run(pipeline->m_parser);
        return pipeline;
    }
    ~Pipeline() {
        if (m_tokens) m_tokens->free(m_tokens);
        if (m_lexer) m_lexer->free(m_lexer);
        if (m_parser) m_parser->free(m_parser);
    }
    Pipeline(const Pipeline&) = delete;
    Pipeline& operator=(const Pipeline&) = delete;

    pANTLR3_BASE_TREE tree() const { return m_result.tree; }
    pANTLR3_COMMON_TOKEN_STREAM tokens() const { return m_tokens; }

 private:
    Pipeline() = default;

    ZRRuleReturn m_result{};
    pANTLR3_COMMON_TOKEN_STREAM m_tokens = nullptr;
    typename Grammar::Lexer m_lexer = nullptr;
    typename Grammar::Parser m_parser = nullptr;
};

}  // namespace zr
