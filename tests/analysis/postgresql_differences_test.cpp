// Where plain text that SQL Server reads as well comes to another descriptor in PostgreSQL, one test each.
// All else of the plain queries is compared in common_subset_test.cpp.
#include <gtest/gtest.h>

#include "tests/analysis/postgresql_analysed.h"

namespace {

using Pg = PostgresqlAnalysed;

TEST(PostgresqlDiffersFromSqlServer, AnAliasIsFoundInLowerCaseOnly) {
    const std::u16string_view sql = u"SELECT X.a FROM t AS X";
    EXPECT_EQ(listText(Analysed(sql).query.m_selectItems), "(5 text=X field=a alias=X)");
    EXPECT_EQ(Pg(sql).select(), "(5 table=X field=a)");
}

TEST(PostgresqlDiffersFromSqlServer, ABareAliasStaysAField) {
    const std::u16string_view sql = u"SELECT a AS x FROM t ORDER BY x";
    EXPECT_EQ(listText(Analysed(sql).query.m_orderItems), "(5 text=x)");
    EXPECT_EQ(Pg(sql).order(), "(5 field=x)");
}

TEST(PostgresqlDiffersFromSqlServer, ADirectionIsLost) {
    for (const std::u16string_view sql :
         {u"SELECT a FROM t ORDER BY a DESC, b", u"SELECT a FROM t ORDER BY a, b DESC"}) {
        EXPECT_EQ(listText(Analysed(sql).query.m_orderItems), "(5 field=a (0 text=DESC)) (5 field=b)");
        EXPECT_EQ(Pg(sql).order(), "(5 field=a (0)) (5 field=b)");
    }
}

TEST(PostgresqlDiffersFromSqlServer, TheWordsOfAJoinAreLeavesAndNoItems) {
    const std::u16string_view sql = u"SELECT a FROM t CROSS JOIN u";
    EXPECT_EQ(listText(Analysed(sql).query.m_fromItems),
              "(4 name=JOIN op type=94 (0 name=  op (5 table=t) (1 text=CROSS)) (5 table=u))");
    EXPECT_EQ(Pg(sql).from(), "(4 name=JOIN op type=111 (0 name=  op (5 table=t)) (5 table=u))");
}

TEST(PostgresqlDiffersFromSqlServer, TheAsteriskOfACallIsALeafAndNoItem) {
    const std::u16string_view sql = u"SELECT COUNT(*) FROM t";
    EXPECT_EQ(listText(Analysed(sql).query.m_selectItems), "(4 name=COUNT type=180 (4 name=* op type=251))");
    EXPECT_EQ(Pg(sql).select(), "(4 name=COUNT type=317)");
}

TEST(PostgresqlDiffersFromSqlServer, ANumberOfThreeTokensLosesItsThird) {
    const std::u16string_view sql = u"SELECT 2.5 FROM t";
    EXPECT_EQ(listText(Analysed(sql).query.m_selectItems), "(1 text=2.5)");
    EXPECT_EQ(Pg(sql).select(), "(1 text=2.)");
}

TEST(PostgresqlDiffersFromSqlServer, YearIsAUnitOfIntervalsAndNoFunction) {
    const std::u16string_view sql = u"SELECT a FROM t WHERE b = 1 AND YEAR(c) = 2020";
    EXPECT_EQ(listText(Analysed(sql).query.m_whereItem->m_items),
              "(4 name=AND op type=125 (4 name== op type=254 (5 field=b) (1 text=1)) "
              "(4 name== op type=254 (4 name=YEAR type=173 (5 field=c)) (1 text=2020)))");
    EXPECT_EQ(Pg(sql).where(), "(4 name== op type=354 (5 field=b) (1 text=1))");
}

TEST(PostgresqlDiffersFromSqlServer, AnAsteriskAloneIsAPredicate) {
    const std::u16string_view sql = u"SELECT * FROM t";
    EXPECT_EQ(listText(Analysed(sql).query.m_selectItems), "(5 field=*)");
    EXPECT_EQ(Pg(sql).select(), "");
    EXPECT_EQ(Pg(sql).query.m_predicate, 5);
}

TEST(PostgresqlDiffersFromSqlServer, AnAliasIsTakenForTheFirstArgumentOfACallInTheSelectList) {
    // The aliased form of a select item comes first, and a call may lack its arguments and its parenthesis.
    const std::u16string_view sql = u"SELECT ROUND(a, 2) FROM t";
    EXPECT_EQ(listText(Analysed(sql).query.m_selectItems), "(4 name=ROUND type=208 (5 field=a) (1 text=2))");
    EXPECT_EQ(Pg(sql).select(), "(4 name=ALIAS op type=20 (4 name=ROUND type=178) (1 text=a)) (1 text=2)");
}

}  // namespace
