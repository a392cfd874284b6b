// The numbers that tree walkers and stored projects know of the MySQL grammar, and its entries.

#include <gtest/gtest.h>
#include <zrparsersql/recognizers/MySQLSelect.h>
#include <zrparsersql/recognizers/MySQLSelect_tokens.h>

#include <cstddef>
#include <set>
#include <string>

namespace {

// One of each part of the vocabulary; the corpus pins the rest of those that a token or a tree can have.
static_assert(MySQLSelect_SELECT_QUERY_MY == 4 && MySQLSelect_SELECT_QUERY_IN == 5);
static_assert(MySQLSelect_PREDICATE == 6 && MySQLSelect_SELECT_LIST == 7 && MySQLSelect_PARAMETER == 10);
static_assert(MySQLSelect_FUNCTION_MY == 27 && MySQLSelect_NUMBER_literal == 31);
static_assert(MySQLSelect_NUMBER_LITERAL == 42 && MySQLSelect_LIMIT == 53 && MySQLSelect_ASTERISK_ == 56);
static_assert(MySQLSelect_S == 60 && MySQLSelect_UNDERLINE == 170 && MySQLSelect_WS == 313);
static_assert(MySQLSelect_NOT_EXISTS == 100 && MySQLSelect_NOT_IN_KEYWORD == 126);
static_assert(MySQLSelect_NOT_NULL_KEYWORD == 127 && MySQLSelect_UNION_KEYWORD == 111);
static_assert(MySQLSelect_IDENTIFICATOR == 317 && MySQLSelect_MOD1 == 329 && MySQLSelect_DIGIT == 332);

TEST(MysqlVocabulary, HasOneNameForEachNumberFrom4To395) {
    std::set<std::string> names;
    for (int number = 4; number <= 395; ++number) names.insert(MySQLSelect_token_name(number));
    EXPECT_EQ(names.size(), 392U);
    EXPECT_EQ(names.count("<invalid>"), 0U);
    EXPECT_STREQ(MySQLSelect_token_name(396), "<invalid>");
}

TEST(MysqlVocabulary, NamesLiteralsAsTheyAreWritten) {
    EXPECT_STREQ(MySQLSelect_token_name(333), "'LOOP'");
    EXPECT_STREQ(MySQLSelect_token_name(353), "'CONVERT'");
    EXPECT_STREQ(MySQLSelect_token_name(376), "'\\''");
    EXPECT_STREQ(MySQLSelect_token_name(395), "'@'");
}

TEST(MysqlContexts, HaveAnEntryForEachRule) {
    using Entry = ZRRuleReturn (*)(pMySQLSelectParser);
    constexpr std::size_t kFirst = offsetof(MySQLSelectParser, start_rule);
    EXPECT_EQ((offsetof(MySQLSelectParser, getGrammarFileName) - kFirst) / sizeof(Entry), 147U);
    EXPECT_EQ((offsetof(MySQLSelectParser, condition_list) - kFirst) / sizeof(Entry), 78U)
        << "rules of queries come first";
}

}  // namespace
