#include "grammar/engine/contexts.h"

#include <cstdlib>
#include <new>
#include <string_view>
#include <vector>

#include "grammar/engine/diagnostics.h"
#include "grammar/engine/rule_reading.h"
#include "grammar/engine/runtime_place.h"

namespace zr::engine {
namespace {

/// Stands in for the runtime's printer: the one place where reports of a recogniser become text.
void displayRecognitionError(pANTLR3_BASE_RECOGNIZER recogniser, pANTLR3_UINT8*) {
    if (!zr::diagnosticsWanted() || recogniser->state->exception == nullptr) return;
    const pANTLR3_EXCEPTION e = recogniser->state->exception;
    const auto* token =
        recogniser->type == ANTLR3_TYPE_PARSER ? static_cast<pANTLR3_COMMON_TOKEN>(e->token) : nullptr;
    if (token != nullptr && token->type == ANTLR3_TOKEN_EOF)
        return reportUnreadableEnd(static_cast<std::uint32_t>(e->line));
    std::u16string_view units;
    if (token != nullptr && token->start != 0 && token->stop >= token->start) {
        const auto* first = reinterpret_cast<const char16_t*>(token->start);
        const auto* last = reinterpret_cast<const char16_t*>(token->stop);
        units = {first, static_cast<std::size_t>(last - first) + 1};
    }
    reportUnreadable(placeOf(static_cast<ANTLR3_UINT32>(e->line), e->charPositionInLine), units);
}

/// The runtime uses what it allocates without looking at it. Where it is about to allocate, so much is asked
/// for ahead of it and given back: when there is none left, it isn't called.
bool isRoomFor(std::size_t bytes) {
    // Volatile, or the compiler would see that nothing is done with it.
    void* volatile const probe = std::malloc(bytes);
    std::free(probe);
    return probe != nullptr;
}

/// A context with what it needs to get going: its first pools of tokens, nodes and lists.
constexpr std::size_t kContextBytes = std::size_t{1} << 20;

/// Nodes and the lists of their children, at most, for each token.
constexpr std::size_t kTreeBytesOfToken = 4 * sizeof(ANTLR3_COMMON_TREE);

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

/// The runtime's nodes, made by its adaptor.
class RuntimeTree {
 public:
    using Node = pANTLR3_BASE_TREE;

    RuntimeTree(const ParserState& state, pANTLR3_TOKEN_STREAM stream, const Tokens& tokens)
        : state_(state), adaptor_(state.adaptor), stream_(stream), tokens_(tokens) {}

    Node token(std::uint32_t position) { return leaf(tokens_.list[position]); }
    Node end() { return leaf(tokens_.endOfFile); }
    Node imaginary(std::uint16_t type) {
        const char* name = state_.grammar->tokenNames[type];
        return static_cast<Node>(adaptor_->createTypeText(
            adaptor_, type, reinterpret_cast<pANTLR3_UINT8>(const_cast<char*>(name))));
    }
    Node list() { return static_cast<Node>(adaptor_->nilNode(adaptor_)); }
    Node error(std::uint32_t from, std::uint32_t to) {
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
        return static_cast<Node>(adaptor_->errorNode(adaptor_, stream_, tokenAt(from),
                                                     tokenAt(to > from ? to - 1 : from),
                                                     recogniser->state->exception));
    }
    void adopt(Node root, const Node* children, std::uint32_t count) {
        for (std::uint32_t i = 0; i < count; ++i) adaptor_->addChild(adaptor_, root, children[i]);
    }
    void bound(Node node, std::uint32_t from, std::uint32_t to) {
        adaptor_->setTokenBoundaries(adaptor_, node, tokens_.list[from], tokens_.list[to - 1]);
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

 private:
    Node leaf(pANTLR3_COMMON_TOKEN token) const {
        return static_cast<Node>(adaptor_->create(adaptor_, token));
    }
    pANTLR3_COMMON_TOKEN tokenAt(std::uint32_t position) const {
        return position < tokens_.list.size() ? tokens_.list[position] : tokens_.endOfFile;
    }

    const ParserState& state_;
    pANTLR3_BASE_TREE_ADAPTOR adaptor_;
    pANTLR3_TOKEN_STREAM stream_;
    const Tokens& tokens_;
};

ZRRuleReturn readFromStream(const ParserState& state, std::uint16_t rule) {
    const pANTLR3_TOKEN_STREAM stream = state.parser->tstream;
    const Tokens tokens(stream);
    if (!isRoomFor(kContextBytes + tokens.list.size() * kTreeBytesOfToken)) throw std::bad_alloc();
    RuntimeTree tree(state, stream, tokens);
    const auto read = readRule(*state.grammar, tokens.types, state.options, rule, tree);
    ZRRuleReturn value{nullptr, nullptr, read.root};
    if (read.failed) {
        value.start = value.stop = tokens.list.empty() ? tokens.endOfFile : tokens.list[0];
        return value;
    }
    tree.moveTo(read.end);
    if (!tokens.list.empty()) value.start = tokens.list[0];
    if (read.end != 0) value.stop = tokens.list[read.end - 1];
    return value;
}

}  // namespace

pANTLR3_LEXER newLexer(const GrammarTable& grammar, pANTLR3_INPUT_STREAM input,
                       pANTLR3_RECOGNIZER_SHARED_STATE state) {
    constexpr ANTLR3_UINT32 kSizeHint = 1025;
    if (grammar.lexer->version != kTableVersion || !isRoomFor(kContextBytes)) return nullptr;
    const pANTLR3_LEXER lexer = antlr3LexerNewStream(kSizeHint, input, state);
    if (lexer == nullptr) return nullptr;
    lexer->rec->displayRecognitionError = &displayRecognitionError;
    return lexer;
}

pANTLR3_PARSER newParser(const GrammarTable& grammar, pANTLR3_COMMON_TOKEN_STREAM tokens,
                         pANTLR3_RECOGNIZER_SHARED_STATE state) {
    constexpr ANTLR3_UINT32 kSizeHint = 1025;
    constexpr ANTLR3_UINT32 kMemoDepth = 15;
    if (grammar.parser->version != kTableVersion || !isRoomFor(kContextBytes)) return nullptr;
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
        return readFromStream(state, rule);
    } catch (const std::bad_alloc&) {
        // The contexts are C: no exception goes through them.
        return {nullptr, nullptr, nullptr};
    }
}

}  // namespace zr::engine
