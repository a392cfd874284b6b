#include "zrparsersql/query_text.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "tests/analysis/analysed.h"
#include "tests/parser/small_stack.h"

namespace {

TEST(FindJoinPart, IsTheFirstPieceWithAJoin) {
    EXPECT_EQ(FindJoinPart(u"a, b JOIN c, d JOIN e"), u" b JOIN c");
    EXPECT_EQ(FindJoinPart(u"a JOIN b, c"), u"a JOIN b");
}

TEST(FindJoinPart, IsTheLastPieceWhereNoneHasOne) {
    EXPECT_EQ(FindJoinPart(u"a, b"), u" b");
    EXPECT_EQ(FindJoinPart(u"a"), u"a");
    EXPECT_EQ(FindJoinPart(u"a,"), u"");
    EXPECT_EQ(FindJoinPart(u""), u"");
}

TEST(FindJoinPart, MindsTheCase) {
    EXPECT_EQ(FindJoinPart(u"a join b, c"), u" c");
}

TEST(FindJoinPart, TakesAnyNumberOfPieces) {
    onSmallStack([] { EXPECT_EQ(FindJoinPart(CString(std::u16string(1'000'000, u',') + u"x")), u"x"); });
}

TEST(FindFromPosition, IsTheRightmostWithoutAWhereToItsLeft) {
    EXPECT_EQ(FindFromPosition(u"SELECT a FROM t"), 9);
    EXPECT_EQ(FindFromPosition(u"SELECT a FROM t WHERE b = 1"), 9);
    EXPECT_EQ(FindFromPosition(u"SELECT (SELECT b FROM u) FROM t"), 25);
    EXPECT_EQ(FindFromPosition(u"SELECT a FROM t WHERE b IN (SELECT c FROM u)"), 9);
}

TEST(FindFromPosition, PassesOverOneAtTheVeryEnd) {
    EXPECT_EQ(FindFromPosition(u"SELECT a FROM t, FROM"), 9);
    EXPECT_EQ(FindFromPosition(u"SELECT a FROM"), -1);
}

TEST(FindFromPosition, IsMinusOneWithoutAny) {
    EXPECT_EQ(FindFromPosition(u""), -1);
    EXPECT_EQ(FindFromPosition(u"SELECT a from t"), -1);
    EXPECT_EQ(FindFromPosition(u"WHERE a FROM t"), -1);
}

TEST(FindFromPosition, TakesAnyNumberOfCandidates) {
    onSmallStack([] {
        std::u16string text = u"x FROM t WHERE";
        for (int i = 0; i < 100'000; ++i) text += u" FROM";
        EXPECT_EQ(FindFromPosition(CString(text)), 2);
    });
}

TEST(GetFromClauseText, EndsAtTheNextClause) {
    EXPECT_EQ(GetFromClauseText(u"SELECT a FROM t"), u"t");
    EXPECT_EQ(GetFromClauseText(u"SELECT a FROM t, u WHERE b = 1"), u"t, u ");
    EXPECT_EQ(GetFromClauseText(u"SELECT a FROM t ORDER BY b"), u"t ");
}

TEST(GetFromClauseText, TriesTheWordsInTheirOrderAndNotByPosition) {
    EXPECT_EQ(GetFromClauseText(u"SELECT a FROM t OPTION x GROUP BY b"), u"t OPTION x ");
}

TEST(GetFromClauseText, KnowsComputeUnderItsWrongName) {
    EXPECT_EQ(GetFromClauseText(u"SELECT a FROM t COMRUTE x"), u"t ");
    EXPECT_EQ(GetFromClauseText(u"SELECT a FROM t COMPUTE x"), u"t COMPUTE x");
}

TEST(GetFromClauseText, IsEmptyWithoutAFromClause) {
    EXPECT_EQ(GetFromClauseText(u"SELECT a"), u"");
    EXPECT_EQ(GetFromClauseText(u""), u"");
}

TEST(Utf8ToWide, GivesUtf16) {
    EXPECT_EQ(Utf8ToWide("a\xc3\xa9\xf0\x9f\x98\x80"), u"a\u00e9\U0001F600");
    EXPECT_EQ(Utf8ToWide(""), u"");
    EXPECT_EQ(Utf8ToWide(nullptr), u"");
}

TEST(SplitUnions, GivesARecordForEachBranch) {
    CZRQueryInfo query;
    SplitUnions(u"a UNION b UNION ALL c", &query);
    ASSERT_EQ(query.m_unions.GetCount(), 3);
    POSITION at = query.m_unions.GetHeadPosition();
    const CZRQueryUnionInfo* record = query.m_unions.GetNext(at);
    EXPECT_EQ(record->UnionKind, 0);
    EXPECT_EQ(record->Query->GetSQL(), u"a");
    EXPECT_EQ(record->Text, u"");
    record = query.m_unions.GetNext(at);
    EXPECT_EQ(record->UnionKind, 1);
    EXPECT_EQ(record->Query->GetSQL(), u"b");
    record = query.m_unions.GetNext(at);
    EXPECT_EQ(record->UnionKind, CZRQueryUnionInfo().UnionKind);
    // The blank behind UNION ALL stays with the branch.
    EXPECT_EQ(record->Query->GetSQL(), u" c");
}

TEST(SplitUnions, OfATextWithoutUnionAppendsNothing) {
    CZRQueryInfo query;
    SplitUnions(u"SELECT a FROM t", &query);
    SplitUnions(u"", &query);
    SplitUnions(u"a union b", &query);
    EXPECT_TRUE(query.m_unions.IsEmpty());
}

TEST(SplitUnions, MakesLineEndsBlanksAndTrimsTheEnd) {
    CZRQueryInfo query;
    SplitUnions(u"a\r\nb \r\nUNION c\nd \t", &query);
    ASSERT_EQ(query.m_unions.GetCount(), 2);
    EXPECT_EQ(query.m_unions.GetHead()->Query->GetSQL(), u"a b");
    EXPECT_EQ(query.m_unions.GetTail()->Query->GetSQL(), u"c\nd");
}

TEST(SplitUnions, OfATextThatEndsInUnionHasNoBranchBehindIt) {
    CZRQueryInfo query;
    SplitUnions(u"a UNION", &query);
    ASSERT_EQ(query.m_unions.GetCount(), 1);
    EXPECT_EQ(query.m_unions.GetHead()->Query->GetSQL(), u"a");
}

TEST(SplitUnions, BranchesAreCopiesOfTheQueryAsItCame) {
    TestDatabase database;
    CZRQueryInfo query;
    query.SetDatabase(&database);
    query.SetName(u"q");
    query.m_sourceTables.SetAt(u"t", u"id");
    SplitUnions(u"a UNION b", &query);
    for (const CZRQueryUnionInfo* record : query.m_unions) {
        EXPECT_EQ(record->Query->GetName(), u"q");
        EXPECT_EQ(record->Query->ID, query.ID);
        EXPECT_EQ(record->Query->m_database, &database);
        EXPECT_TRUE(record->Query->m_sourceTables.Contains(u"t"));
        EXPECT_TRUE(record->Query->m_unions.IsEmpty());
    }
    EXPECT_EQ(query.GetSQL(), u"");
}

TEST(SplitUnions, TakesThousandsOfBranches) {
    std::u16string text = u"a";
    for (int i = 0; i < 5'000; ++i) text += u" UNION a";
    CZRQueryInfo query;
    SplitUnions(CString(text), &query);
    EXPECT_EQ(query.m_unions.GetCount(), 5'001);
}

TEST(ResolveKnownSources, PutsIdsInHereAndInNestedQueries) {
    TestDatabase database;
    auto table = std::make_unique<TestTable>(u"T");
    const CString id = table->GetID();
    database.Tables.AddTail(table.release());
    CZRQueryInfo query;
    query.SetDatabase(&database);
    query.m_sourceTables.SetAt(u"t", u"t");
    auto* const nested = new CZRQueryInfo;
    nested->SetDatabase(&database);
    nested->m_sourceTables.SetAt(u"t", u"t");
    query.m_subQueries.AddTail(nested);
    ResolveKnownSources(&query);
    EXPECT_EQ(*query.m_sourceTables.Find(u"t"), id);
    EXPECT_EQ(*nested->m_sourceTables.Find(u"t"), id);
}

TEST(ResolveKnownSources, EmptiesTheValueOfAnUnknownSource) {
    TestDatabase database;
    CZRQueryInfo query;
    query.SetDatabase(&database);
    query.m_sourceTables.SetAt(u"t", u"t");
    ResolveKnownSources(&query);
    EXPECT_EQ(*query.m_sourceTables.Find(u"t"), u"");
}

}  // namespace
