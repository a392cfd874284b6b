// Queries that are deep, long or wide, on a machine stack that recursion would overrun.
#include <gtest/gtest.h>

#include <string>

#include "tests/analysis/analysed.h"
#include "tests/analysis/descriptor_text.h"
#include "tests/parser/small_stack.h"

namespace {

std::u16string repeated(int count, std::u16string_view text) {
    std::u16string all;
    for (int i = 0; i < count; ++i) all += text;
    return all;
}

// Deletes the descriptor on the small stack as well.
template <class Check>
void analyseOnSmallStack(const std::u16string& sql, Check check) {
    onSmallStack([&] {
        const Analysed a(sql);
        check(a.query);
    });
}

constexpr int kDepth = 1'000;
constexpr int kBranches = 2'000;

int depthOf(const SelectItem* item) {
    int depth = 1;
    while (!item->m_items.IsEmpty()) {
        item = item->m_items.GetHead();
        ++depth;
    }
    return depth;
}

TEST(DeepQueries, AChainOfTenThousandConditions) {
    analyseOnSmallStack(u"SELECT a FROM t WHERE b = 1" + repeated(10'000, u" AND b = 1"),
                        [](const CZRQueryInfo& query) {
                            ASSERT_NE(query.m_whereItem, nullptr);
                            ASSERT_EQ(query.m_whereItem->m_items.GetCount(), 1);
                            EXPECT_EQ(depthOf(query.m_whereItem->m_items.GetHead()), 10'002);
                        });
}

TEST(DeepQueries, AChainOfTenThousandOperators) {
    analyseOnSmallStack(u"SELECT a" + repeated(10'000, u" + a") + u" FROM t", [](const CZRQueryInfo& query) {
        ASSERT_EQ(query.m_selectItems.GetCount(), 1);
        EXPECT_EQ(depthOf(query.m_selectItems.GetHead()), 10'001);
    });
}

TEST(DeepQueries, AThousandNestedSubQueries) {
    analyseOnSmallStack(u"SELECT a FROM t WHERE b IN (" + repeated(kDepth, u"SELECT a FROM t WHERE b IN (") +
                            u"1" + repeated(kDepth + 1, u")"),
                        [](const CZRQueryInfo& query) {
                            int depth = 0;
                            for (const CZRQueryInfo* at = &query; at && at->m_whereItem;) {
                                const SelectItem* const last =
                                    at->m_whereItem->m_items.GetHead()->m_items.GetTail();
                                const auto* const nested = dynamic_cast<const SelectItemSubQuery*>(last);
                                at = nested ? nested->m_query : nullptr;
                                depth += nested != nullptr;
                            }
                            EXPECT_EQ(depth, kDepth);
                        });
}

TEST(DeepQueries, AThousandNestedCalls) {
    analyseOnSmallStack(u"SELECT " + repeated(1'000, u"ABS(") + u"a" + repeated(1'000, u")") + u" FROM t",
                        [](const CZRQueryInfo& query) {
                            ASSERT_EQ(query.m_selectItems.GetCount(), 1);
                            EXPECT_EQ(depthOf(query.m_selectItems.GetHead()), 1'001);
                        });
}

TEST(DeepQueries, AChainOfTwoThousandUnions) {
    analyseOnSmallStack(
        u"SELECT a FROM t" + repeated(kBranches, u" UNION SELECT a FROM t"), [](const CZRQueryInfo& query) {
            int depth = 0;
            for (const CZRQueryInfo* at = &query; !at->m_unionItems.IsEmpty(); ++depth)
                at = dynamic_cast<const SelectItemUnion&>(*at->m_unionItems.GetHead()).m_query;
            EXPECT_EQ(depth, kBranches);
        });
}

TEST(DeepQueries, TenThousandSelectItems) {
    analyseOnSmallStack(u"SELECT a" + repeated(10'000, u", a") + u" FROM t", [](const CZRQueryInfo& query) {
        EXPECT_EQ(query.m_selectItems.GetCount(), 10'001);
        EXPECT_EQ(keysOf(query.m_fields), "a");
    });
}

TEST(DeepQueries, FiveHundredJoins) {
    analyseOnSmallStack(u"SELECT a FROM t" + repeated(500, u" JOIN t ON b = c"),
                        [](const CZRQueryInfo& query) {
                            EXPECT_FALSE(query.m_fromItems.IsEmpty());
                            EXPECT_EQ(keysOf(query.m_fields), "a|b|c");
                        });
}

TEST(DeepQueries, AThousandNestedSelectsInTheSelectList) {
    analyseOnSmallStack(u"SELECT " + repeated(1'000, u"(SELECT ") + u"1" + repeated(1'000, u")"),
                        [](const CZRQueryInfo& query) { EXPECT_EQ(query.m_subQueries.GetCount(), 1'000); });
}

}  // namespace
