#pragma once

#include <antlr3.h>
#include <zrparsersql/recognizers/common.h>

#include "grammar/engine/lexer_engine.h"
#include "grammar/engine/options.h"
#include "grammar/engine/tables.h"

/// What stands between a context structure, whose layout is the hosts', and the engine: the generated sources
/// fill the entries with these functions, one instance a rule.
namespace zr::engine {

/// The part of a parser context that hosts don't see.
struct ParserState {
    const GrammarTable* grammar = nullptr;
    pANTLR3_PARSER parser = nullptr;
    pANTLR3_BASE_TREE_ADAPTOR adaptor = nullptr;
    Options options;
};

/// Runs one rule from the token stream's position and moves the stream behind what was taken.
ZRRuleReturn runRule(const ParserState& state, std::uint16_t rule);

/// Sets up or takes down what a context holds; the pieces that don't depend on the context's type.
pANTLR3_LEXER newLexer(const GrammarTable& grammar, pANTLR3_INPUT_STREAM input,
                       pANTLR3_RECOGNIZER_SHARED_STATE state);
pANTLR3_PARSER newParser(const GrammarTable& grammar, pANTLR3_COMMON_TOKEN_STREAM tokens,
                         pANTLR3_RECOGNIZER_SHARED_STATE state);
void freeParserParts(pANTLR3_PARSER parser, pANTLR3_BASE_TREE_ADAPTOR adaptor,
                     pANTLR3_VECTOR_FACTORY vectors);

template <typename Context>
struct LexerGlue {
    struct Holder {
        Context context;  // first, so that the two addresses are one
        LexerState state;
    };

    static Context* create(const GrammarTable& grammar, pANTLR3_INPUT_STREAM input,
                           pANTLR3_RECOGNIZER_SHARED_STATE state, void (*bind)(Context&)) {
        auto* holder = static_cast<Holder*>(ANTLR3_CALLOC(1, sizeof(Holder)));
        if (holder == nullptr) return nullptr;
        holder->state = LexerState{grammar.lexer, Options{}, 0, {}};
        Context& context = holder->context;
        context.pLexer = newLexer(grammar, input, state);
        if (context.pLexer == nullptr) {
            ANTLR3_FREE(holder);
            return nullptr;
        }
        bind(context);
        context.free = &release;
        context.pLexer->ctx = &context;
        context.pLexer->mTokens = &dispatch;
        return &context;
    }

    template <std::uint32_t Rule>
    static void entry(Context* context) {
        matchRule(*stateOf(context).table, Rule, context->pLexer);
    }

 private:
    static LexerState& stateOf(Context* context) { return reinterpret_cast<Holder*>(context)->state; }
    static void dispatch(void* context) {
        auto* self = static_cast<Context*>(context);
        nextToken(stateOf(self), self->pLexer);
    }
    static void release(Context* context) {
        context->pLexer->free(context->pLexer);
        ANTLR3_FREE(context);
    }
};

template <typename Context>
struct ParserGlue {
    struct Holder {
        Context context;  // first, so that the two addresses are one
        ParserState state;
    };

    static Context* create(const GrammarTable& grammar, pANTLR3_COMMON_TOKEN_STREAM tokens,
                           pANTLR3_RECOGNIZER_SHARED_STATE state, void (*bind)(Context&)) {
        auto* holder = static_cast<Holder*>(ANTLR3_CALLOC(1, sizeof(Holder)));
        if (holder == nullptr) return nullptr;
        Context& context = holder->context;
        context.pParser = newParser(grammar, tokens, state);
        if (context.pParser == nullptr) {
            ANTLR3_FREE(holder);
            return nullptr;
        }
        context.pParser->super = &context;
        bind(context);
        context.free = &release;
        context.adaptor = ANTLR3_TREE_ADAPTORNew(tokens->tstream->tokenSource->strFactory);
        context.vectors = antlr3VectorFactoryNew(0);
        if (context.adaptor == nullptr || context.vectors == nullptr) {
            release(&context);
            return nullptr;
        }
        holder->state = ParserState{&grammar, context.pParser, context.adaptor, Options{}};
        return &context;
    }

    template <std::uint16_t Rule>
    static ZRRuleReturn entry(Context* context) {
        return runRule(reinterpret_cast<Holder*>(context)->state, Rule);
    }

 private:
    static void release(Context* context) {
        freeParserParts(context->pParser, context->adaptor, context->vectors);
        ANTLR3_FREE(context);
    }
};

}  // namespace zr::engine
