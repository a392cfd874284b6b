#include "grammar/engine/contexts.h"

#include <new>
#include <string>

#include "grammar/engine/diagnostics.h"
#include "grammar/engine/recogniser.h"
#include "grammar/engine/tree_builder.h"

namespace zr::engine {
namespace {

void appendNumber(std::u16string& to, std::uint32_t number) {
    for (const char c : std::to_string(number)) to.push_back(static_cast<char16_t>(c));
}

/// Stands in for the runtime's printer: the one place where reports of a recogniser become text.
void displayRecognitionError(pANTLR3_BASE_RECOGNIZER recogniser, pANTLR3_UINT8*) {
    if (!zr::diagnosticsWanted() || recogniser->state->exception == nullptr) return;
    const pANTLR3_EXCEPTION e = recogniser->state->exception;
    std::u16string text;
    appendNumber(text, static_cast<std::uint32_t>(e->line));
    text += u":";
    // The runtime counts the columns of the first line from -1.
    appendNumber(text, static_cast<std::uint32_t>(e->charPositionInLine + (e->line == 1 ? 1 : 0)));
    text += u": no way to read on";
    if (recogniser->type == ANTLR3_TYPE_PARSER && e->token != nullptr) {
        const auto* token = static_cast<pANTLR3_COMMON_TOKEN>(e->token);
        if (token->type == ANTLR3_TOKEN_EOF) {
            text += u" at the end of the text";
        } else if (token->start != 0 && token->stop >= token->start) {
            text += u" at '";
            text.append(reinterpret_cast<const char16_t*>(token->start),
                        reinterpret_cast<const char16_t*>(token->stop) + 1);
            text += u"'";
        }
    }
    zr::diagnose(text);
}

/// The on-channel tokens of the stream from its position on.
struct Tokens {
    std::vector<pANTLR3_COMMON_TOKEN> list;
    std::vector<std::uint16_t> types;
    pANTLR3_COMMON_TOKEN endOfFile = nullptr;

    explicit Tokens(pANTLR3_TOKEN_STREAM stream) {
        stream->_LT(stream, 1);  // fills the buffer
        const auto* common = static_cast<pANTLR3_COMMON_TOKEN_STREAM>(stream->super);
        const ANTLR3_UINT32 count = common->tokens->count;
        const auto from = static_cast<ANTLR3_UINT32>(common->p < 0 ? 0 : common->p);
        list.reserve(count - std::min(from, count));
        types.reserve(list.capacity());
        for (ANTLR3_UINT32 i = from; i < count; ++i) {
            auto* token = static_cast<pANTLR3_COMMON_TOKEN>(common->tokens->elements[i].element);
            if (token->channel != common->channel || token->type == ANTLR3_TOKEN_EOF) continue;
            list.push_back(token);
            types.push_back(static_cast<std::uint16_t>(token->type));
        }
        endOfFile = &stream->tokenSource->eofToken;
    }
};

class RuleRun final : TreeBuilder::ErrorNodes {
 public:
    RuleRun(const ParserState& state)
        : state_(state), table_(*state.grammar->parser), stream_(state.parser->tstream), tokens_(stream_) {}

    ZRRuleReturn run(std::uint16_t rule) {
        const bool start = rule == table_.startRule;
        const std::uint16_t wanted = start ? table_.statementRule : rule;
        if (tokens_.list.size() > state_.options.maxTokens) return failed(0);
        Recogniser recogniser(table_, tokens_.types, state_.options);
        Recogniser::Result result = recogniser.run(wanted, 0);
        if (result.found || result.overLimit || !start || table_.recoverRule == kNone16)
            return finish(recogniser, result, start);
        // Nothing reads the statement: its mandatory part is left to recovery.
        Recogniser recovering(table_, tokens_.types, state_.options);
        result = recovering.recover(wanted, 0);
        return finish(recovering, result, start);
    }

 private:
    ZRRuleReturn finish(const Recogniser& recogniser, const Recogniser::Result& result, bool start) {
        if (result.overBudget) zr::diagnose(u"the search for the furthest reading was cut short");
        if (!result.found) return failed(0);
        TreeBuilder builder(*state_.grammar, recogniser, tokens_.list, state_.adaptor);
        std::vector<pANTLR3_BASE_TREE> roots = builder.build(result, *this);
        const auto count = static_cast<std::uint32_t>(tokens_.list.size());
        std::uint32_t end = result.high;
        if (start) {
            if (table_.keepTail) {
                for (std::uint32_t i = end; i < count; ++i) roots.push_back(leaf(tokens_.list[i]));
                roots.push_back(leaf(tokens_.endOfFile));
            }
            end = count;
        }
        moveTo(end);
        ZRRuleReturn value{nullptr, nullptr, single(roots)};
        if (count != 0) value.start = tokens_.list[0];
        if (end != 0) value.stop = tokens_.list[end - 1];
        if (value.tree != nullptr && value.start != nullptr && value.stop != nullptr)
            state_.adaptor->setTokenBoundaries(state_.adaptor, value.tree, value.start, value.stop);
        return value;
    }

    pANTLR3_BASE_TREE leaf(pANTLR3_COMMON_TOKEN token) const {
        return static_cast<pANTLR3_BASE_TREE>(state_.adaptor->create(state_.adaptor, token));
    }

    /// One root stands for itself, several go under a nil node.
    pANTLR3_BASE_TREE single(const std::vector<pANTLR3_BASE_TREE>& roots) const {
        if (roots.size() == 1) return roots[0];
        const auto nil = static_cast<pANTLR3_BASE_TREE>(state_.adaptor->nilNode(state_.adaptor));
        for (pANTLR3_BASE_TREE root : roots) state_.adaptor->addChild(state_.adaptor, nil, root);
        return nil;
    }

    /// The whole rule failed at its first token: the error node is its tree, and nothing is taken.
    ZRRuleReturn failed(std::uint32_t at) {
        ZRRuleReturn value{nullptr, nullptr, errorNode(at, at)};
        value.start = value.stop = tokens_.list.empty() ? tokens_.endOfFile : tokens_.list[0];
        return value;
    }

    pANTLR3_BASE_TREE errorNode(std::uint32_t from, std::uint32_t to) override {
        const pANTLR3_BASE_RECOGNIZER recogniser = state_.parser->rec;
        const ANTLR3_MARKER place = stream_->istream->index(stream_->istream);
        moveTo(from);
        recogniser->exConstruct(recogniser);
        if (recogniser->state->exception != nullptr)
            recogniser->state->exception->type = ANTLR3_NO_VIABLE_ALT_EXCEPTION;
        recogniser->state->errorRecovery = ANTLR3_FALSE;
        recogniser->reportError(recogniser);
        recogniser->state->errorRecovery = ANTLR3_FALSE;
        stream_->istream->seek(stream_->istream, place);
        const auto tokenAt = [&](std::uint32_t i) {
            return i < tokens_.list.size() ? tokens_.list[i] : tokens_.endOfFile;
        };
        return static_cast<pANTLR3_BASE_TREE>(
            state_.adaptor->errorNode(state_.adaptor, stream_, tokenAt(from),
                                      tokenAt(to > from ? to - 1 : from), recogniser->state->exception));
    }

    void moveTo(std::uint32_t position) {
        const pANTLR3_INT_STREAM is = stream_->istream;
        if (position < tokens_.list.size()) {
            is->seek(is, tokens_.list[position]->index);
            return;
        }
        const auto* common = static_cast<pANTLR3_COMMON_TOKEN_STREAM>(stream_->super);
        is->seek(is, common->tokens->count);
    }

    const ParserState& state_;
    const ParserTable& table_;
    pANTLR3_TOKEN_STREAM stream_;
    Tokens tokens_;
};

}  // namespace

pANTLR3_LEXER newLexer(const GrammarTable& grammar, pANTLR3_INPUT_STREAM input,
                       pANTLR3_RECOGNIZER_SHARED_STATE state) {
    constexpr ANTLR3_UINT32 kSizeHint = 1025;
    if (grammar.lexer->version != kTableVersion) return nullptr;
    const pANTLR3_LEXER lexer = antlr3LexerNewStream(kSizeHint, input, state);
    if (lexer == nullptr) return nullptr;
    lexer->rec->displayRecognitionError = &displayRecognitionError;
    return lexer;
}

pANTLR3_PARSER newParser(const GrammarTable& grammar, pANTLR3_COMMON_TOKEN_STREAM tokens,
                         pANTLR3_RECOGNIZER_SHARED_STATE state) {
    constexpr ANTLR3_UINT32 kSizeHint = 1025;
    constexpr ANTLR3_UINT32 kMemoDepth = 15;
    if (grammar.parser->version != kTableVersion) return nullptr;
    const pANTLR3_PARSER parser = antlr3ParserNewStream(kSizeHint, tokens->tstream, state);
    if (parser == nullptr) return nullptr;
    parser->rec->displayRecognitionError = &displayRecognitionError;
    // The runtime's own rule memo is part of what a context promises; the engine keeps its results elsewhere.
    parser->rec->state->ruleMemo = antlr3IntTrieNew(kMemoDepth);
    parser->rec->state->tokenNames = reinterpret_cast<pANTLR3_UINT8*>(
        const_cast<char**>(reinterpret_cast<const char* const*>(grammar.tokenNames)));
    return parser;
}

void freeParserParts(pANTLR3_PARSER parser, pANTLR3_BASE_TREE_ADAPTOR adaptor,
                     pANTLR3_VECTOR_FACTORY vectors) {
    if (vectors != nullptr) vectors->close(vectors);
    if (adaptor != nullptr) adaptor->free(adaptor);
    if (parser->rec->state->ruleMemo != nullptr) {
        parser->rec->state->ruleMemo->free(parser->rec->state->ruleMemo);
        parser->rec->state->ruleMemo = nullptr;
    }
    parser->free(parser);
}

ZRRuleReturn runRule(const ParserState& state, std::uint16_t rule) {
    try {
        return RuleRun(state).run(rule);
    } catch (const std::bad_alloc&) {
        // The contexts are C: no exception goes through them.
        return {nullptr, nullptr, nullptr};
    }
}

}  // namespace zr::engine
