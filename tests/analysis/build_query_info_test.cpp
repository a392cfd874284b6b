#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "tests/analysis/analysed.h"
#include "tests/analysis/descriptor_text.h"

namespace {

void expectUntouched(const CZRQueryInfo& query) {
    EXPECT_EQ(keysOf(query.m_aliases) + keysOf(query.m_sourceTables) + keysOf(query.m_fields), "");
    EXPECT_EQ(listText(query.m_selectItems) + listText(query.m_fromItems), "");
    EXPECT_EQ(query.m_whereItem, nullptr);
    EXPECT_TRUE(query.m_subQueries.IsEmpty());
    EXPECT_EQ(query.m_predicate, 0);
    EXPECT_EQ(query.m_hasLimit, 0);
}

TEST(BuildQueryInfo, AnUnknownKindDoesNothing) {
    for (const int kind : {-1, 0, 3, 4, 6, 7, 9, 15, 17, 19, 21, 1000})
        expectUntouched(Analysed(u"SELECT DISTINCT a FROM t WHERE b = 1", static_cast<DBTypes>(kind)).query);
}

TEST(BuildQueryInfo, BothKindsOfSqlServerGiveTheSame) {
    constexpr const char16_t* kSql =
        u"SELECT DISTINCT a AS x, t.b FROM t JOIN u ON t.c = u.d WHERE e IN (SELECT f FROM v)";
    const Analysed eight(kSql, DB_MSSQL), twenty(kSql, DB_MSSQL_20);
    EXPECT_NE(listText(eight.query.m_selectItems), "");
    EXPECT_EQ(listText(eight.query.m_selectItems), listText(twenty.query.m_selectItems));
    EXPECT_EQ(listText(eight.query.m_fromItems), listText(twenty.query.m_fromItems));
    EXPECT_EQ(listText(eight.query.m_whereItem->m_items), listText(twenty.query.m_whereItem->m_items));
    EXPECT_EQ(keysOf(eight.query.m_fields), keysOf(twenty.query.m_fields));
    EXPECT_EQ(keysOf(eight.query.m_sourceTables), keysOf(twenty.query.m_sourceTables));
    EXPECT_EQ(eight.query.m_predicate, twenty.query.m_predicate);
}

TEST(BuildQueryInfo, ANestedSelectInTheSelectListEndsTheAnalysis) {
    const Analysed a(u"SELECT (SELECT 1) FROM t");
    EXPECT_TRUE(a.query.m_selectItems.IsEmpty());
    EXPECT_TRUE(a.query.m_fromItems.IsEmpty());
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "");
    ASSERT_EQ(a.query.m_subQueries.GetCount(), 1);
    EXPECT_EQ(a.query.m_subQueries.GetHead()->m_database, &a.database);
}

TEST(BuildQueryInfo, APredicateHidesTheNestedSelectsOfTheSelectList) {
    // Only the first clause is looked at for them.
    const Analysed a(u"SELECT DISTINCT (SELECT 1) FROM t");
    EXPECT_TRUE(a.query.m_subQueries.IsEmpty());
    EXPECT_EQ(listText(a.query.m_fromItems), "(5 table=t)");
    EXPECT_EQ(a.query.m_predicate, 2);
}

TEST(BuildQueryInfo, ANestedSelectOutsideTheSelectListIsAnalysedWithTheQuery) {
    const Analysed a(u"SELECT a FROM t WHERE b IN (SELECT c FROM u)");
    EXPECT_EQ(listText(a.query.m_selectItems), "(5 field=a)");
    EXPECT_EQ(listText(a.query.m_fromItems), "(5 table=t)");
    ASSERT_NE(a.query.m_whereItem, nullptr);
    EXPECT_TRUE(a.query.m_subQueries.IsEmpty());
}

TEST(BuildQueryInfo, PutsTheIdOfKnownSourcesIntoTheMap) {
    Analysed a(u"");
    auto table = std::make_unique<TestTable>(u"Orders");
    const CString id = table->GetID();
    a.database.Tables.AddTail(table.release());
    a.again(u"SELECT a FROM orders JOIN other ON x = y WHERE b IN (SELECT c FROM orders)");
    EXPECT_EQ(*a.query.m_sourceTables.Find(u"orders"), id);
    EXPECT_EQ(*a.query.m_sourceTables.Find(u"other"), u"other");
    const auto& item =
        dynamic_cast<const SelectItemSubQuery&>(*a.query.m_whereItem->m_items.GetHead()->m_items.GetTail());
    EXPECT_EQ(*item.m_query->m_sourceTables.Find(u"orders"), id);
}

TEST(BuildQueryInfo, WrongSqlLeavesTheQueryAsItWas) {
    for (const std::u16string_view sql :
         {std::u16string_view(u""), std::u16string_view(u"   "), std::u16string_view(u"word"),
          std::u16string_view(u"UPDATE t SET a = 1"), std::u16string_view(u"'"),
          std::u16string_view(u"\xd800\xdc00\xdfff"), std::u16string_view(u"\0\x01\x02\xffff", 4)}) {
        const Analysed a(sql);
        expectUntouched(a.query);
    }
}

TEST(BuildQueryInfo, WrongSqlKeepsAnEarlierAnalysis) {
    Analysed a(u"SELECT a FROM t");
    a.again(u"no query at all");
    EXPECT_EQ(listText(a.query.m_selectItems), "(5 field=a)");
}

TEST(BuildQueryInfo, AWrongSelectListLeavesTheClausesBehindIt) {
    const Analysed a(u"SELECT FROM t WHERE a = 1");
    EXPECT_TRUE(a.query.m_selectItems.IsEmpty());
    EXPECT_EQ(listText(a.query.m_fromItems), "(5 table=t)");
    ASSERT_NE(a.query.m_whereItem, nullptr);
    EXPECT_EQ(listText(a.query.m_whereItem->m_items), "(4 name== op type=254 (5 field=a) (1 text=1))");
}

TEST(BuildQueryInfo, NeverThrowsOnATextThatIsCutAnywhere) {
    constexpr std::u16string_view kSql =
        u"SELECT TOP (5) WITHTIES CAST(a AS VARCHAR(10)) AS [x y], {fn UCASE('b''c')}, N'\xd83d\xde00' FROM "
        u"(t AS u INNER "
        u"JOIN dbo.v ON u.a = v.b) WHERE a BETWEEN 1 AND 2 OR c IN (SELECT d FROM w WHERE e = f (+)) GROUP "
        u"BY a HAVING "
        u"COUNT(*) > 1 ORDER BY a DESC UNION ALL SELECT g FROM h";
    for (std::size_t length = 0; length <= kSql.size(); ++length) {
        EXPECT_NO_THROW(Analysed{kSql.substr(0, length)}) << length;
        EXPECT_NO_THROW(Analysed{kSql.substr(length)}) << length;
    }
}

TEST(BuildQueryInfo, TakesAMegabyteOfBlanks) {
    const Analysed a(u"SELECT" + std::u16string(1 << 20, u' ') + u"a");
    EXPECT_EQ(listText(a.query.m_selectItems), "(5 field=a)");
    expectUntouched(Analysed(std::u16string(1 << 20, u' ')).query);
}

TEST(BuildQueryInfo, LeavesTheTextAlone) {
    const Analysed a(u"SELECT a FROM t");
    EXPECT_EQ(a.query.GetSQL(), u"SELECT a FROM t");
}

TEST(BuildQueryInfo, WorksWithoutADatabase) {
    CZRQueryInfo query;
    query.SetSQL(u"SELECT dbo.f(a) FROM t WHERE b IN (SELECT c FROM u)");
    BuildQueryInfo(&query, DB_MSSQL);
    EXPECT_EQ(listText(query.m_selectItems), "(7 name=f type=249 (5 field=a))");
}

TEST(BuildQueryInfo, ANullQueryDoesNothing) {
    EXPECT_NO_THROW(BuildQueryInfo(nullptr, DB_MSSQL));
}

}  // namespace
