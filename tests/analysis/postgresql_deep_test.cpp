// PostgreSQL queries that are deep, long or wide, on a machine stack that recursion would overrun.
#include <gtest/gtest.h>

#include <string>

#include "tests/analysis/postgresql_analysed.h"
#include "tests/parser/small_stack.h"

namespace {

using Pg = PostgresqlAnalysed;

std::u16string repeated(int count, std::u16string_view text) {
    std::u16string all;
    for (int i = 0; i < count; ++i) all += text;
    return all;
}

int depthOf(const CList<SelectItem*>& items) {
    int depth = 0;
    for (const CList<SelectItem*>* at = &items; !at->IsEmpty(); at = &at->GetHead()->m_items) ++depth;
    return depth;
}

TEST(DeepPostgresqlQueries, AChainOfTenThousandOperators) {
    onSmallStack([] {
        const Pg a(u"SELECT a" + repeated(10'000, u" + a") + u" FROM t");
        EXPECT_EQ(depthOf(a.query.m_selectItems), 10'001);
    });
}

TEST(DeepPostgresqlQueries, AChainOfTenThousandConditions) {
    onSmallStack([] {
        const Pg a(u"SELECT a FROM t WHERE b = 1" + repeated(10'000, u" AND b = 1"));
        ASSERT_NE(a.query.m_whereItem, nullptr);
        EXPECT_EQ(depthOf(a.query.m_whereItem->m_items), 10'002);
    });
}

TEST(DeepPostgresqlQueries, AConcatenationOfTenThousandParts) {
    onSmallStack([] {
        const Pg a(u"SELECT a" + repeated(9'999, u" || a") + u" FROM t");
        ASSERT_EQ(a.query.m_selectItems.GetCount(), 1);
        EXPECT_EQ(a.query.m_selectItems.GetHead()->m_items.GetCount(), 10'000);
    });
}

TEST(DeepPostgresqlQueries, TenThousandParentheses) {
    onSmallStack([] {
        const Pg a(u"SELECT " + repeated(10'000, u"(") + u"a" + repeated(10'000, u")") + u" FROM t");
        EXPECT_EQ(a.select(), "(5 field=a)");
        EXPECT_EQ(a.from(), "(5 table=t)");
    });
}

TEST(DeepPostgresqlQueries, TenThousandCasts) {
    onSmallStack([] {
        const Pg a(u"SELECT " + repeated(10'000, u"CAST(") + u"a" + repeated(10'000, u" AS int)") +
                   u" FROM t");
        EXPECT_EQ(depthOf(a.query.m_selectItems), 20'001);
        EXPECT_EQ(a.from(), "(5 table=t)");
    });
}

TEST(DeepPostgresqlQueries, AThousandNestedQueries) {
    onSmallStack([] {
        const Pg a(repeated(1'000, u"SELECT a FROM t WHERE b IN (") + u"SELECT 1" + repeated(1'000, u")"));
        int depth = 0;
        for (const CZRQueryInfo* at = &a.query; at->m_whereItem; ++depth)
            at = dynamic_cast<const SelectItemSubQuery&>(
                     *at->m_whereItem->m_items.GetHead()->m_items.GetTail())
                     .m_query;
        EXPECT_EQ(depth, 1'000);
    });
}

TEST(DeepPostgresqlQueries, ATwoThousandfoldUnion) {
    onSmallStack([] {
        const Pg a(repeated(1'999, u"SELECT a FROM t UNION ") + u"SELECT a FROM t");
        int branches = 1;
        for (const CZRQueryInfo* at = &a.query; !at->m_unionItems.IsEmpty(); ++branches)
            at = dynamic_cast<const SelectItemUnion&>(*at->m_unionItems.GetHead()).m_query;
        EXPECT_EQ(branches, 2'000);
    });
}

TEST(DeepPostgresqlQueries, TenThousandRowsOfAnInsert) {
    onSmallStack([] {
        const Pg a(u"INSERT INTO t (a) VALUES (b)" + repeated(9'999, u", (b)"));
        EXPECT_EQ(keysOf(a.query.m_sourceTables), "t");
        EXPECT_EQ(keysOf(a.query.m_fields), "b");
    });
}

}  // namespace
