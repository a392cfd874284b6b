// Columns, tables and clauses as the select state of MS Access reads them.
#include <gtest/gtest.h>

#include "tests/analysis/msaccess_analysed.h"

namespace {

std::string fieldText(const CFieldObject& field) {
    return field.m_table.toUtf8() + "|" + field.m_field.toUtf8() + "|" + field.m_aliasText.toUtf8() + "|" +
           std::to_string(field.m_hasTable) + std::to_string(field.m_aliasTarget);
}
std::string fieldText(const AccessAnalysed& a, std::u16string_view key) {
    const auto* const found = a.query.m_fields.Find(key);
    return found ? fieldText(**found) : "none";
}

// ------------------------------------------------------------------------------------------------ predicates

int predicateOf(std::u16string_view sql) {
    return AccessAnalysed(sql).query.m_predicate;
}

TEST(AccessPredicate, HasAValueForEachWord) {
    EXPECT_EQ(predicateOf(u"SELECT a FROM t"), 0);
    EXPECT_EQ(predicateOf(u"SELECT ALL a FROM t"), 1);
    EXPECT_EQ(predicateOf(u"SELECT DISTINCT a FROM t"), 2);
    EXPECT_EQ(predicateOf(u"SELECT DISTINCTROW a FROM t"), 3);
}

TEST(AccessPredicate, ATopLeavesNoTrace) {
    const AccessAnalysed a(u"SELECT TOP 5 a FROM t");
    EXPECT_EQ(a.query.m_predicate, 0);
    EXPECT_EQ(a.query.m_hasLimit, 0);
    EXPECT_EQ(a.selectItems(), "(5 field=a)");
    EXPECT_EQ(predicateOf(u"SELECT DISTINCT TOP 5 PERCENT a FROM t"), 2);
}

// -------------------------------------------------------------------------------------------- names of
// columns

TEST(AccessColumns, AColumnAlone) {
    const AccessAnalysed a(u"SELECT a FROM t");
    EXPECT_EQ(a.selectItems(), "(5 field=a)");
    EXPECT_EQ(keysOf(a.query.m_fields), "a_0");
    EXPECT_EQ(fieldText(a, u"a_0"), "|a||00");
}

TEST(AccessColumns, AColumnWithItsTable) {
    const AccessAnalysed a(u"SELECT t.a, t!b, [t x].[b c] FROM t, [t x]");
    EXPECT_EQ(a.selectItems(), "(5 table=t field=a) (5 table=t field=b) (5 table=t x field=b c)");
    EXPECT_EQ(keysOf(a.query.m_fields), "t xb c_0|ta_0|tb_0");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t|t x");
}

TEST(AccessColumns, AnAliasInFrontFillsTheAliasSideAlone) {
    const AccessAnalysed a(u"SELECT x.a FROM t AS x");
    EXPECT_EQ(a.selectItems(), "(5 field=a alias=x)");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t");
    EXPECT_EQ(keysOf(a.query.m_fields), "a_0");
    EXPECT_EQ(fieldText(a, u"a_0"), "|a|x|00");
}

TEST(AccessColumns, NamesAreComparedWithoutRegardToCase) {
    const AccessAnalysed a(u"SELECT X.a FROM t AS x WHERE x.b = 1");
    EXPECT_EQ(a.selectItems(), "(5 field=a alias=X)");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t");
}

TEST(AccessColumns, TheTableBehindAQueryReplacesIt) {
    EXPECT_EQ(AccessAnalysed(u"SELECT q.t.a FROM t").selectItems(), "(5 table=t field=a)");
    EXPECT_EQ(AccessAnalysed(u"SELECT q.x.a FROM t AS x").selectItems(), "(5 table=q field=a alias=x)");
    EXPECT_EQ(AccessAnalysed(u"SELECT x.t.a FROM t AS x").selectItems(), "(5 table=t field=a alias=x)");
}

TEST(AccessColumns, OfSeveralQueriesTheFirstCounts) {
    // In the pass ahead of the clauses such a column has neither table nor field.
    const AccessAnalysed a(u"SELECT p.q.t.a, x.q.y.b FROM t AS y, u AS x");
    EXPECT_EQ(a.selectItems(), "(5 table=t field=a) (5 field=b alias=y)");
    EXPECT_EQ(keysOf(a.query.m_fields), "b_0|ta_0");
}

TEST(AccessColumns, AnAsteriskWithoutADotIsATableAlone) {
    EXPECT_EQ(AccessAnalysed(u"SELECT q.t * FROM t").selectItems(), "(5 table=t)");
}

TEST(AccessColumns, ANameThatBeginsWithDigitsIsOneName) {
    const AccessAnalysed a(u"SELECT 2nd, 3rd.4th FROM 3rd");
    EXPECT_EQ(a.selectItems(), "(5 field=2nd) (5 table=3rd field=4th)");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "3rd");
}

TEST(AccessColumns, BackQuotesInsideOfBracketsAreTrimmed) {
    const AccessAnalysed a(u"SELECT [`t`].[`a`] AS [`b`] FROM [`t`]");
    EXPECT_EQ(a.selectItems(), "(4 name=AS op type=190 (5 table=t field=a) (1 text=b))");
    EXPECT_EQ(a.fromItems(), "(5 table=t)");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t");
    ASSERT_EQ(keysOf(a.query.m_aliases), "b");
    EXPECT_EQ((*a.query.m_aliases.Find(u"b"))->GetSrcName().toUtf8(), "`b`") << "the shown name stays";
}

TEST(AccessColumns, BracketsAreTrimmedNowhere) {
    EXPECT_EQ(AccessAnalysed(u"SELECT ['[a] FROM t").selectItems(), "(5 field='[a)");
}

TEST(AccessColumns, ANameIsSplitAtItsFirstFullStop) {
    // The preparation of the text leaves names with blanks alone.
    const AccessAnalysed a(u"SELECT [x.a b], [y.c d], [p.q.r s] FROM t AS x");
    EXPECT_EQ(a.selectItems(), "(5 field=a b alias=x) (5 field=c d) (5 field=q.r s)");
    EXPECT_EQ(fieldText(a, u"a b_0"), "|a b|x|00");
}

TEST(AccessColumns, ASplitNameBehindATable) {
    EXPECT_EQ(AccessAnalysed(u"SELECT t.[x.a b] FROM t, u AS x").selectItems(),
              "(5 table=t field=a b alias=x)");
}

// ------------------------------------------------------------------------------------------------- asterisks

TEST(AccessStar, OfAKnownTableExpandsToItsColumns) {
    AccessAnalysed a;
    a.addTable(u"t", {u"id", u"a"});
    a.analyse(u"SELECT t.*, b FROM t");
    EXPECT_EQ(a.selectItems(), "(5 table=t field=id) (5 table=t field=a) (5 field=b)");
    EXPECT_EQ(keysOf(a.query.m_fields), "b_0|t*_0|ta_0|tid_0");
    EXPECT_EQ(fieldText(a, u"tid_0"), "t|id||00");
}

TEST(AccessStar, OfAnUnknownTableStays) {
    const AccessAnalysed a(u"SELECT t.*, * FROM t");
    EXPECT_EQ(a.selectItems(), "(5 table=t field=*) (5 field=*)");
    EXPECT_EQ(keysOf(a.query.m_fields), "*_0|t*_0");
}

TEST(AccessStar, AloneOrBehindAnAliasStays) {
    AccessAnalysed a;
    a.addTable(u"t", {u"id"});
    a.analyse(u"SELECT *, x.* FROM t AS x");
    EXPECT_EQ(a.selectItems(), "(5 field=*) (5 field=* alias=x)");
}

TEST(AccessStar, OfAKnownQueryStays) {
    AccessAnalysed a;
    auto* known = new CZRQueryInfo;
    known->SetSrcName(u"q");
    known->SetDatabase(&a.database);
    a.database.Queries.AddTail(known);
    a.analyse(u"SELECT q.* FROM q");
    EXPECT_EQ(a.selectItems(), "(5 table=q field=*)");
    EXPECT_EQ(a.query.m_sourceTables.Find(u"q")->toUtf8(), known->GetID().toUtf8());
}

// A database of one table and two stored queries, the second on the first.
TEST(AccessStar, QueriesOnQueriesKeepTheirStarsAndFindWhatStandsBehindThem) {
    AccessAnalysed a;
    a.addTable(u"t", {u"id", u"price"});
    const auto store = [&a](const CString& name, const CString& sql) {
        auto* query = new CZRQueryInfo;
        a.database.Queries.AddTail(query);
        query->SetSrcName(name);
        query->SetDatabase(&a.database);
        query->SetSQL(sql);
        BuildQueryInfo(query, DB_MSACCESS);
        return query;
    };
    CZRQueryInfo* const first = store(u"q1", u"SELECT t.*, [price] * 2 AS dear, dear + 1 AS dearer FROM t");
    CZRQueryInfo* const second = store(u"q2", u"SELECT q1.*, q1.dearer FROM q1");
    a.analyse(u"SELECT q2.*, q2.id FROM q2");
    EXPECT_EQ(
        listText(first->m_selectItems),
        "(5 table=t field=id) (5 table=t field=price) (4 name=AS op type=190 (4 name=* op type=19 (5 "
        "field=price) (1 text=2)) (1 text=dear)) (4 name=AS op type=190 (4 name=+ op type=255 (10 field=dear "
        "(4 name=AS op type=190 (4 name=* op type=19 (5 field=price) (1 text=2)) (1 text=dear))) (1 text=1)) "
        "(1 text=dearer))");
    EXPECT_EQ(listText(second->m_selectItems), "(5 table=q1 field=*) (5 table=q1 field=dearer)");
    EXPECT_EQ(a.selectItems(), "(5 table=q2 field=*) (5 table=q2 field=id)");
    EXPECT_EQ(a.query.m_sourceTables.Find(u"q2")->toUtf8(), second->GetID().toUtf8());
    EXPECT_EQ(second->m_sourceTables.Find(u"q1")->toUtf8(), first->GetID().toUtf8());
    CZRSourceFildInfo* const id = a.query.FindField(u"q2", u"id");
    ASSERT_NE(id, nullptr);
    EXPECT_EQ(id->GetSrcName().toUtf8(), "id");
}

TEST(AccessStar, WithoutADatabaseStays) {
    CZRQueryInfo query;
    query.SetSQL(u"SELECT t.* FROM t");
    BuildQueryInfo(&query, DB_MSACCESS);
    EXPECT_EQ(listText(query.m_selectItems), "(5 table=t field=*)");
}

TEST(AccessStar, BearsTheNamesOfTheCatalogue) {
    AccessAnalysed a;
    a.addTable(u"Orders", {u"ID"});
    a.analyse(u"SELECT orders.* FROM orders");
    EXPECT_EQ(a.selectItems(), "(5 table=Orders field=ID)");
    EXPECT_EQ(keysOf(a.query.m_fields), "OrdersID_0|orders*_0");
}

TEST(AccessStar, OfATableWithoutColumnsLeavesNothing) {
    AccessAnalysed a;
    a.addTable(u"t", {});
    a.analyse(u"SELECT t.*, a FROM t");
    EXPECT_EQ(a.selectItems(), "(5 field=a)");
}

TEST(AccessStar, ExpandsWhereverAColumnStands) {
    AccessAnalysed a;
    a.addTable(u"t", {u"id", u"a"});
    a.analyse(u"SELECT Count(t.*) AS n FROM t");
    EXPECT_EQ(
        a.selectItems(),
        "(4 name=AS op type=190 (4 name=Count type=64 (5 table=t field=id) (5 table=t field=a)) (1 text=n))");
    // As the operand of the AS, that is: behind a function the operator is still the AS.
    EXPECT_EQ(keysOf(a.query.m_fields), "t*_0|ta_1|tid_1");
}

// ------------------------------------------------------------------------------------------ the map of
// columns

TEST(AccessFields, OneColumnMayStandTwice) {
    const AccessAnalysed a(u"SELECT a AS b, a + c AS d FROM t WHERE a = 1");
    EXPECT_EQ(keysOf(a.query.m_fields), "a_0|a_1|c_0");
    EXPECT_EQ(fieldText(a, u"a_1"), "|a||01");
    EXPECT_EQ(fieldText(a, u"a_0"), "|a||00");
}

TEST(AccessFields, BehindAnInnerOperatorTheOuterOneIsForgotten) {
    // The operator is back to none behind the sum, so c is no longer under the AS.
    const AccessAnalysed a(u"SELECT f(a + b, c) AS d FROM t");
    EXPECT_EQ(keysOf(a.query.m_fields), "a_0|b_0|c_0");
    EXPECT_EQ(keysOf(AccessAnalysed(u"SELECT f(c, a + b) AS d FROM t").query.m_fields), "a_0|b_0|c_0|c_1");
}

TEST(AccessFields, WhatAnAliasStandsForIsNotNotedTwice) {
    AccessAnalysed a;
    a.addTable(u"t", {u"id"});
    a.analyse(u"SELECT 1 FROM u INNER JOIN v ON u.a = v.b WHERE c IN (SELECT d FROM w)");
    EXPECT_EQ(keysOf(a.query.m_fields), "c_0|d_0|ua_0|vb_0");
}

// ---------------------------------------------------------------------------------------------- FROM and
// joins

TEST(AccessFrom, TablesWithAndWithoutAliases) {
    const AccessAnalysed a(u"SELECT a FROM t, u AS x, v y");
    EXPECT_EQ(
        a.fromItems(),
        "(5 table=t) (4 name=ALIAS op type=7 (5 table=u) (1 text=x)) (4 name=ALIAS op type=7 (5 table=v) (1 "
        "text=y))");
    EXPECT_EQ(keysOf(a.query.m_aliases), "x|y");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t|u|v");
}

TEST(AccessFrom, AQueryInFrontOfATable) {
    EXPECT_EQ(AccessAnalysed(u"SELECT a FROM q.t").fromItems(), "(5 table=t)");
    // Below an alias the first name counts.
    EXPECT_EQ(AccessAnalysed(u"SELECT a FROM q.t AS x").fromItems(),
              "(4 name=ALIAS op type=7 (5 table=q) (1 text=x))");
}

TEST(AccessFrom, ATableThatIsKnownAsAnAliasIsNoSource) {
    EXPECT_EQ(keysOf(AccessAnalysed(u"SELECT a FROM t AS u, q.u").query.m_sourceTables), "t");
}

TEST(AccessFrom, AQueryWithoutParenthesesIsOnlyNamed) {
    EXPECT_EQ(AccessAnalysed(u"SELECT a FROM SELECT b FROM t").fromItems(), "(0 name=select)");
}

TEST(AccessFrom, AJoinIsAnItemOfItsOwn) {
    EXPECT_EQ(
        AccessAnalysed(u"SELECT a FROM t LEFT OUTER JOIN u ON t.id = u.id").fromItems(),
        "(4 name=DEF_JOIN op (4 name=JOIN op type=168 (0 name=  op (5 table=t) (1 text=LEFT)) (5 table=u) (4 "
        "name=ON op type=241 (4 name== op type=101 (5 table=t field=id) (5 table=u field=id)))))");
}

TEST(AccessFrom, TheWordsOfAJoin) {
    const auto word = [](std::u16string_view join) {
        const AccessAnalysed a(u"SELECT a FROM t " + std::u16string(join) + u" JOIN u");
        const SelectItem& prefix = *a.query.m_fromItems.GetHead()->m_items.GetHead()->m_items.GetHead();
        return itemText(*prefix.m_items.GetTail());
    };
    EXPECT_EQ(word(u"INNER"), "(1 text=INNER)");
    EXPECT_EQ(word(u"Left"), "(1 text=Left)");
    EXPECT_EQ(word(u"RIGHT OUTER"), "(1 text=RIGHT)");
    EXPECT_EQ(word(u"CROSS"), "(1 text=CROSS)");
    EXPECT_EQ(word(u"NATURAL LEFT"), "(0 text=NATURAL)") << "no word of a join for the walk";
}

TEST(AccessFrom, AJoinInParenthesesLeavesNoItem) {
    const AccessAnalysed a(u"SELECT a FROM (t INNER JOIN u ON t.id = u.id)");
    EXPECT_EQ(a.fromItems(), "(4 name=DEF_JOIN op)");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t|u");
    EXPECT_EQ(keysOf(a.query.m_fields), "a_0|tid_0|uid_0");
}

TEST(AccessFrom, BehindAJoinInParenthesesTheNextOneStandsAlone) {
    const AccessAnalysed a(u"SELECT a FROM (t INNER JOIN u ON t.id=u.id) INNER JOIN v ON t.id=v.id");
    EXPECT_EQ(
        a.fromItems(),
        "(4 name=DEF_JOIN op (4 name=DEF_JOIN op (4 name=JOIN op type=168 (0 name=  op (1 text=INNER)) (5 "
        "table=v) (4 name=ON op type=241 (4 name== op type=101 (5 table=t field=id) (5 table=v "
        "field=id))))))");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t|u|v");
}

TEST(AccessFrom, JoinsInParenthesesToDepthTwelve) {
    std::u16string sql = u"SELECT a FROM " + std::u16string(12, u'(') + u"t0";
    std::string tables = "t0";
    for (int at = 1; at <= 12; ++at) {
        const std::string name = "t" + std::to_string(at);
        const std::u16string wide(name.begin(), name.end());
        sql += u" INNER JOIN " + wide + u" ON t0.id = " + wide + u".id)";
    }
    const AccessAnalysed a(sql + u" LEFT JOIN z ON t0.id = z.id");
    EXPECT_EQ(a.query.m_sourceTables.GetCount(), 14);
    EXPECT_EQ(a.query.m_fields.GetCount(), 15);
    ASSERT_EQ(a.query.m_fromItems.GetCount(), 1);
    EXPECT_EQ(a.query.m_fromItems.GetHead()->m_items.GetCount(), 1);
}

TEST(AccessFrom, AJoinOnTheRightIsAPartOfThePostfix) {
    const AccessAnalysed a(u"SELECT a FROM t LEFT JOIN u INNER JOIN v ON u.id = v.id ON t.id = u.id");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t|u|v");
    EXPECT_NE(a.fromItems().find("(0 name=  op (4 name=DEF_JOIN op (4 name=JOIN op"), std::string::npos)
        << a.fromItems();
}

// ------------------------------------------------------------------------------------------- the other
// clauses

TEST(AccessClauses, GroupHavingAndOrder) {
    const AccessAnalysed a(u"SELECT a FROM t GROUP BY a, b HAVING Count(*) > 1 ORDER BY a, b DESC");
    EXPECT_EQ(listText(a.query.m_groupItems), "(5 field=a) (5 field=b)");
    EXPECT_EQ(listText(a.query.m_havingItems),
              "(4 name=> op type=134 (4 name=Count type=64 (5 field=*)) (1 text=1))");
    EXPECT_EQ(listText(a.query.m_orderItems), "(5 field=a (0 text=DESC)) (5 field=b)")
        << "the word goes to the first item";
}

TEST(AccessClauses, BothWordsOfAnOrder) {
    EXPECT_EQ(listText(AccessAnalysed(u"SELECT a FROM t ORDER BY a ASC").query.m_orderItems),
              "(5 field=a (0 text=ASC))");
    EXPECT_EQ(listText(AccessAnalysed(u"SELECT a FROM t ORDER BY a DESC, b ASC").query.m_orderItems),
              "(5 field=a (0 text=DESC) (0 text=ASC)) (5 field=b)");
}

TEST(AccessClauses, ComputeForAndOptionLeaveNothing) {
    const AccessAnalysed a(u"SELECT a FROM t COMPUTE Sum(b) BY c FOR BROWSE OPTION FAST 10");
    EXPECT_EQ(a.selectItems(), "(5 field=a)");
    EXPECT_EQ(listText(a.query.m_orderItems), "");
    EXPECT_EQ(keysOf(a.query.m_fields), "a_0|b_0|c_0") << "the pass ahead of the clauses reads them";
}

TEST(AccessClauses, ASecondAnalysisRefillsTheLists) {
    AccessAnalysed a(u"SELECT a FROM t WHERE b = 1");
    const SelectItem* const where = a.query.m_whereItem;
    a.analyse(u"SELECT c FROM u WHERE d = 2");
    EXPECT_EQ(a.selectItems(), "(5 field=c)");
    EXPECT_EQ(a.whereItems(), "(4 name== op type=101 (5 field=d) (1 text=2))");
    EXPECT_EQ(a.query.m_whereItem, where);
}

TEST(AccessClauses, ASelectListThatDoesNotParseLeavesTheClauses) {
    const AccessAnalysed a(u"SELECT FROM t WHERE a = 1");
    EXPECT_EQ(a.selectItems(), "");
    EXPECT_EQ(a.fromItems(), "(5 table=t)");
    EXPECT_EQ(a.whereItems(), "(4 name== op type=101 (5 field=a) (1 text=1))");
}

TEST(AccessClauses, TextWithoutASelectLeavesTheQueryAsItWas) {
    for (const char16_t* sql : {u"", u"hello", u"INSERT INTO t VALUES (1)", u"(SELECT a FROM t)"}) {
        const AccessAnalysed a(sql);
        EXPECT_EQ(a.selectItems(), "");
        EXPECT_TRUE(a.query.m_sourceTables.IsEmpty());
        EXPECT_EQ(a.query.m_whereItem, nullptr);
    }
}

}  // namespace
