// What a host finds that works with the Oracle contexts by itself. What the contexts of all grammars share is
// tested on those of SQL Server.

#include <gtest/gtest.h>
#include <zrparsersql/input_stream.h>
#include <zrparsersql/recognizers/Oracle.h>
#include <zrparsersql/recognizers/Oracle_tokens.h>

#include <cstddef>
#include <cstring>
#include <set>
#include <string>
#include <string_view>

#include "tests/grammar/contexts.h"

namespace {

// Numbers that stored projects and tree walkers know, some of each kind of entry; the corpus pins the rest of
// those that a token or a tree can have.
static_assert(Oracle_A == 4 && Oracle_ALIAS == 8 && Oracle_Z == 291 && Oracle_UNDERLINE == 264);
static_assert(Oracle_SELECT_QUERY_IN == 231 && Oracle_SELECT_QUERY_OR == 232);
static_assert(Oracle_NOT_CONDITION == 171 && Oracle_WHERE_JOIN == 282);
static_assert(Oracle_PARTITION_BY == 196 && Oracle_OVER == 192);
static_assert(Oracle_NUMBER_LITERAL == 178 && Oracle_NUMBER_literal == 179);
static_assert(Oracle_LITERALAS == 140 && Oracle_LITERAL_AS == 141);
static_assert(Oracle_QUOTE_ATTRITION == 207 && Oracle_COL_PAREN_ATTRITION == 42);
static_assert(Oracle_MY_QUOTE == 162 && Oracle_MY_QUOTE_ATTRITION == 163 && Oracle_WS == 287);

TEST(OracleVocabulary, HasOneNameForEachNumberFrom4To355) {
    std::set<std::string> names;
    for (int number = 4; number <= 355; ++number) names.insert(Oracle_token_name(number));
    EXPECT_EQ(names.size(), 352U);
    EXPECT_EQ(names.count("<invalid>"), 0U);
    EXPECT_STREQ(Oracle_token_name(356), "<invalid>");
}

TEST(OracleVocabulary, NamesLiteralsAsTheyAreWritten) {
    EXPECT_STREQ(Oracle_token_name(292), "'##'");
    EXPECT_STREQ(Oracle_token_name(340), "'SET TEXTSIZE'");
    EXPECT_STREQ(Oracle_token_name(348), "'\\''");
    EXPECT_STREQ(Oracle_token_name(349), "'dbms_random.value'");
    EXPECT_STREQ(Oracle_token_name(355), "'yyyy'");
}

using Contexts = zr::test::ContextsOf<OracleLexerNewSSD, OracleParserNewSSD>;

TEST(OracleContexts, WhiteSpaceIsAHiddenTokenAndNoError) {
    Contexts c(u"SELECT a\r\n\tFROM t;");
    const ZRRuleReturn query = c.parser->start_rule(c.parser);
    EXPECT_EQ(query.tree->getType(query.tree), static_cast<ANTLR3_UINT32>(Oracle_SELECT_QUERY_OR));
    EXPECT_EQ(c.lexerErrors(), 1U) << "the semicolon alone";
    EXPECT_EQ(c.parserErrors(), 0U);
    std::size_t hidden = 0;
    for (ANTLR3_UINT32 i = 0; i < c.tokens->tokens->count; ++i) {
        auto* token = static_cast<pANTLR3_COMMON_TOKEN>(c.tokens->tokens->get(c.tokens->tokens, i));
        if (token->channel != 99) continue;
        EXPECT_EQ(token->getType(token), static_cast<ANTLR3_UINT32>(Oracle_WS));
        ++hidden;
    }
    EXPECT_EQ(hidden, 4U) << "a blank, a line end of two characters, a tab, a blank";
}

TEST(OracleContexts, ARuleInTheMiddleCanBeRunByItself) {
    Contexts c(u"a || b * 2 , c");
    const ZRRuleReturn product = c.parser->expression(c.parser);
    ASSERT_NE(product.tree, nullptr);
    EXPECT_EQ(product.tree->getType(product.tree), static_cast<ANTLR3_UINT32>(Oracle_ASTERISK));
    EXPECT_EQ(product.tree->getChildCount(product.tree), 2U);
    EXPECT_EQ(c.parserErrors(), 0U);
}

TEST(OracleContexts, RulesThatMayBeAbsentReportAnErrorOnNothing) {
    Contexts c(u"WHERE a = 1");
    EXPECT_EQ(c.parser->node_table_specification(c.parser).tree->getType(
                  c.parser->node_table_specification(c.parser).tree),
              0U);
    EXPECT_GT(c.parserErrors(), 0U);
    const ZRRuleReturn where = c.parser->node_where_condition(c.parser);
    EXPECT_EQ(where.tree->getType(where.tree), static_cast<ANTLR3_UINT32>(Oracle_WHERE_CONDITION));
}

TEST(OracleContexts, EveryParserEntryCanBeCalledOnAnyText) {
    using Entry = ZRRuleReturn (*)(pOracleParser);
    constexpr std::size_t kFirst = offsetof(OracleParser, start_rule);
    constexpr std::size_t kEnd = offsetof(OracleParser, getGrammarFileName);
    constexpr std::size_t kCount = (kEnd - kFirst) / sizeof(Entry);
    EXPECT_EQ(kCount, 167U);
    for (const std::u16string_view text :
         {u"SELECT a FROM t WHERE x = 1", u"a", u"'x'", u"(1, 2)", u") x", u""}) {
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

TEST(OracleContexts, EveryLexerEntryCanBeCalledOnAnyText) {
    using Entry = void (*)(pOracleLexer);
    constexpr std::size_t kFirst = offsetof(OracleLexer, pLexer) + sizeof(pANTLR3_LEXER);
    constexpr std::size_t kEnd = offsetof(OracleLexer, getGrammarFileName);
    for (const std::u16string_view text : {u"SELECT", u"dbms_random.value", u"'x'", u"\"", u" ", u""}) {
        for (std::size_t at = kFirst; at < kEnd; at += sizeof(Entry)) {
            Contexts c(text);
            Entry entry = nullptr;
            std::memcpy(&entry, reinterpret_cast<const char*>(c.lexer) + at, sizeof entry);
            ASSERT_NE(entry, nullptr) << at;
            entry(c.lexer);
        }
    }
}

TEST(OracleContexts, ARuleWithAnEmptyBodyNeverMatches) {
    for (const std::u16string_view text : {u"\"", u"", u"a"}) {
        Contexts c(text);
        c.lexer->mMY_QUOTE(c.lexer);
        EXPECT_EQ(c.lexer->pLexer->rec->state->error, static_cast<ANTLR3_BOOLEAN>(ANTLR3_TRUE));
    }
}

}  // namespace
