// What a host finds that works with the MS Access contexts by itself. What the contexts of all grammars share
// is tested on those of SQL Server.

#include <gtest/gtest.h>
#include <zrparsersql/input_stream.h>
#include <zrparsersql/recognizers/MSAccessSQL_v3.h>
#include <zrparsersql/recognizers/MSAccessSQL_v3_tokens.h>

#include <cstddef>
#include <cstring>
#include <set>
#include <string>
#include <string_view>

#include "tests/grammar/contexts.h"

namespace {

// Numbers that stored projects and tree walkers know, some of each kind of entry; the corpus pins the rest of
// those that a token or a tree can have.
static_assert(MSAccessSQL_v3_A == 4 && MSAccessSQL_v3_Z == 368 && MSAccessSQL_v3_UNDERLINE == 343);
static_assert(MSAccessSQL_v3_ALIAS == 7 && MSAccessSQL_v3_SELECT_QUERY == 296);
static_assert(MSAccessSQL_v3_QUERY_NAME == 265 && MSAccessSQL_v3_DB_NAME == 87);
static_assert(MSAccessSQL_v3_DATE == 75 && MSAccessSQL_v3_DATE_FUNCTION == 84);
static_assert(MSAccessSQL_v3_NUMBER_LITERAL == 234 && MSAccessSQL_v3_NUMBER_literal == 235);
static_assert(MSAccessSQL_v3_LITERALAS == 189 && MSAccessSQL_v3_LITERAL_AS == 190);
static_assert(MSAccessSQL_v3_COL_PAREN_ATTRITION == 55 && MSAccessSQL_v3_QUOTE_ATTRITION == 268);
static_assert(MSAccessSQL_v3_MY_QUOTE_ATTRITION == 217 && MSAccessSQL_v3_WS == 364);
static_assert(MSAccessSQL_v3_MOD == 210 && MSAccessSQL_v3_MOD1 == 211 && MSAccessSQL_v3_MOD_KEYWORD == 212);

TEST(MsAccessVocabulary, HasOneNameForEachOfThe425NumbersFrom4To428) {
    std::set<std::string> names;
    for (int number = 4; number <= 428; ++number) names.insert(MSAccessSQL_v3_token_name(number));
    EXPECT_EQ(names.size(), 425U);
    EXPECT_EQ(names.count("<invalid>"), 0U);
    EXPECT_STREQ(MSAccessSQL_v3_token_name(429), "<invalid>");
}

TEST(MsAccessVocabulary, NamesLiteralsAsTheyAreWritten) {
    EXPECT_STREQ(MSAccessSQL_v3_token_name(369), "'#'");
    EXPECT_STREQ(MSAccessSQL_v3_token_name(374), "'BYNATY base64'");
    EXPECT_STREQ(MSAccessSQL_v3_token_name(412), "'count'");
    EXPECT_STREQ(MSAccessSQL_v3_token_name(428), "'yyyy'");
}

using Contexts = zr::test::ContextsOf<MSAccessSQL_v3LexerNewSSD, MSAccessSQL_v3ParserNewSSD>;

pANTLR3_BASE_TREE childOf(pANTLR3_BASE_TREE tree, ANTLR3_UINT32 index) {
    return static_cast<pANTLR3_BASE_TREE>(tree->getChild(tree, index));
}

TEST(MsAccessContexts, TheRootIsAListOfTheQueryItsTailAndTheEndOfTheText) {
    Contexts c(u"SELECT a FROM t ORDER BY a, ) x");
    const pANTLR3_BASE_TREE root = c.parser->start_rule(c.parser).tree;
    ASSERT_TRUE(root->isNilNode(root));
    ASSERT_EQ(root->getChildCount(root), 5U);
    constexpr ANTLR3_UINT32 kTypes[] = {MSAccessSQL_v3_SELECT_QUERY, MSAccessSQL_v3_COMMA,
                                        MSAccessSQL_v3_RIGHT_PAREN, MSAccessSQL_v3_IDENTIFICATOR,
                                        ANTLR3_TOKEN_EOF};
    for (ANTLR3_UINT32 i = 0; i < 5; ++i)
        EXPECT_EQ(childOf(root, i)->getType(childOf(root, i)), kTypes[i]) << i;
    EXPECT_EQ(c.parserErrors(), 0U) << "a tail is no error";
}

TEST(MsAccessContexts, WithoutATailThereIsTheEndOfTheTextAllTheSame) {
    Contexts c(u"SELECT a FROM t");
    const pANTLR3_BASE_TREE root = c.parser->start_rule(c.parser).tree;
    ASSERT_TRUE(root->isNilNode(root));
    EXPECT_EQ(root->getChildCount(root), 2U);
}

TEST(MsAccessContexts, WhiteSpaceIsHiddenOneTokenABlankOrALineEnd) {
    Contexts c(u"SELECT  a\r\n\tFROM t;");
    c.parser->start_rule(c.parser);
    EXPECT_EQ(c.lexerErrors(), 1U) << "the semicolon alone";
    EXPECT_EQ(c.parserErrors(), 0U);
    std::size_t hidden = 0;
    for (ANTLR3_UINT32 i = 0; i < c.tokens->tokens->count; ++i) {
        auto* token = static_cast<pANTLR3_COMMON_TOKEN>(c.tokens->tokens->get(c.tokens->tokens, i));
        if (token->channel != 99) continue;
        EXPECT_EQ(token->getType(token), static_cast<ANTLR3_UINT32>(MSAccessSQL_v3_WS));
        ++hidden;
    }
    EXPECT_EQ(hidden, 5U);
}

TEST(MsAccessContexts, ARuleInTheMiddleCanBeRunByItself) {
    Contexts c(u"a & b * 2 , c");
    const ZRRuleReturn sum = c.parser->expression(c.parser);
    ASSERT_NE(sum.tree, nullptr);
    EXPECT_EQ(sum.tree->getType(sum.tree), static_cast<ANTLR3_UINT32>(MSAccessSQL_v3_ASTERISK));
    EXPECT_EQ(sum.tree->getChildCount(sum.tree), 2U);
    EXPECT_EQ(c.parserErrors(), 0U);
}

TEST(MsAccessContexts, EveryParserEntryCanBeCalledOnAnyText) {
    using Entry = ZRRuleReturn (*)(pMSAccessSQL_v3Parser);
    constexpr std::size_t kFirst = offsetof(MSAccessSQL_v3Parser, start_rule);
    constexpr std::size_t kEnd = offsetof(MSAccessSQL_v3Parser, getGrammarFileName);
    constexpr std::size_t kCount = (kEnd - kFirst) / sizeof(Entry);
    EXPECT_EQ(kCount, 139U);
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

TEST(MsAccessContexts, EveryLexerEntryCanBeCalledOnAnyText) {
    using Entry = void (*)(pMSAccessSQL_v3Lexer);
    constexpr std::size_t kFirst = offsetof(MSAccessSQL_v3Lexer, pLexer) + sizeof(pANTLR3_LEXER);
    constexpr std::size_t kEnd = offsetof(MSAccessSQL_v3Lexer, getGrammarFileName);
    for (const std::u16string_view text : {u"SELECT", u"[a b]", u" ", u""}) {
        for (std::size_t at = kFirst; at < kEnd; at += sizeof(Entry)) {
            Contexts c(text);
            Entry entry = nullptr;
            std::memcpy(&entry, reinterpret_cast<const char*>(c.lexer) + at, sizeof entry);
            ASSERT_NE(entry, nullptr) << at;
            entry(c.lexer);
        }
    }
}

TEST(MsAccessContexts, ATextWithoutAStatementIsAnErrorNode) {
    Contexts c(u"hello");
    const ZRRuleReturn query = c.parser->start_rule(c.parser);
    EXPECT_EQ(query.tree->getType(query.tree), 0U);
    EXPECT_FALSE(query.tree->isNilNode(query.tree));
    EXPECT_EQ(query.tree->getChildCount(query.tree), 0U);
    EXPECT_EQ(c.parserErrors(), 1U);
}

}  // namespace
