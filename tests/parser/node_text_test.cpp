#include "parser/node_text.h"

#include <gtest/gtest.h>
#include <zrparsersql/recognizers/MSSQL_tokens.h>

#include <chrono>
#include <string>

#include "tests/parser/parsed.h"
#include "tests/parser/tree_text.h"

namespace {

CString columnName(std::u16string_view sql) {
    const ParsedMssql parsed(sql);
    return zr::joinedText(*findNode(*parsed.tree, MSSQL_COLUMN_NAME));
}

CString stringOf(std::u16string_view sql) {
    const ParsedMssql parsed(sql);
    CZRSQLTree* const string = findNode(*parsed.tree, MSSQL_SQL_STRING);
    return string ? zr::quotedText(*string) : CString(u"no string");
}

TEST(JoinedText, IsTheTextOfASingleToken) {
    EXPECT_EQ(columnName(u"SELECT a"), u"a");
}

TEST(JoinedText, KeepsTheBlankBetweenTwoTokens) {
    EXPECT_EQ(columnName(u"SELECT [a b]"), u"a b");
}

TEST(JoinedText, KeepsEveryCharacterThatNoTokenTook) {
    EXPECT_EQ(columnName(u"SELECT [a \t;$:^\\~ b]"), u"a \t;$:^\\~ b");
    EXPECT_EQ(columnName(u"SELECT [na\u00efve \u65e5\u672c x]"), u"na\u00efve \u65e5\u672c x");
    EXPECT_EQ(columnName(u"SELECT [a\xd800z]"), u"a\xd800z");
}

TEST(JoinedText, HasNothingBetweenTokensThatTouch) {
    EXPECT_EQ(columnName(u"SELECT [a.b(1)]"), u"a.b(1)");
}

TEST(JoinedText, LeavesOutWhatStandsOutsideOfTheChildren) {
    EXPECT_EQ(columnName(u"SELECT [ a b ]"), u"a b");
}

TEST(JoinedText, LeavesOutTheDroppedHalfOfADoubledQuote) {
    EXPECT_EQ(columnName(u"SELECT [a]]b]"), u"a]b]");
    EXPECT_EQ(columnName(u"SELECT [a ] ] b]"), u"a  ] b]");
}

TEST(JoinedText, OfANodeWithoutChildrenIsEmpty) {
    EXPECT_EQ(columnName(u"SELECT [\u65e5]"), u"");
}

TEST(JoinedText, OfAViewOverNoNodeIsEmpty) {
    const ParsedMssql parsed(u"SELECT a");
    EXPECT_EQ(zr::joinedText(*parsed.tree->GetChild(9)), u"");
    EXPECT_EQ(zr::quotedText(*parsed.tree->GetChild(9)), u"");
    EXPECT_EQ(zr::concatenatedText(*parsed.tree->GetChild(9)), u"");
}

TEST(QuotedText, KeepsWhatStandsBetweenTheTokens) {
    EXPECT_EQ(stringOf(u"SELECT 'a  b;c'"), u"a  b;c");
}

TEST(QuotedText, KeepsWhatStandsNextToTheQuotes) {
    EXPECT_EQ(stringOf(u"SELECT ' a '"), u" a ");
    EXPECT_EQ(stringOf(u"SELECT '\u00e9t\u00e9'"), u"\u00e9t\u00e9");
}

TEST(QuotedText, OfAStringWithoutTokensIsWhatTheQuotesEnclose) {
    EXPECT_EQ(stringOf(u"SELECT ''"), u"");
    EXPECT_EQ(stringOf(u"SELECT '  '"), u"  ");
    EXPECT_EQ(stringOf(u"SELECT '\u65e5\u672c'"), u"\u65e5\u672c");
}

TEST(QuotedText, OfANationalStringBeginsBehindItsQuote) {
    EXPECT_EQ(stringOf(u"SELECT N' x'"), u" x");
    EXPECT_EQ(stringOf(u"SELECT N  'x'"), u"x");
    EXPECT_EQ(stringOf(u"SELECT N'\u65e5'"), u"\u65e5");
}

TEST(QuotedText, StaysWithinItsOwnQuotes) {
    EXPECT_EQ(stringOf(u"SELECT x FROM t WHERE y = 'a' AND z = 'b'"), u"a");
    EXPECT_EQ(stringOf(u"SELECT x FROM t WHERE z IN ( 'b' )"), u"b");
}

TEST(ConcatenatedText, HasNothingBetweenTheTokens) {
    const ParsedMssql parsed(u"SELECT [a b]");
    EXPECT_EQ(zr::concatenatedText(*findNode(*parsed.tree, MSSQL_COLUMN_NAME)), u"ab");
}

TEST(JoinedText, OfALongNameComesInLinearTime) {
    const auto timed = [](int words) {
        std::u16string sql = u"SELECT [a";
        for (int i = 0; i < words; ++i) sql += u" a";
        const ParsedMssql parsed(sql + u"]");
        CZRSQLTree* const name = findNode(*parsed.tree, MSSQL_COLUMN_NAME);
        const auto start = std::chrono::steady_clock::now();
        EXPECT_EQ(zr::joinedText(*name).GetLength(), 2 * words + 1);
        return std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    };
    timed(1'000);
    // Quadratic work would take a thousand times as long.
    EXPECT_LT(timed(100'000), 100 * timed(10'000) + 0.1);
}

}  // namespace
