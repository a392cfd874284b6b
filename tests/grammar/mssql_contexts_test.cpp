// What a host finds that works with the SQL Server contexts by itself: the token numbers, every entry of
// lexer and parser, the runtime's error counts.

#include <gtest/gtest.h>
#include <zrparsersql/input_stream.h>
#include <zrparsersql/recognizers/MSSQL.h>
#include <zrparsersql/recognizers/MSSQL_tokens.h>

#include <cstddef>
#include <cstring>
#include <set>
#include <string>
#include <string_view>

#include "tests/grammar/contexts.h"

namespace {

// Numbers that stored projects and tree walkers know, one of each part of the vocabulary; the corpus pins the
// rest of those that a token or a tree can have.
static_assert(MSSQL_PROCEDURE == 4 && MSSQL_SELECT_QUERY_ == 7 && MSSQL_SELECT_QUERY_IN == 8);
static_assert(MSSQL_PREDICATE == 9 && MSSQL_SELECT_LIST == 10 && MSSQL_FUNCTION_SPECIFICATION == 13);
static_assert(MSSQL_NUMBER_literal == 31 && MSSQL_NUMBER_LITERAL == 42);
static_assert(MSSQL_UNION == 36 && MSSQL_UNION_ == 55 && MSSQL_NESTED_JOIN_SERCH == 60);
static_assert(MSSQL_COMMA_KEYWORD == 61 && MSSQL_S == 62 && MSSQL_Z == 267);
static_assert(MSSQL_WS == 247 && MSSQL_IDENTIFICATOR == 249 && MSSQL_DIGIT == 266);

TEST(MssqlVocabulary, HasOneNameForEachNumberFrom4To343) {
    std::set<std::string> names;
    for (int number = 4; number <= 343; ++number) names.insert(MSSQL_token_name(number));
    EXPECT_EQ(names.size(), 340U);
    EXPECT_EQ(names.count("<invalid>"), 0U);
    EXPECT_STREQ(MSSQL_token_name(344), "<invalid>");
}

TEST(MssqlVocabulary, NamesLiteralsAsTheyAreWritten) {
    EXPECT_STREQ(MSSQL_token_name(268), "'UCASE'");
    EXPECT_STREQ(MSSQL_token_name(287), "'SET TEXTSIZE'");
    EXPECT_STREQ(MSSQL_token_name(322), "'\\''");
    EXPECT_STREQ(MSSQL_token_name(343), "'@'");
}

using Contexts = zr::test::ContextsOf<MSSQLLexerNewSSD, MSSQLParserNewSSD>;

TEST(MssqlContexts, ARuleInTheMiddleCanBeRunByItself) {
    Contexts c(u"a + b * 2 , c");
    const ZRRuleReturn sum = c.parser->expression(c.parser);
    ASSERT_NE(sum.tree, nullptr);
    EXPECT_EQ(sum.tree->getType(sum.tree), static_cast<ANTLR3_UINT32>(MSSQL_PLUS));
    EXPECT_EQ(sum.tree->getChildCount(sum.tree), 2U);
    EXPECT_EQ(c.position(), 5) << "the stream stands at the comma";
    EXPECT_EQ(c.parserErrors(), 0U);
}

TEST(MssqlContexts, RulesRunOneBehindTheOther) {
    Contexts c(u"dbo.t x WHERE a = 1");
    const ZRRuleReturn table = c.parser->node_t_n(c.parser);
    EXPECT_EQ(table.tree->getType(table.tree), static_cast<ANTLR3_UINT32>(MSSQL_ALIAS));
    const ZRRuleReturn where = c.parser->node_where_condition(c.parser);
    EXPECT_EQ(where.tree->getType(where.tree), static_cast<ANTLR3_UINT32>(MSSQL_WHERE_CONDITION));
    EXPECT_EQ(c.position(), 8);
}

TEST(MssqlContexts, ARuleThatDoesNotFitReportsOneErrorAndTakesNothing) {
    Contexts c(u"FROM t");
    const ZRRuleReturn wrong = c.parser->expression(c.parser);
    ASSERT_NE(wrong.tree, nullptr);
    EXPECT_EQ(wrong.tree->getType(wrong.tree), 0U);
    EXPECT_EQ(c.parserErrors(), 1U);
    EXPECT_EQ(c.position(), 0);
    const ZRRuleReturn from = c.parser->from_clause(c.parser);
    EXPECT_EQ(from.tree->getType(from.tree), static_cast<ANTLR3_UINT32>(MSSQL_FROM_DEF_));
}

TEST(MssqlContexts, EveryParserEntryCanBeCalledOnAnyText) {
    using Entry = ZRRuleReturn (*)(pMSSQLParser);
    constexpr std::size_t kFirst = offsetof(MSSQLParser, start_rule);
    constexpr std::size_t kEnd = offsetof(MSSQLParser, getGrammarFileName);
    constexpr std::size_t kCount = (kEnd - kFirst) / sizeof(Entry);
    EXPECT_EQ(kCount, 162U);
    for (const std::u16string_view text : {u"SELECT a FROM t WHERE x = 1", u"a", u"(1, 2)", u") x", u""}) {
        for (std::size_t i = 0; i < kCount; ++i) {
            Contexts c(text);
            Entry entry = nullptr;
            std::memcpy(&entry, reinterpret_cast<const char*>(c.parser) + kFirst + i * sizeof(Entry),
                        sizeof entry);
            ASSERT_NE(entry, nullptr) << i;
            EXPECT_NE(entry(c.parser).tree, nullptr) << i;
        }
    }
}

TEST(MssqlContexts, EveryLexerEntryCanBeCalledOnAnyText) {
    using Entry = void (*)(pMSSQLLexer);
    constexpr std::size_t kFirst = offsetof(MSSQLLexer, pLexer) + sizeof(pANTLR3_LEXER);
    constexpr std::size_t kEnd = offsetof(MSSQLLexer, getGrammarFileName);
    for (const std::u16string_view text : {u"SELECT", u"@@VERSION", u" ", u""}) {
        for (std::size_t at = kFirst; at < kEnd; at += sizeof(Entry)) {
            Contexts c(text);
            Entry entry = nullptr;
            std::memcpy(&entry, reinterpret_cast<const char*>(c.lexer) + at, sizeof entry);
            ASSERT_NE(entry, nullptr) << at;
            entry(c.lexer);
        }
    }
}

TEST(MssqlContexts, ALexerEntryTakesItsOwnTokenOnly) {
    Contexts c(u"select");
    pANTLR3_RECOGNIZER_SHARED_STATE state = c.lexer->pLexer->rec->state;
    c.lexer->mDIGIT(c.lexer);
    EXPECT_EQ(state->error, static_cast<ANTLR3_BOOLEAN>(ANTLR3_TRUE))
        << "left to the caller, as the runtime does it";
    EXPECT_EQ(c.input->istream->index(c.input->istream), reinterpret_cast<ANTLR3_MARKER>(c.input->data));
    state->error = ANTLR3_FALSE;
    c.lexer->mSELECT_KEYWORD(c.lexer);
    EXPECT_EQ(state->error, static_cast<ANTLR3_BOOLEAN>(ANTLR3_FALSE));
    EXPECT_EQ(c.input->istream->_LA(c.input->istream, 1), static_cast<ANTLR3_UINT32>(ANTLR3_CHARSTREAM_EOF));
}

TEST(MssqlContexts, BlanksCountAsLexerErrorsAndFailNothing) {
    Contexts c(u"SELECT a FROM t;");
    const ZRRuleReturn query = c.parser->start_rule(c.parser);
    EXPECT_EQ(query.tree->getType(query.tree), static_cast<ANTLR3_UINT32>(MSSQL_SELECT_QUERY_));
    EXPECT_EQ(c.lexerErrors(), 4U) << "three blanks and the semicolon";
    EXPECT_EQ(c.parserErrors(), 0U);
}

TEST(MssqlContexts, ATextWithoutAStatementCountsAParserError) {
    Contexts c(u"hello");
    const ZRRuleReturn query = c.parser->start_rule(c.parser);
    EXPECT_EQ(query.tree->getType(query.tree), 0U);
    EXPECT_EQ(query.tree->getChildCount(query.tree), 0U);
    EXPECT_EQ(c.parserErrors(), 1U);
}

TEST(MssqlContexts, ASelectListThatDoesNotParseCountsAParserError) {
    Contexts c(u"SELECT FROM t");
    const ZRRuleReturn query = c.parser->start_rule(c.parser);
    EXPECT_EQ(query.tree->getType(query.tree), static_cast<ANTLR3_UINT32>(MSSQL_SELECT_QUERY_));
    EXPECT_EQ(c.parserErrors(), 1U);
}

TEST(MssqlContexts, ATailBehindTheStatementIsNoError) {
    Contexts c(u"SELECT a FROM t ) ) ( 'x");
    c.parser->start_rule(c.parser);
    EXPECT_EQ(c.parserErrors(), 0U);
}

TEST(MssqlContexts, ContextsOfOneTextDoNotShareAnything) {
    const std::u16string_view text = u"SELECT a FROM t";
    Contexts first(text);
    const ZRRuleReturn one = first.parser->start_rule(first.parser);
    {
        Contexts second(text);
        EXPECT_NE(second.parser->start_rule(second.parser).tree, one.tree);
    }
    EXPECT_EQ(one.tree->getChildCount(one.tree), 2U);
}

}  // namespace
