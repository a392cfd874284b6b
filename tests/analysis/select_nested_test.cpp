// Sub-queries and unions, on real SQL Server text.
#include <gtest/gtest.h>

#include "tests/analysis/analysed.h"
#include "tests/analysis/descriptor_text.h"

namespace {

const CZRQueryInfo& subQueryOf(const SelectItem& item) {
    return *dynamic_cast<const SelectItemSubQuery&>(item).m_query;
}
const CZRQueryInfo& branchOf(const CZRQueryInfo& query) {
    return *dynamic_cast<const SelectItemUnion&>(*query.m_unionItems.GetHead()).m_query;
}

TEST(SubQueries, OutsideTheFirstClauseTheQueryIsAnalysedWhole) {
    const Analysed a(u"SELECT a FROM t WHERE b IN (SELECT c FROM u WHERE d = 1)");
    EXPECT_EQ(listText(a.query.m_selectItems), "(5 field=a)");
    ASSERT_NE(a.query.m_whereItem, nullptr);
    EXPECT_EQ(listText(a.query.m_whereItem->m_items),
              "(4 name=IN op type=134 (5 field=b) (6 name=SUB_QUERY query))");
    const CZRQueryInfo& nested = subQueryOf(*a.query.m_whereItem->m_items.GetHead()->m_items.GetTail());
    EXPECT_EQ(nested.DataType, 8);
    EXPECT_EQ(nested.m_database, &a.database);
    EXPECT_EQ(listText(nested.m_selectItems), "(5 field=c)");
    EXPECT_EQ(listText(nested.m_fromItems), "(5 table=u)");
    EXPECT_EQ(listText(nested.m_whereItem->m_items), "(4 name== op type=254 (5 field=d) (1 text=1))");
    EXPECT_TRUE(a.query.m_subQueries.IsEmpty());
}

TEST(SubQueries, KnowTheSourcesOfTheQueryAroundThem) {
    const Analysed a(u"SELECT a AS x FROM t AS y WHERE b IN (SELECT x FROM u WHERE y.c = d)");
    const CZRQueryInfo& nested = subQueryOf(*a.query.m_whereItem->m_items.GetHead()->m_items.GetTail());
    EXPECT_EQ(keysOf(nested.m_aliases), "x|y");
    EXPECT_EQ(keysOf(nested.m_sourceTables), "t|u");
    EXPECT_EQ(keysOf(nested.m_fields), "a|b|c|d");
    EXPECT_EQ(listText(nested.m_selectItems), "(5 text=x)");
    EXPECT_EQ(listText(nested.m_whereItem->m_items),
              "(4 name== op type=254 (5 text=y field=c alias=y) (5 field=d))");
    // Copies, not the same objects; an alias keeps its identity.
    const CZRAliasInfo* const outer = *a.query.m_aliases.Find(u"x");
    const CZRAliasInfo* const inner = *nested.m_aliases.Find(u"x");
    EXPECT_NE(inner, outer);
    EXPECT_NE(inner->Expression, outer->Expression);
    EXPECT_EQ(inner->ID, outer->ID);
    EXPECT_NE(*nested.m_fields.Find(u"a"), *a.query.m_fields.Find(u"a"));
}

TEST(SubQueries, WhatTheyReadStaysInTheirOwnDescriptor) {
    const Analysed a(u"SELECT a FROM t WHERE b IN (SELECT c FROM u WHERE d = 1)");
    EXPECT_EQ(keysOf(a.query.m_fields), "a|b|c");
    EXPECT_EQ(keysOf(subQueryOf(*a.query.m_whereItem->m_items.GetHead()->m_items.GetTail()).m_fields),
              "a|b|c|d");
}

TEST(SubQueries, HaveAnIdentityOfTheirOwn) {
    const Analysed a(u"SELECT a FROM t WHERE b IN (SELECT c FROM u)");
    EXPECT_NE(subQueryOf(*a.query.m_whereItem->m_items.GetHead()->m_items.GetTail()).ID, a.query.ID);
}

TEST(SubQueries, NestInEachOther) {
    const Analysed a(u"SELECT a FROM t WHERE b IN (SELECT c FROM u WHERE d IN (SELECT TOP 3 e FROM v))");
    const CZRQueryInfo& outer = subQueryOf(*a.query.m_whereItem->m_items.GetHead()->m_items.GetTail());
    const CZRQueryInfo& inner = subQueryOf(*outer.m_whereItem->m_items.GetHead()->m_items.GetTail());
    EXPECT_EQ(listText(inner.m_selectItems), "(5 field=e)");
    EXPECT_EQ(inner.m_limitCount, 3);
    EXPECT_EQ(a.query.m_hasLimit, 0);
    EXPECT_EQ(outer.m_hasLimit, 0);
}

TEST(Unions, AChainComesOutNested) {
    const Analysed a(u"SELECT a FROM t UNION SELECT b FROM u UNION SELECT c FROM v");
    ASSERT_EQ(listText(a.query.m_unionItems), "(8 name=UNION query)");
    const CZRQueryInfo& second = branchOf(a.query);
    EXPECT_EQ(second.DataType, 8);
    EXPECT_EQ(listText(second.m_selectItems), "(5 field=b)");
    ASSERT_EQ(listText(second.m_unionItems), "(8 name=UNION query)");
    const CZRQueryInfo& third = branchOf(second);
    EXPECT_EQ(listText(third.m_selectItems), "(5 field=c)");
    EXPECT_EQ(listText(third.m_fromItems), "(5 table=v)");
    EXPECT_TRUE(third.m_unionItems.IsEmpty());
}

TEST(Unions, UnionAllTakesTheDistinctOfTheOuterQuery) {
    EXPECT_EQ(Analysed(u"SELECT DISTINCT a FROM t UNION SELECT b FROM u").query.m_predicate, 2);
    const Analysed all(u"SELECT DISTINCT a FROM t UNION ALL SELECT DISTINCT b FROM u");
    EXPECT_EQ(all.query.m_predicate, 0);
    EXPECT_EQ(branchOf(all.query).m_predicate, 2);
    EXPECT_EQ(listText(branchOf(all.query).m_selectItems), "(5 field=b)");
}

TEST(Unions, ABranchKnowsTheSourcesOfTheQuery) {
    const Analysed a(u"SELECT a AS x FROM t UNION SELECT x FROM u");
    EXPECT_EQ(keysOf(branchOf(a.query).m_aliases), "x");
    EXPECT_EQ(listText(branchOf(a.query).m_selectItems), "(5 text=x)");
    EXPECT_EQ(keysOf(branchOf(a.query).m_sourceTables), "t|u");
}

}  // namespace
