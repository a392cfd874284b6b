#include "tests/grammar/reading.h"

#include <zrparsersql/input_stream.h>
#include <zrparsersql/recognizers/MSAccessSQL_v3.h>
#include <zrparsersql/recognizers/MSAccessSQL_v3_tokens.h>
#include <zrparsersql/recognizers/MSSQL.h>
#include <zrparsersql/recognizers/MSSQL_tokens.h>
#include <zrparsersql/recognizers/MSSQLfrom.h>
#include <zrparsersql/recognizers/MSSQLfrom_tokens.h>
#include <zrparsersql/recognizers/MySQLSelect.h>
#include <zrparsersql/recognizers/MySQLSelect_tokens.h>
#include <zrparsersql/recognizers/Oracle.h>
#include <zrparsersql/recognizers/Oracle_tokens.h>
#include <zrparsersql/recognizers/PostgreSQL.h>
#include <zrparsersql/recognizers/PostgreSQL_tokens.h>

#include <new>
#include <set>
#include <type_traits>

#include "tests/grammar/json_string.h"
#include "tests/grammar/tables_of.h"

namespace zr::test {
namespace {

/// A token of the text is read from the text itself: a string that the runtime makes of UTF-16 input may bear
/// the wrong encoding. Imaginary and error nodes have plain characters for a text.
std::u16string tokenText(ANTLR3_COMMON_TOKEN& token) {
    if (token.textState == ANTLR3_TEXT_CHARP) {
        const std::string_view name = reinterpret_cast<const char*>(token.tokText.chars);
        return {name.begin(), name.end()};
    }
    if (token.textState == ANTLR3_TEXT_STRING || token.type == ANTLR3_TOKEN_EOF) {
        const ANTLR3_STRING& text = *token.getText(&token);
        return {reinterpret_cast<const char16_t*>(text.chars), text.len};
    }
    const auto* first = reinterpret_cast<const char16_t*>(token.start);
    const auto* last = reinterpret_cast<const char16_t*>(token.stop);
    return last < first ? std::u16string() : std::u16string(first, last + 1);
}

}  // namespace

std::u16string textOf(pANTLR3_BASE_TREE node) {
    if (node->isNilNode(node)) return u"nil";
    if (pANTLR3_COMMON_TOKEN token = node->getToken(node)) return tokenText(*token);
    pANTLR3_STRING text = node->getText(node);
    return text == nullptr ? std::u16string() : std::u16string(text->chars, text->chars + text->len);
}

namespace {

/// The recognisers of one grammar. A statement's rule is the one that its start rule begins with.
template <auto LexerNew, auto ParserNew, auto StatementRule>
struct Recognisers {
    using Lexer = decltype(LexerNew(nullptr));
    using Parser = decltype(ParserNew(nullptr));
    static Lexer newLexer(pANTLR3_INPUT_STREAM input) { return LexerNew(input); }
    static Parser newParser(pANTLR3_COMMON_TOKEN_STREAM tokens) { return ParserNew(tokens); }
    static ZRRuleReturn readStatement(Parser parser) { return (parser->*StatementRule)(parser); }
};

/// Lexer, token stream and parser over one text, freed in the order in which the runtime wants it.
template <typename G>
class Pipeline {
 public:
    explicit Pipeline(std::u16string_view text)
        : text_(text),
          input_(check(zrNewUtf16InPlaceStream(text.data(), static_cast<std::uint32_t>(text.size())))),
          lexer_(check(G::newLexer(input_))),
          tokens_(check(antlr3CommonTokenStreamSourceNew(1025, lexer_->pLexer->rec->state->tokSource))),
          parser_(check(G::newParser(tokens_))) {}
    Pipeline(const Pipeline&) = delete;
    Pipeline& operator=(const Pipeline&) = delete;
    ~Pipeline() {
        parser_->free(parser_);
        tokens_->free(tokens_);
        lexer_->free(lexer_);
        input_->close(input_);
    }

    typename G::Parser parser() { return parser_; }

    void rewind() { tokens_->tstream->istream->seek(tokens_->tstream->istream, 0); }

    std::vector<TokenText> tokens() {
        tokens_->tstream->_LT(tokens_->tstream, 1);  // the stream is filled when somebody looks at it
        std::vector<TokenText> out;
        const ANTLR3_UINT32 count = tokens_->tokens->count;
        for (ANTLR3_UINT32 i = 0; i < count; ++i) {
            ANTLR3_COMMON_TOKEN& token = tokenAt(i);
            if (!isSeen(token)) continue;
            out.push_back({static_cast<int>(token.getType(&token)), tokenText(token), offset(token.start),
                           offset(token.stop) + 1});
        }
        return out;
    }

    /// Tokens in front of the place where the parser stands, hidden ones not counted.
    std::size_t position() {
        const auto index = tokens_->tstream->istream->index(tokens_->tstream->istream);
        std::size_t count = 0;
        for (ANTLR3_UINT32 i = 0; i < index && i < tokens_->tokens->count; ++i) count += isSeen(tokenAt(i));
        return count;
    }

 private:
    template <typename T>
    static T* check(T* made) {
        if (made == nullptr) throw std::bad_alloc();
        return made;
    }

    ANTLR3_COMMON_TOKEN& tokenAt(ANTLR3_UINT32 index) {
        return *static_cast<pANTLR3_COMMON_TOKEN>(tokens_->tokens->get(tokens_->tokens, index));
    }

    /// Whether a token is of the text and not hidden from the parser.
    static bool isSeen(ANTLR3_COMMON_TOKEN& token) {
        return token.getType(&token) != ANTLR3_TOKEN_EOF && token.channel == ANTLR3_TOKEN_DEFAULT_CHANNEL;
    }

    /// The runtime's places in an in-place stream are addresses.
    std::size_t offset(ANTLR3_MARKER place) const {
        return static_cast<std::size_t>(reinterpret_cast<const char16_t*>(place) - text_.data());
    }

    std::u16string_view text_;
    pANTLR3_INPUT_STREAM input_;
    typename G::Lexer lexer_;
    pANTLR3_COMMON_TOKEN_STREAM tokens_;
    typename G::Parser parser_;
};

void copyTree(pANTLR3_BASE_TREE root, Reading& reading) {
    reading.rootIsList = root->isNilNode(root) != 0;
    struct Pending {
        pANTLR3_BASE_TREE node;
        std::size_t depth;
    };
    std::set<pANTLR3_BASE_TREE> seen;
    std::vector<Pending> pending{{root, 0}};
    while (!pending.empty()) {
        const auto [node, depth] = pending.back();
        pending.pop_back();
        if (!seen.insert(node).second) {
            reading.wellFormed = false;
            return;
        }
        const bool nil = node->isNilNode(node) != 0;
        const int type = nil ? 0 : static_cast<int>(node->getType(node));
        const std::string text = quoteJson(textOf(node));
        reading.tree.add(type, text, depth);
        if (!reading.rootIsList)
            reading.statement.add(type, text, depth);
        else if (depth > 0 && (depth > 1 || reading.statement.empty()))
            reading.statement.add(type, text, depth - 1);
        if (type == 0 && !nil) reading.hasErrorNode = true;
        for (ANTLR3_UINT32 i = node->getChildCount(node); i-- > 0;)
            pending.push_back({static_cast<pANTLR3_BASE_TREE>(node->getChild(node, i)), depth + 1});
    }
}

template <typename G>
std::vector<TokenText> lex(std::u16string_view text) {
    return Pipeline<G>(text).tokens();
}

template <typename G>
Reading read(std::u16string_view text) {
    Reading reading;
    {
        Pipeline<G> pipeline(text);
        copyTree(pipeline.parser()->start_rule(pipeline.parser()).tree, reading);
        reading.tokens = pipeline.tokens();
    }
    // The start rule takes the tail as well; how far the statement went is told by its own rule.
    Pipeline<G> pipeline(text);
    G::readStatement(pipeline.parser());
    reading.taken = pipeline.position();
    return reading;
}

template <typename G>
Reading readAgain(std::u16string_view text) {
    Reading reading;
    Pipeline<G> pipeline(text);
    pipeline.parser()->start_rule(pipeline.parser());
    pipeline.rewind();
    copyTree(pipeline.parser()->start_rule(pipeline.parser()).tree, reading);
    reading.tokens = pipeline.tokens();
    pipeline.rewind();
    G::readStatement(pipeline.parser());
    reading.taken = pipeline.position();
    return reading;
}

template <typename G>
const engine::GrammarTable& tables() {
    return tablesOf(Pipeline<G>(u"").parser());
}

template <typename G>
SyntaxDump readBounded(std::u16string_view text, std::uint32_t quickSteps, std::uint32_t rememberingSteps) {
    Reading reading;
    Pipeline<G> pipeline(text);
    engine::Options& options = optionsOf(pipeline.parser());
    options.quickSteps = quickSteps;
    options.rememberingSteps = rememberingSteps;
    copyTree(pipeline.parser()->start_rule(pipeline.parser()).tree, reading);
    return reading.statement;
}

template <typename G>
constexpr Grammar grammar(std::string_view corpus, const char* (*tokenName)(int)) {
    return {corpus, tokenName, &lex<G>, &read<G>, &readAgain<G>, &tables<G>, &readBounded<G>};
}

#define ZR_GRAMMAR(NAME, CORPUS, STATEMENT_RULE)                                          \
    grammar<Recognisers<NAME##LexerNew, NAME##ParserNew,                                  \
                        &std::remove_pointer_t<p##NAME##Parser>::STATEMENT_RULE>>(CORPUS, \
                                                                                  &NAME##_token_name)

}  // namespace

const Grammar kGrammars[] = {
    ZR_GRAMMAR(MSAccessSQL_v3, "msaccess", all_sql_query),
    ZR_GRAMMAR(MSSQL, "mssql", all_sql_query),
    ZR_GRAMMAR(MSSQLfrom, "mssqlfrom", node_from_list),
    ZR_GRAMMAR(MySQLSelect, "mysql", all_sql_query),
    ZR_GRAMMAR(Oracle, "oracle", all_sql_query),
    ZR_GRAMMAR(PostgreSQL, "postgresql", all_sql_query),
};
const std::size_t kGrammarCount = std::size(kGrammars);

}  // namespace zr::test
