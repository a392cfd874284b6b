// Texts at and beyond what the recogniser takes: nesting, length, budget, texts that are no SQL.

#include <gtest/gtest.h>
#include <sys/resource.h>
#include <zrparsersql/diagnostics.h>

#include <random>
#include <string>
#include <vector>

#include "grammar/engine/contexts.h"
#include "grammar/engine/lexed_text.h"
#include "grammar/engine/recogniser.h"
#include "grammar/engine/syntax_tree.h"
#include "tests/engine/contexts.h"
#include "tests/grammar/tables_of.h"
#include "tests/parser/small_stack.h"

namespace zr::test {
namespace {

std::u16string repeated(std::u16string_view text, std::size_t times) {
    std::u16string out;
    out.reserve(text.size() * times);
    for (std::size_t i = 0; i < times; ++i) out += text;
    return out;
}

std::u16string nested(std::u16string_view open, std::u16string_view inner, std::u16string_view close,
                      std::size_t depth) {
    return repeated(open, depth) + std::u16string(inner) + repeated(close, depth);
}

std::vector<std::uint16_t> typesOf(std::u16string_view text) {
    Contexts c(text);
    std::vector<std::uint16_t> types;
    for (std::size_t i = 0, count = c.tokenCount(); i < count; ++i) {
        const auto* token = static_cast<pANTLR3_COMMON_TOKEN>(c.tokens->tokens->elements[i].element);
        if (token->type != ANTLR3_TOKEN_EOF) types.push_back(static_cast<std::uint16_t>(token->type));
    }
    return types;
}

const engine::GrammarTable& mssqlTables() {
    return tablesOf(Contexts(u"").parser);
}

engine::Recogniser::Result recognise(const std::vector<std::uint16_t>& types,
                                     const engine::Options& options) {
    const engine::ParserTable& table = *mssqlTables().parser;
    return engine::Recogniser(table, types, options).run(table.statementRule, 0);
}

/// Lexes, reads and frees `text` on a small stack, and wants it read to its end.
void expectReadToTheEnd(const std::u16string& text) {
    onSmallStack([&text] {
        Contexts c(text);
        const pANTLR3_BASE_TREE tree = c.parser->all_sql_query(c.parser).tree;
        ASSERT_NE(tree, nullptr);
        EXPECT_EQ(tree->getType(tree), static_cast<ANTLR3_UINT32>(MSSQL_SELECT_QUERY_));
        EXPECT_EQ(c.position(), c.tokenCount());
        EXPECT_EQ(c.parserErrors(), 0U);
    });
}

// ---- nesting

TEST(NestingLimit, IsExact) {
    const std::vector<std::uint16_t> types = typesOf(u"SELECT ((((a)))) FROM t");
    engine::Options options;
    for (options.maxDepth = 1; options.maxDepth < 1000; ++options.maxDepth)
        if (!recognise(types, options).overLimit) break;
    ASSERT_GT(options.maxDepth, 4U);
    ASSERT_LT(options.maxDepth, 1000U);
    const engine::Recogniser::Result at = recognise(types, options);
    EXPECT_TRUE(at.found);
    EXPECT_EQ(at.high, types.size());
    --options.maxDepth;
    const engine::Recogniser::Result above = recognise(types, options);
    EXPECT_TRUE(above.overLimit);
    EXPECT_FALSE(above.found);
}

TEST(NestingLimit, GrowsWithTheNestingOnly) {
    const auto depthOf = [](std::u16string_view text) {
        const std::vector<std::uint16_t> types = typesOf(text);
        engine::Options options;
        options.maxDepth = 1;
        while (recognise(types, options).overLimit) ++options.maxDepth;
        return options.maxDepth;
    };
    // Readings that are tried and fail count as well, and a short text tells sooner that they do.
    const std::uint32_t flat = depthOf(u"SELECT (a), (b), (c), (d) FROM t WHERE (a) = (b) AND (c) = (d)");
    EXPECT_EQ(depthOf(u"SELECT (a), (b), (c), (d), (e), (f), (g), (h), (i), (j), (k), (l) FROM t "
                      u"WHERE (a) = (b) AND (c) = (d) AND (e) = (f) AND (g) = (h) AND (i) = (j)"),
              flat);
    const std::uint32_t two = depthOf(u"SELECT ((a)) FROM t"), three = depthOf(u"SELECT (((a))) FROM t");
    EXPECT_GT(three, two);
    EXPECT_EQ(depthOf(u"SELECT ((((a)))) FROM t") - three, three - two);
}

TEST(NestingLimit, AboveItOneErrorNodeIsTheTreeAndNothingIsTaken) {
    const std::u16string text = u"SELECT " + nested(u"(", u"a", u")", 100000) + u" FROM t";
    onSmallStack([&text] {
        Contexts c(text);
        const pANTLR3_BASE_TREE tree = c.start();
        ASSERT_NE(tree, nullptr);
        EXPECT_EQ(tree->getType(tree), 0U);
        EXPECT_EQ(tree->getChildCount(tree), 0U);
        EXPECT_EQ(c.parserErrors(), 1U);
        EXPECT_EQ(c.position(), 0U);
    });
#ifndef __SANITIZE_ADDRESS__
    rusage usage{};
    ASSERT_EQ(getrusage(RUSAGE_SELF, &usage), 0);
    EXPECT_LT(usage.ru_maxrss, 1024 * 1024) << "kilobytes";
#endif
}

TEST(DeepNesting, OfParenthesesIsRead) {
    expectReadToTheEnd(u"SELECT " + nested(u"(", u"a", u")", 1000) + u" FROM t");
}

TEST(DeepNesting, OfCallsIsRead) {
    expectReadToTheEnd(u"SELECT " + nested(u"ABS(", u"a", u")", 1000) + u" FROM t");
}

TEST(DeepNesting, OfSubQueriesIsRead) {
    expectReadToTheEnd(nested(u"SELECT a FROM t WHERE a = (", u"SELECT a FROM t", u")", 1000));
}

TEST(LongChains, OfConditionsAreRead) {
    expectReadToTheEnd(u"SELECT a FROM t WHERE a = 1" + repeated(u" AND b = 2", 10000));
}

TEST(LongChains, OfUnionsAreRead) {
    expectReadToTheEnd(u"SELECT a FROM t" + repeated(u" UNION SELECT b FROM u", 2000));
}

TEST(LongChains, OfJoinsAreRead) {
    expectReadToTheEnd(u"SELECT a FROM t" + repeated(u" INNER JOIN u ON t.a = u.a", 500));
}

// ---- length

/// One reading through the contexts, with the bounds changed for both of them. Blanks are errors of the
/// lexer.
struct Outcome {
    bool isRead;
    std::size_t tokens;
    ANTLR3_UINT32 lexerErrors, parserErrors;
    bool operator==(const Outcome&) const = default;
};

Outcome readWithin(const std::u16string& text, const engine::Options& options) {
    Contexts c(text);
    lexerOptionsOf(c.lexer) = optionsOf(c.parser) = options;
    const pANTLR3_BASE_TREE tree = c.start();
    const bool isRead = tree->getType(tree) == static_cast<ANTLR3_UINT32>(MSSQL_SELECT_QUERY_);
    EXPECT_TRUE(isRead || (tree->getType(tree) == 0 && tree->getChildCount(tree) == 0));
    return {isRead, c.tokenCount(), c.lexerErrors(), c.parserErrors()};
}

/// The same without the runtime: whether the text is read.
bool isReadWithin(const std::u16string& text, const engine::Options& options) {
    const engine::SyntaxTree tree(mssqlTables(), text, options);
    if (tree.type(tree.root()) == static_cast<std::uint32_t>(MSSQL_SELECT_QUERY_)) return true;
    EXPECT_EQ(tree.nodeCount(), 1U) << "one error node";
    return false;
}

TEST(LengthLimit, OfUnitsIsExact) {
    const std::u16string text = u"SELECT abc FROM t WHERE x = 1";
    engine::Options options;
    options.maxUnits = static_cast<std::uint32_t>(text.size());
    EXPECT_TRUE(isReadWithin(text, options));
    EXPECT_EQ(readWithin(text, options), (Outcome{true, 8, 7, 0}));
    --options.maxUnits;
    EXPECT_FALSE(isReadWithin(text, options));
    EXPECT_EQ(readWithin(text, options), (Outcome{false, 0, 1, 1})) << "no token is taken";
}

TEST(LengthLimit, OfTokensIsExact) {
    const std::u16string text = u"SELECT abc FROM t WHERE x = 1";
    engine::Options options;
    options.maxTokens = 8;
    EXPECT_TRUE(isReadWithin(text, options));
    EXPECT_EQ(readWithin(text, options), (Outcome{true, 8, 7, 0}));
    --options.maxTokens;
    EXPECT_FALSE(isReadWithin(text, options));
    EXPECT_EQ(readWithin(text, options), (Outcome{false, 8, 7, 1}));
}

TEST(LengthLimit, OfTokensKeepsThoseBeyondItFromBeingMade) {
    const std::u16string text = u"SELECT abc FROM t" + repeated(u" WHERE x", 1000);
    engine::Options options;
    options.maxTokens = 10;
    EXPECT_FALSE(isReadWithin(text, options));
    EXPECT_EQ(readWithin(text, options), (Outcome{false, 11, 10 + 1, 1}));
    EXPECT_EQ(engine::LexedText(*mssqlTables().lexer, text, options).count(), 11U);
}

TEST(LengthLimit, CountsEachTextOfALexerByItself) {
    engine::Options options;
    options.maxTokens = 4;
    Contexts c(u"SELECT a FROM t");
    lexerOptionsOf(c.lexer) = optionsOf(c.parser) = options;
    const pANTLR3_BASE_TREE tree = c.start();
    EXPECT_NE(tree->getType(tree), 0U);
    c.input->reset(c.input);
    c.tokens->reset(c.tokens);
    EXPECT_EQ(c.tokenCount(), 4U);
    EXPECT_EQ(c.lexerErrors(), 3U + 3U) << "the blanks of both, and nothing else";
}

TEST(LengthLimit, IsReported) {
    const auto note = [](void* user, const char16_t* text, std::uint32_t length) {
        *static_cast<bool*>(user) |= std::u16string_view(text, length) == u"the text is too long to be read";
    };
    engine::Options units, tokens;
    units.maxUnits = 5;
    tokens.maxTokens = 3;
    for (const engine::Options& options : {units, tokens}) {
        bool viaContexts = false, directly = false;
        zrSetDiagnosticFunction(note, &viaContexts);
        readWithin(u"SELECT a FROM t", options);
        zrSetDiagnosticFunction(note, &directly);
        isReadWithin(u"SELECT a FROM t", options);
        zrSetDiagnosticFunction(nullptr, nullptr);
        EXPECT_TRUE(viaContexts);
        EXPECT_TRUE(directly);
    }
}

// ---- memory

/// Both searches need some: the first for a plain text, and all of them for one with many readings.
TEST(MemoLimit, IsExact) {
    for (const std::u16string& text :
         {u"SELECT a FROM t WHERE x = 1" + repeated(u" AND (b = 2)", 20),
          u"SELECT a FROM t WHERE " + nested(u"dbo.f(", u"a", u")", 40) + u" = 1"}) {
        const std::vector<std::uint16_t> types = typesOf(text);
        engine::Options options;
        std::size_t over = 0, enough = 1U << 24;  // one is too little, the other is not
        while (enough - over > 1) {
            options.maxMemo = over + (enough - over) / 2;
            (recognise(types, options).overBudget ? over : enough) = options.maxMemo;
        }
        options.maxMemo = enough;
        const engine::Recogniser::Result at = recognise(types, options);
        EXPECT_TRUE(at.found);
        EXPECT_EQ(at.high, types.size());
        options.maxMemo = over;
        const engine::Recogniser::Result above = recognise(types, options);
        EXPECT_TRUE(above.overBudget);
        EXPECT_LE(above.high, types.size());
    }
}

TEST(MemoLimit, OfNothingStillEnds) {
    engine::Options options;
    options.maxMemo = 0;
    const engine::Recogniser::Result result = recognise(typesOf(u"SELECT a FROM t WHERE x = 1"), options);
    EXPECT_TRUE(result.overBudget);
    EXPECT_TRUE(readWithin(u"SELECT a FROM t", options).tokens > 0);
}

TEST(MemoLimit, OfTheDefaultIsFarFromWhatATextNeeds) {
    const std::u16string text = u"SELECT a FROM t WHERE a = 1" + repeated(u" AND b = 2", 10000);
    const std::vector<std::uint16_t> types = typesOf(text);
    const engine::ParserTable& table = *mssqlTables().parser;
    const engine::Options options;
    engine::Recogniser recogniser(table, types, options);
    EXPECT_TRUE(recogniser.run(table.statementRule, 0).found);
    EXPECT_GT(recogniser.remembered(), types.size());
    EXPECT_LT(recogniser.remembered(), types.size() * 100);
}

// ---- steps

/// Search steps for each token of a text.
double stepsPerToken(const std::u16string& text, bool wholly) {
    const std::vector<std::uint16_t> types = typesOf(text);
    const engine::ParserTable& table = *mssqlTables().parser;
    const engine::Options options;
    engine::Recogniser recogniser(table, types, options);
    const engine::Recogniser::Result result = recogniser.run(table.statementRule, 0);
    EXPECT_TRUE(result.found);
    EXPECT_FALSE(result.overBudget);
    EXPECT_EQ(result.high == types.size(), wholly);
    return static_cast<double>(recogniser.steps()) / static_cast<double>(types.size());
}

TEST(Steps, OfPlainTextAreFew) {
    EXPECT_LT(stepsPerToken(u"SELECT a, t.b FROM t WHERE x = 1 AND y > 2 ORDER BY a", true), 6);
    EXPECT_LT(stepsPerToken(u"SELECT a FROM t WHERE x = 1" + repeated(u" AND t.b = 2", 10000), true), 6);
    EXPECT_LT(stepsPerToken(u"SELECT a FROM t INNER JOIN u ON t.a = u.a UNION SELECT b FROM v", true), 6);
}

/// They would grow with the depth, or with its square, if each level looked for its ends by itself.
TEST(Steps, OfTextsWithManyReadingsHardlyGrowWithTheDepth) {
    const auto text = [](std::size_t depth, std::u16string_view tail, int shape) {
        switch (shape) {
            case 0:
                return u"SELECT " + nested(u"dbo.f(", u"a", u")", depth) + u", b y FROM t" +
                       std::u16string(tail);
            case 1:
                return u"SELECT a FROM t JOIN " +
                       nested(u"(SELECT a FROM t JOIN ", u"(SELECT a FROM t) x ON a = b", u") x ON a = b",
                              depth) +
                       std::u16string(tail);
            default:
                return u"SELECT a FROM " + nested(u"(SELECT a FROM ", u"t", u") x", depth) +
                       std::u16string(tail);
        }
    };
    for (const int shape : {0, 1, 2})
        for (const std::u16string_view tail : {u"", u" OVER ( PARTITION BY x ) , y FROM z"}) {
            SCOPED_TRACE(shape);
            const double few = stepsPerToken(text(30, tail, shape), tail.empty());
            const double many = stepsPerToken(text(240, tail, shape), tail.empty());
            EXPECT_LT(few, 200);
            EXPECT_LT(many, 200);
            EXPECT_LT(many, 2 * few + 10);
        }
}

// ---- budget

/// A budget of so many steps for the full search, whatever the text's length.
engine::Options stepsAtMost(std::uint64_t steps) {
    engine::Options options;
    options.quickSteps = 0;
    options.baseSteps = steps;
    options.stepsPerToken = 0;
    return options;
}

TEST(Budget, OfTheQuickSearchIsMadeGoodByTheFullOne) {
    const std::vector<std::uint16_t> types =
        typesOf(u"SELECT a FROM t WHERE " + nested(u"dbo.f(", u"a", u")", 40) + u" = 1");
    engine::Options options;
    for (options.quickSteps = 0; options.quickSteps < 5000; options.quickSteps = options.quickSteps * 2 + 1)
        for (options.rememberingSteps = 0; options.rememberingSteps < 500;
             options.rememberingSteps = options.rememberingSteps * 2 + 1) {
            SCOPED_TRACE(std::to_string(options.quickSteps) + " " + std::to_string(options.rememberingSteps));
            const engine::Recogniser::Result result = recognise(types, options);
            EXPECT_TRUE(result.found);
            EXPECT_FALSE(result.overBudget);
            EXPECT_EQ(result.high, types.size());
        }
}

TEST(Budget, IsExact) {
    const std::vector<std::uint16_t> types =
        typesOf(u"SELECT a FROM t WHERE " + nested(u"dbo.f(", u"a", u")", 40) + u" = 1");
    std::uint64_t over = 0, enough = 1U << 24;
    while (enough - over > 1) {
        const std::uint64_t steps = over + (enough - over) / 2;
        (recognise(types, stepsAtMost(steps)).overBudget ? over : enough) = steps;
    }
    EXPECT_EQ(recognise(types, stepsAtMost(enough)).high, types.size());
    EXPECT_TRUE(recognise(types, stepsAtMost(over)).overBudget);
}

TEST(Budget, OverItTheFurthestReadingOfAFirstPartStands) {
    const std::vector<std::uint16_t> types =
        typesOf(u"SELECT a FROM t WHERE " + nested(u"dbo.f(", u"a", u")", 40) + u" = 1");
    bool someOfIt = false;
    for (std::uint64_t steps = 1; steps < 5000; steps *= 2) {
        const engine::Recogniser::Result cut = recognise(types, stepsAtMost(steps));
        if (!cut.overBudget) break;
        EXPECT_LT(cut.high, types.size()) << steps;
        someOfIt = someOfIt || (cut.found && cut.high > 0);
    }
    EXPECT_TRUE(someOfIt);
}

TEST(Budget, OverItThereIsATreeAndANotice) {
    const auto count = [](void* user, const char16_t* text, std::uint32_t length) {
        if (std::u16string_view(text, length).find(u"cut short") != std::u16string_view::npos)
            ++*static_cast<int*>(user);
    };
    const std::u16string text =
        u"SELECT a FROM t WHERE " + nested(u"ABS(", u"a", u")", 200) + u" = 1 ) ) x y z";
    int trees = 0;
    for (std::uint64_t steps = 1; steps < 20000; steps += 1 + steps / 16) {
        SCOPED_TRACE(steps);
        int notices = 0;
        zrSetDiagnosticFunction(count, &notices);
        Contexts c(text);
        engine::ParserState state{&mssqlTables(), c.parser->pParser, c.parser->adaptor, stepsAtMost(steps)};
        const pANTLR3_BASE_TREE tree = engine::runRule(state, mssqlTables().parser->startRule).tree;
        zrSetDiagnosticFunction(nullptr, nullptr);
        ASSERT_NE(tree, nullptr);
        EXPECT_EQ(c.parserErrors() == 1, tree->getType(tree) == 0);
        EXPECT_LE(notices, 1);
        if (notices == 1 && tree->getType(tree) == static_cast<ANTLR3_UINT32>(MSSQL_SELECT_QUERY_)) ++trees;
    }
    EXPECT_GT(trees, 0) << "no budget cut the search behind a reading";
}

// ---- texts that are no query

void expectOneErrorNode(std::u16string_view text, std::uint32_t droppedUnits) {
    Contexts c(text);
    const pANTLR3_BASE_TREE tree = c.start();
    ASSERT_NE(tree, nullptr);
    EXPECT_EQ(tree->getType(tree), 0U);
    EXPECT_EQ(tree->getChildCount(tree), 0U);
    EXPECT_EQ(c.parserErrors(), 1U);
    EXPECT_EQ(c.lexerErrors(), droppedUnits);
}

TEST(OddTexts, NoneAtAll) {
    expectOneErrorNode(u"", 0);
}

TEST(OddTexts, OneWord) {
    expectOneErrorNode(u"hello", 0);
}

TEST(OddTexts, AMegabyteOfBlanks) {
    expectOneErrorNode(repeated(u" ", 512 * 1024), 512 * 1024);
}

TEST(OddTexts, UnpairedSurrogates) {
    const char16_t high = 0xD83D, low = 0xDE00;
    expectOneErrorNode(std::u16string{high}, 1);
    expectOneErrorNode(std::u16string{low, high, low, low}, 4);
    const std::u16string text =
        u"SELECT" + std::u16string{high} + u"a" + std::u16string{low, low} + u"FROM t";
    Contexts c(text);
    const pANTLR3_BASE_TREE tree = c.start();
    EXPECT_EQ(tree->getType(tree), static_cast<ANTLR3_UINT32>(MSSQL_SELECT_QUERY_));
    EXPECT_EQ(tree->getChildCount(tree), 2U);
    EXPECT_EQ(c.lexerErrors(), 4U);
}

TEST(OddTexts, ALoneSelect) {
    Contexts c(u"SELECT");
    const pANTLR3_BASE_TREE tree = c.start();
    EXPECT_EQ(tree->getType(tree), static_cast<ANTLR3_UINT32>(MSSQL_SELECT_QUERY_));
    EXPECT_EQ(c.parserErrors(), 1U);
}

TEST(OddTexts, Noise) {
    std::mt19937 random(1);
    for (int round = 0; round < 50; ++round) {
        // Bytes as units, units of all kinds, and both behind the start of a query.
        std::u16string text = round % 4 < 2 ? u"" : u"SELECT a FROM t WHERE ";
        for (int i = 0; i < 2000; ++i)
            text += static_cast<char16_t>(round % 2 == 0 ? random() % 0x100 : random() % 0x10000);
        Contexts c(text);
        const pANTLR3_BASE_TREE tree = c.start();
        ASSERT_NE(tree, nullptr) << round;
        EXPECT_EQ(c.parserErrors() > 0, tree->getType(tree) == 0) << round;
        EXPECT_GT(c.lexerErrors(), 0U) << round;
    }
}

// ---- calls one behind the other

TEST(SecondCall, BehindWhatAFirstOneTookGoesOnThere) {
    Contexts c(u"a,b");
    EXPECT_EQ(c.parser->expression(c.parser).tree->getChildCount(c.parser->expression(c.parser).tree), 0U);
    EXPECT_EQ(c.position(), 1U) << "the second call stands at the comma and takes nothing";
    EXPECT_EQ(c.parserErrors(), 1U);
    c.moveTo(2);
    const ZRRuleReturn b = c.parser->expression(c.parser);
    EXPECT_EQ(c.position(), 3U);
    EXPECT_EQ(b.start, b.stop);
    EXPECT_EQ(c.parserErrors(), 1U);
}

TEST(SecondCall, FromTheSamePositionGivesTheSame) {
    Contexts c(u"SELECT a FROM t WHERE x = 1 ) tail");
    const ZRRuleReturn first = c.parser->all_sql_query(c.parser);
    const std::size_t taken = c.position();
    c.moveTo(0);
    const ZRRuleReturn second = c.parser->all_sql_query(c.parser);
    EXPECT_EQ(c.position(), taken);
    EXPECT_EQ(second.start, first.start);
    EXPECT_EQ(second.stop, first.stop);
    EXPECT_NE(second.tree, first.tree);
    EXPECT_EQ(second.tree->getChildCount(second.tree), first.tree->getChildCount(first.tree));
}

TEST(SecondCall, AtTheEndOfTheTextIsAnError) {
    Contexts c(u"SELECT a FROM t");
    c.start();
    const pANTLR3_BASE_TREE again = c.start();
    ASSERT_NE(again, nullptr);
    EXPECT_EQ(again->getType(again), 0U);
    EXPECT_EQ(c.parserErrors(), 1U);
}

// ---- single lexer rules

struct LexerCall {
    const char* name;
    void (*MSSQLLexer_Ctx_struct::*entry)(pMSSQLLexer);
    int type;
    std::u16string_view match, rest, mismatch;
};

class LexerEntry : public testing::TestWithParam<LexerCall> {};

const char16_t* placeOf(const Contexts& c) {
    return static_cast<const char16_t*>(c.input->nextChar);
}

TEST_P(LexerEntry, TakesItsTokenAndLeavesTheRest) {
    const LexerCall& call = GetParam();
    const std::u16string text = std::u16string(call.match) + std::u16string(call.rest);
    Contexts c(text);
    (c.lexer->*call.entry)(c.lexer);
    const pANTLR3_RECOGNIZER_SHARED_STATE state = c.lexer->pLexer->rec->state;
    EXPECT_EQ(state->error, static_cast<ANTLR3_BOOLEAN>(ANTLR3_FALSE));
    ASSERT_NE(state->token, nullptr);
    EXPECT_EQ(state->token->type, static_cast<ANTLR3_UINT32>(call.type));
    EXPECT_EQ(placeOf(c) - text.data(), static_cast<std::ptrdiff_t>(call.match.size()));
}

TEST_P(LexerEntry, AMismatchSetsTheErrorStateAndTakesNothing) {
    const LexerCall& call = GetParam();
    for (const std::u16string_view text : {call.mismatch, std::u16string_view(u"")}) {
        Contexts c(text);
        (c.lexer->*call.entry)(c.lexer);
        const pANTLR3_RECOGNIZER_SHARED_STATE state = c.lexer->pLexer->rec->state;
        EXPECT_EQ(state->error, static_cast<ANTLR3_BOOLEAN>(ANTLR3_TRUE));
        EXPECT_NE(state->exception, nullptr);
        EXPECT_EQ(placeOf(c), c.input->data);
    }
}

INSTANTIATE_TEST_SUITE_P(
    Rules, LexerEntry,
    testing::Values(LexerCall{"Keyword", &MSSQLLexer_Ctx_struct::mSELECT_KEYWORD, MSSQL_SELECT_KEYWORD,
                              u"sElEcT", u"ed", u"SELEC"},
                    LexerCall{"Sign", &MSSQLLexer_Ctx_struct::mLEFT_PAREN, MSSQL_LEFT_PAREN, u"(", u"(",
                              u")"},
                    LexerCall{"Number", &MSSQLLexer_Ctx_struct::mDIGIT, MSSQL_DIGIT, u"0123", u"a", u"a1"},
                    LexerCall{"Name", &MSSQLLexer_Ctx_struct::mIDENTIFICATOR, MSSQL_IDENTIFICATOR, u"select1",
                              u" ", u"1a"},
                    LexerCall{"Fragment", &MSSQLLexer_Ctx_struct::mA, MSSQL_A, u"A", u"a", u"b"},
                    LexerCall{"BlankFragment", &MSSQLLexer_Ctx_struct::mWS, MSSQL_WS, u"\r\n", u" ", u"x"},
                    LexerCall{"Literal", &MSSQLLexer_Ctx_struct::mT__268, 268, u"UCASE", u"X", u"ucase"}),
    [](const auto& call) { return std::string(call.param.name); });

}  // namespace
}  // namespace zr::test
