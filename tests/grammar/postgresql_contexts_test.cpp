// What a host finds that works with the PostgreSQL contexts by itself: the token numbers, every entry of
// the parser, the nil root.

#include <gtest/gtest.h>
#include <zrparsersql/input_stream.h>
#include <zrparsersql/recognizers/PostgreSQL.h>
#include <zrparsersql/recognizers/PostgreSQL_tokens.h>

#include <cstddef>
#include <cstring>
#include <set>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "tests/grammar/contexts.h"

namespace {

// Numbers that stored projects and tree walkers know, one of each part of the vocabulary; the corpus pins the
// rest of those that a token or a tree can have.
static_assert(PostgreSQL_SELECT_QUERY_POST == 4 && PostgreSQL_SELECT_QUERY_IN == 5);
static_assert(PostgreSQL_FUNCTION_SPECIFICATION == 13 && PostgreSQL_NUMBER_literal == 32);
static_assert(PostgreSQL_NUMBER_LITERAL == 43 && PostgreSQL_DATE == 44 && PostgreSQL_DATE_PART == 56);
static_assert(PostgreSQL_INSERT_QUERY == 74 && PostgreSQL_USING_LIST == 86 && PostgreSQL_S == 87);
static_assert(PostgreSQL_UNDERLINE == 184 && PostgreSQL_Z == 223 && PostgreSQL_WS == 349);
static_assert(PostgreSQL_IDENTIFICATOR == 353 && PostgreSQL_DIGIT == 359 && PostgreSQL_AMPERSAND == 376);

TEST(PostgresqlVocabulary, HasOneNameForEachNumberFrom4To448) {
    std::set<std::string> names;
    for (int number = 4; number <= 448; ++number) names.insert(PostgreSQL_token_name(number));
    EXPECT_EQ(names.size(), 445U);
    EXPECT_EQ(names.count("<invalid>"), 0U);
    EXPECT_STREQ(PostgreSQL_token_name(449), "<invalid>");
}

TEST(PostgresqlVocabulary, NamesLiteralsAsTheyAreWritten) {
    EXPECT_STREQ(PostgreSQL_token_name(377), "'LOOP'");
    EXPECT_STREQ(PostgreSQL_token_name(410), "'BYNATY base64'");
    EXPECT_STREQ(PostgreSQL_token_name(438), "'y'");
    EXPECT_STREQ(PostgreSQL_token_name(448), "'@'");
}

using Contexts = zr::test::ContextsOf<PostgreSQLLexerNewSSD, PostgreSQLParserNewSSD>;

std::vector<std::uint32_t> childTypes(pANTLR3_BASE_TREE tree) {
    std::vector<std::uint32_t> types;
    for (ANTLR3_UINT32 i = 0; i < tree->getChildCount(tree); ++i) {
        const auto child = static_cast<pANTLR3_BASE_TREE>(tree->getChild(tree, i));
        types.push_back(child->getType(child));
    }
    return types;
}

using Types = std::vector<std::uint32_t>;
constexpr std::uint32_t kEndOfFile = ANTLR3_TOKEN_EOF;

TEST(PostgresqlContexts, TheRootIsNilWithTheStatementTheTailAndTheEnd) {
    Contexts c(u"SELECT a FROM t ) 1");
    const pANTLR3_BASE_TREE root = c.start();
    EXPECT_TRUE(root->isNilNode(root));
    EXPECT_EQ(childTypes(root),
              (Types{PostgreSQL_SELECT_QUERY_POST, PostgreSQL_RIGHT_PAREN, PostgreSQL_DIGIT, kEndOfFile}));
    EXPECT_EQ(c.parserErrors(), 0U);
}

TEST(PostgresqlContexts, TheRootIsNilWithoutATailToo) {
    for (const auto& [text, statement] :
         {std::pair{u"SELECT", PostgreSQL_SELECT_QUERY_POST}, std::pair{u"UPDATE t", PostgreSQL_UPDATE},
          std::pair{u"INSERT INTO t DEFAULT VALUES", PostgreSQL_INSERT_QUERY},
          std::pair{u"DELETE FROM t", PostgreSQL_DELETE_QUERY}}) {
        Contexts c(text);
        const pANTLR3_BASE_TREE root = c.start();
        EXPECT_TRUE(root->isNilNode(root));
        EXPECT_EQ(childTypes(root), (Types{static_cast<std::uint32_t>(statement), kEndOfFile}));
    }
}

TEST(PostgresqlContexts, ATextWithoutAStatementIsAnErrorNodeWithoutARoot) {
    Contexts c(u"hello");
    const pANTLR3_BASE_TREE root = c.start();
    EXPECT_FALSE(root->isNilNode(root));
    EXPECT_EQ(root->getType(root), 0U);
    EXPECT_EQ(root->getChildCount(root), 0U);
    EXPECT_EQ(c.parserErrors(), 1U);
}

TEST(PostgresqlContexts, ATableThatDoesNotParseCountsAParserError) {
    Contexts c(u"DELETE FROM 5 WHERE a = 1");
    const pANTLR3_BASE_TREE root = c.start();
    EXPECT_EQ(childTypes(root), (Types{PostgreSQL_DELETE_QUERY, kEndOfFile}));
    EXPECT_EQ(c.parserErrors(), 1U);
}

TEST(PostgresqlContexts, AStatementByItselfHasNoNilRoot) {
    Contexts c(u"SELECT a FROM t ) 1");
    const pANTLR3_BASE_TREE tree = c.parser->all_sql_query(c.parser).tree;
    EXPECT_EQ(tree->getType(tree), static_cast<ANTLR3_UINT32>(PostgreSQL_SELECT_QUERY_POST));
}

TEST(PostgresqlContexts, EveryParserEntryCanBeCalledOnAnyText) {
    using Entry = ZRRuleReturn (*)(pPostgreSQLParser);
    constexpr std::size_t kFirst = offsetof(PostgreSQLParser, start_rule);
    constexpr std::size_t kEnd = offsetof(PostgreSQLParser, getGrammarFileName);
    constexpr std::size_t kCount = (kEnd - kFirst) / sizeof(Entry);
    EXPECT_EQ(kCount, 222U);
    for (const std::u16string_view text :
         {u"SELECT a FROM t WHERE x = 1", u"a::int", u"(1, 2)", u") x", u"'1 year'", u""}) {
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

}  // namespace
