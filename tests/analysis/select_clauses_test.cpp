// Clauses, predicates, columns, tables and orders, on real SQL Server text.
#include <gtest/gtest.h>

#include "tests/analysis/analysed.h"
#include "tests/analysis/descriptor_text.h"

namespace {

std::string selectOf(std::u16string_view sql) {
    return listText(Analysed(sql).query.m_selectItems);
}
std::string fromOf(std::u16string_view sql) {
    return listText(Analysed(sql).query.m_fromItems);
}
std::string orderOf(std::u16string_view sql) {
    return listText(Analysed(sql).query.m_orderItems);
}

TEST(Columns, ComeOutWithoutBrackets) {
    EXPECT_EQ(selectOf(u"SELECT [a b] FROM [t]"), "(5 field=a b)");
}

TEST(Columns, ABareNameThatIsAnAliasIsAReferenceToIt) {
    EXPECT_EQ(selectOf(u"SELECT x FROM t AS x"), "(5 text=x)");
    EXPECT_EQ(selectOf(u"SELECT X FROM t AS x"), "(5 text=X)");
}

TEST(Columns, AQualifiedNameHasTableAndField) {
    EXPECT_EQ(selectOf(u"SELECT t.x FROM t"), "(5 table=t field=x)");
    EXPECT_EQ(selectOf(u"SELECT t.x AS x FROM t"),
              "(4 name=ALIAS op type=19 (5 table=t field=x) (1 text=x))");
}

TEST(Columns, AQualifierThatIsAnAliasIsKeptAsOne) {
    EXPECT_EQ(selectOf(u"SELECT x.a FROM t AS x"), "(5 text=x field=a alias=x)");
}

TEST(Columns, BehindADatabaseTheTableIsTakenEvenIfItIsAnAlias) {
    EXPECT_EQ(selectOf(u"SELECT db.t.x FROM db.t AS t"), "(5 table=t field=x)");
    EXPECT_EQ(selectOf(u"SELECT db.t.t FROM db.t AS t"), "(5 table=t field=t)");
}

TEST(Columns, AsterisksAreColumns) {
    EXPECT_EQ(selectOf(u"SELECT * FROM t"), "(5 field=*)");
    EXPECT_EQ(selectOf(u"SELECT t.* FROM t"), "(5 table=t field=*)");
}

TEST(Predicate, AllAndDistinctAreNumbers) {
    EXPECT_EQ(Analysed(u"SELECT a FROM t").query.m_predicate, 0);
    EXPECT_EQ(Analysed(u"SELECT ALL a FROM t").query.m_predicate, 1);
    EXPECT_EQ(Analysed(u"SELECT DISTINCT a FROM t").query.m_predicate, 2);
}

void expectLimit(std::u16string_view sql, int hasLimit, int count) {
    const Analysed a(sql);
    EXPECT_EQ(a.query.m_hasLimit, hasLimit);
    if (hasLimit) {
        EXPECT_EQ(a.query.m_limitOffset, 0);
        EXPECT_EQ(a.query.m_limitCount, count);
    }
}

TEST(Predicate, TopIsALimitFromTheFirstRowOn) {
    expectLimit(u"SELECT TOP 5 a FROM t", 1, 5);
    expectLimit(u"SELECT TOP (5) a FROM t", 1, 5);
    EXPECT_EQ(Analysed(u"SELECT TOP 5 a FROM t").query.m_predicate, 0);
}

TEST(Predicate, TopWithPercentOrTiesIsNoLimit) {
    expectLimit(u"SELECT TOP 5 PERCENT a FROM t", 0, 0);
    expectLimit(u"SELECT TOP 5 WITHTIES a FROM t", 0, 0);
}

TEST(Predicate, TopBehindDistinctIsNotLookedAt) {
    expectLimit(u"SELECT DISTINCT TOP 5 a FROM t", 0, 0);
    EXPECT_EQ(Analysed(u"SELECT DISTINCT TOP 5 a FROM t").query.m_predicate, 2);
}

TEST(Predicate, TopReadsTheFirstTokenOfItsNumberOnly) {
    expectLimit(u"SELECT TOP 5.9 a FROM t", 1, 5);
    expectLimit(u"SELECT TOP -5 a FROM t", 1, 0);
    expectLimit(u"SELECT TOP NULL a FROM t", 1, 0);
}

TEST(Predicate, TopIsCutToTheRangeOfItsMember) {
    expectLimit(u"SELECT TOP 2147483647 a FROM t", 1, 2147483647);
    expectLimit(u"SELECT TOP 2147483648 a FROM t", 1, 2147483647);
    expectLimit(u"SELECT TOP 99999999999999999999999999 a FROM t", 1, 2147483647);
}

TEST(From, ATableIsAFieldItemWithATable) {
    EXPECT_EQ(fromOf(u"SELECT a FROM [t u]"), "(5 table=t u)");
}

TEST(From, BehindADatabaseTheTableIsTheFirstTokenOfItsName) {
    EXPECT_EQ(fromOf(u"SELECT a FROM dbo.t"), "(5 table=t)");
    EXPECT_EQ(fromOf(u"SELECT a FROM dbo.[t u]"), "(5 table=t)");
}

TEST(From, ACommaIsAnOperatorOverWhatStandsLeftOfIt) {
    EXPECT_EQ(fromOf(u"SELECT x FROM a, b, c"),
              "(4 name=, op type=248 (4 name=, op type=248 (5 table=a) (5 table=b)) (5 table=c))");
}

TEST(From, AnAliasIsAnOperatorOverTableAndName) {
    EXPECT_EQ(fromOf(u"SELECT a FROM t AS [x y]"), "(4 name=ALIAS op type=19 (5 table=t) (1 text=x y))");
}

TEST(From, AJoinHasItsPrefixAsAPartAndItsPostfixFlat) {
    EXPECT_EQ(fromOf(u"SELECT a FROM t INNER JOIN u ON t.x = u.y"),
              "(4 name=JOIN op type=94 (0 name=  op (5 table=t) (1 text=INNER)) (5 table=u) "
              "(4 name=ON op type=107 (4 name== op type=254 (5 table=t field=x) (5 table=u field=y))))");
}

TEST(From, AFurtherJoinStandsBehindTheFirst) {
    EXPECT_EQ(fromOf(u"SELECT a FROM t JOIN u ON a = b LEFT JOIN v ON c = d"),
              "(4 name=JOIN op type=94 (0 name=  op (5 table=t)) (5 table=u) "
              "(4 name=ON op type=107 (4 name== op type=254 (5 field=a) (5 field=b)))) "
              "(4 name=JOIN op type=94 (0 name=  op (1 text=LEFT)) (5 table=v) "
              "(4 name=ON op type=107 (4 name== op type=254 (5 field=c) (5 field=d))))");
}

TEST(From, ABareNestedSelectIsNamedAndNotWalked) {
    EXPECT_EQ(fromOf(u"SELECT a FROM (SELECT b FROM u)"), "(0 name=select)");
    EXPECT_EQ(fromOf(u"SELECT a FROM (SELECT b FROM u) x"),
              "(4 name=ALIAS op type=19 (6 name=SUB_QUERY query) (1 text=x))");
}

TEST(Clauses, EachFillsItsOwnList) {
    const Analysed a(u"SELECT a FROM t WHERE b = 1 GROUP BY c, d HAVING e = 2 ORDER BY f");
    EXPECT_EQ(listText(a.query.m_selectItems), "(5 field=a)");
    EXPECT_EQ(listText(a.query.m_fromItems), "(5 table=t)");
    ASSERT_NE(a.query.m_whereItem, nullptr);
    EXPECT_EQ(listText(a.query.m_whereItem->m_items), "(4 name== op type=254 (5 field=b) (1 text=1))");
    EXPECT_EQ(listText(a.query.m_groupItems), "(5 field=c) (5 field=d)");
    EXPECT_EQ(listText(a.query.m_havingItems), "(4 name== op type=254 (5 field=e) (1 text=2))");
    EXPECT_EQ(listText(a.query.m_orderItems), "(5 field=f)");
    EXPECT_TRUE(a.query.m_unionItems.IsEmpty());
}

TEST(Clauses, ComputeForAndOptionLeaveNothing) {
    const Analysed a(u"SELECT a FROM t COMPUTE SUM(a) FOR BROWSE OPTION MAXDOP 2");
    EXPECT_EQ(listText(a.query.m_selectItems), "(5 field=a)");
    EXPECT_TRUE(a.query.m_orderItems.IsEmpty());
    EXPECT_EQ(a.query.m_whereItem, nullptr);
}

TEST(Order, TheDirectionGoesToTheFirstItem) {
    EXPECT_EQ(orderOf(u"SELECT a FROM t ORDER BY a, b DESC"), "(5 field=a (0 text=DESC)) (5 field=b)");
    EXPECT_EQ(orderOf(u"SELECT a FROM t ORDER BY a DESC, b ASC, c"),
              "(5 field=a (0 text=DESC) (0 text=ASC)) (5 field=b) (5 field=c)");
}

TEST(SecondAnalysis, KeepsTheWhereItemAndRefillsItsList) {
    Analysed a(u"SELECT a FROM t WHERE b = 1");
    SelectItem* const where = a.query.m_whereItem;
    ASSERT_NE(where, nullptr);
    SelectItem* const condition = where->m_items.GetHead();
    SelectItem* const column = a.query.m_selectItems.GetHead();
    a.again(u"SELECT c FROM t WHERE d = 2");
    EXPECT_EQ(a.query.m_whereItem, where);
    EXPECT_EQ(listText(where->m_items), "(4 name== op type=254 (5 field=d) (1 text=2))");
    EXPECT_EQ(listText(a.query.m_selectItems), "(5 field=c)");
    // A host may still hold what stood there.
    EXPECT_EQ(itemText(*condition), "(4 name== op type=254 (5 field=b) (1 text=1))");
    EXPECT_EQ(itemText(*column), "(5 field=a)");
}

TEST(SecondAnalysis, LeavesListsWithoutAClauseAndLetsTheMapsGrow) {
    Analysed a(u"SELECT a FROM t WHERE b = 1");
    CFieldObject* const field = *a.query.m_fields.Find(u"a");
    a.again(u"SELECT a AS x FROM u");
    EXPECT_EQ(listText(a.query.m_whereItem->m_items), "(4 name== op type=254 (5 field=b) (1 text=1))");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t|u");
    EXPECT_EQ(keysOf(a.query.m_fields), "a|b");
    EXPECT_EQ(keysOf(a.query.m_aliases), "x");
    EXPECT_NE(*a.query.m_fields.Find(u"a"), field);
    EXPECT_EQ(field->m_field, u"a");
}

TEST(SecondAnalysis, KnowsTheAliasesOfTheFirst) {
    Analysed a(u"SELECT a AS X FROM t");
    a.again(u"SELECT x FROM t");
    EXPECT_EQ(listText(a.query.m_selectItems), "(5 text=x)");
}

}  // namespace
