// Aliases of MS Access queries with what they stand for, nested queries and unions.
#include <gtest/gtest.h>
#include <malloc.h>

#include <chrono>

#include "analysis/driver.h"
#include "analysis/msaccess_state.h"
#include "tests/analysis/hand_made_tree.h"
#include "tests/analysis/msaccess_analysed.h"
#include "tests/parser/parsed.h"
#include "tests/parser/small_stack.h"

namespace {

const CZRQueryInfo& subQueryOf(const SelectItem& item) {
    return *dynamic_cast<const SelectItemSubQuery&>(item).m_query;
}
const CZRQueryInfo& branchOf(const CZRQueryInfo& query) {
    return *dynamic_cast<const SelectItemUnion&>(*query.m_unionItems.GetHead()).m_query;
}

// --------------------------------------------------------------------------------------- what an alias
// stands for

TEST(AccessAliases, KeepTheirExpression) {
    const AccessAnalysed a(u"SELECT a + 1 AS [B c] FROM t AS x");
    EXPECT_EQ(keysOf(a.query.m_aliases), "b c|x");
    EXPECT_EQ(a.expression(u"b c"),
              "(4 name=AS op type=190 (4 name=+ op type=255 (5 field=a) (1 text=1)) (1 text=B c))");
    EXPECT_EQ(a.expression(u"x"), "(4 name=ALIAS op type=7 (5 table=t) (1 text=x))");
    const CZRAliasInfo& alias = **a.query.m_aliases.Find(u"b c");
    EXPECT_EQ(alias.GetName().toUtf8(), "B c");
    EXPECT_EQ(alias.GetSrcName().toUtf8(), "B c");
}

TEST(AccessAliases, TheFirstOfALikeNameWins) {
    const AccessAnalysed a(u"SELECT a AS x, b AS X FROM t");
    EXPECT_EQ(keysOf(a.query.m_aliases), "x");
    EXPECT_EQ(a.expression(u"x"), "(4 name=AS op type=190 (5 field=a) (1 text=x))");
}

TEST(AccessAliases, AReferenceHasACopyBelowIt) {
    const AccessAnalysed a(u"SELECT a AS b, b + 1 AS c FROM t WHERE B = 2");
    constexpr std::string_view kB = "(4 name=AS op type=190 (5 field=a) (1 text=b))";
    EXPECT_EQ(a.selectItems(), std::string(kB) +
                                   " (4 name=AS op type=190 (4 name=+ op type=255 (10 field=b " +
                                   std::string(kB) + ") (1 text=1)) (1 text=c))");
    EXPECT_EQ(a.whereItems(), "(4 name== op type=101 (10 field=B " + std::string(kB) + ") (1 text=2))");
    EXPECT_EQ(keysOf(a.query.m_fields), "B_0|a_0|a_1|b_0") << "a reference is noted as a column";
}

TEST(AccessAliases, ACopyIsAnItemOfItsOwn) {
    const AccessAnalysed a(u"SELECT a AS b, b FROM t");
    const SelectItem* const copy = a.query.m_selectItems.GetTail()->m_items.GetHead();
    const SelectItem* const expression = (*a.query.m_aliases.Find(u"b"))->Expression->m_items.GetHead();
    EXPECT_NE(copy, expression);
    EXPECT_EQ(itemText(*copy), itemText(*expression));
}

TEST(AccessAliases, AColumnWithATableIsNoReference) {
    EXPECT_EQ(
        AccessAnalysed(u"SELECT a AS b, t.b, x.b, [x.b 1] FROM t, u AS x").selectItems(),
        "(4 name=AS op type=190 (5 field=a) (1 text=b)) (5 table=t field=b) (5 field=b alias=x) (5 field=b 1 "
        "alias=x)");
}

TEST(AccessAliases, ASplitNameWhoseTableIsUnknownIsAReference) {
    EXPECT_EQ(AccessAnalysed(u"SELECT a AS [b c], [y.b c] FROM t").selectItems(),
              "(4 name=AS op type=190 (5 field=a) (1 text=b c)) (10 field=b c (4 name=AS op type=190 (5 "
              "field=a) (1 "
              "text=b c)))");
}

TEST(AccessAliases, AnAliasOfATableIsFollowedAsWell) {
    EXPECT_EQ(AccessAnalysed(u"SELECT x FROM t AS x").selectItems(),
              "(10 field=x (4 name=ALIAS op type=7 (5 table=t) (1 text=x)))");
}

TEST(AccessAliases, ThroughAliases) {
    const AccessAnalysed a(u"SELECT a AS b, b AS c, c AS d FROM t");
    EXPECT_EQ(
        a.expression(u"d"),
        "(4 name=AS op type=190 (10 field=c (4 name=AS op type=190 (10 field=b (4 name=AS op type=190 (5 "
        "field=a) (1 text=b))) (1 text=c))) (1 text=d))");
    EXPECT_EQ(itemText(*a.query.m_selectItems.GetTail()), a.expression(u"d"));
}

TEST(AccessAliases, AnAliasThatIsMadeLaterIsFollowedAtTheReference) {
    // When the expression of c was built, b was a column.
    const AccessAnalysed a(u"SELECT b AS c, a AS b, c FROM t");
    const std::string followed =
        "(4 name=AS op type=190 (10 field=b (4 name=AS op type=190 (5 field=a) (1 text=b))) (1 text=c))";
    EXPECT_EQ(itemText(*a.query.m_selectItems.GetHead()), followed);
    EXPECT_EQ(itemText(*a.query.m_selectItems.GetTail()), "(10 field=c " + followed + ")");
    EXPECT_EQ(a.expression(u"c"), followed) << "the alias's own expression is looked through, too";
}

TEST(AccessAliases, WithoutAReferenceTheExpressionStaysAsItWasBuilt) {
    const AccessAnalysed a(u"SELECT b AS c, a AS b FROM t");
    EXPECT_EQ(a.expression(u"c"), "(4 name=AS op type=190 (5 field=b) (1 text=c))");
}

TEST(AccessAliases, OneThatNamesItselfEnds) {
    const AccessAnalysed a(u"SELECT a AS a FROM t");
    EXPECT_EQ(
        a.expression(u"a"),
        "(4 name=AS op type=190 (10 field=a (4 name=AS op type=190 (10 field=a) (1 text=a))) (1 text=a))");
    EXPECT_EQ(a.selectItems(), "(4 name=AS op type=190 (10 field=a " + a.expression(u"a") + ") (1 text=a))");
}

TEST(AccessAliases, TwoThatNameEachOtherEnd) {
    const AccessAnalysed a(u"SELECT b AS a, a AS b FROM t");
    EXPECT_EQ(a.selectItems().find("(5 field="), std::string::npos) << a.selectItems();
    EXPECT_EQ(a.query.m_selectItems.GetCount(), 2);
}

TEST(AccessAliases, InsideOfAnExpressionNoColumnIsNoted) {
    // The column of the join's condition stands in no alias, that of the AS in one.
    const AccessAnalysed a(u"SELECT f(a, b) AS c FROM t");
    EXPECT_EQ(keysOf(a.query.m_fields), "a_0|a_1|b_0|b_1");
    EXPECT_EQ(a.database.UserFunctions.Find(u"f")->toUtf8(), "2");
}

TEST(AccessAliases, AStarInAnExpressionExpands) {
    AccessAnalysed a;
    a.addTable(u"t", {u"id", u"a"});
    a.analyse(u"SELECT Count(t.*) AS n, n FROM t");
    EXPECT_EQ(
        a.expression(u"n"),
        "(4 name=AS op type=190 (4 name=Count type=64 (5 table=t field=id) (5 table=t field=a)) (1 text=n))");
    EXPECT_EQ(itemText(*a.query.m_selectItems.GetTail()), "(10 field=n " + a.expression(u"n") + ")");
}

// -----------------------------------------------------------------------------------------------------
// bounds

std::u16string number(int value) {
    const std::string text = std::to_string(value);
    return {text.begin(), text.end()};
}

// x AS a0, a0 + a0 AS a1, a1 + a1 AS a2, ...
std::u16string doublingChain(int length) {
    std::u16string sql = u"SELECT x AS a0";
    for (int at = 1; at <= length; ++at)
        sql += u", a" + number(at - 1) + u" + a" + number(at - 1) + u" AS a" + number(at);
    return sql + u" FROM t";
}

std::u16string nestedTables(int depth) {
    std::u16string sql = u"SELECT a FROM ";
    for (int at = 0; at < depth; ++at) sql += u"(SELECT a FROM ";
    sql += u"t";
    for (int at = 0; at < depth; ++at) sql += u") AS d" + number(at);
    return sql;
}

struct Cost {
    double megabytes;
    double milliseconds;
};

Cost costOf(const std::u16string& sql) {
    const auto held = [] {
        const struct mallinfo2 info = mallinfo2();
        return static_cast<double>(info.uordblks + info.hblkhd);
    };
    const double before = held();
    const auto start = std::chrono::steady_clock::now();
    const AccessAnalysed a(sql);
    const std::chrono::duration<double, std::milli> time = std::chrono::steady_clock::now() - start;
    return {(held() - before) / 1e6, time.count()};
}

// Unoptimised and instrumented builds are slower by far, and hold more.
#if defined(NDEBUG) && !defined(__SANITIZE_ADDRESS__) && !defined(__SANITIZE_THREAD__)
constexpr bool kMeasures = true;
#else
constexpr bool kMeasures = false;
#endif

TEST(AccessBounds, FortyChainedAliasesAndFortyNestedTablesStaySmall) {
    for (const std::u16string& sql : {doublingChain(40), nestedTables(40)}) {
        Cost least{1e9, 1e9};
        for (int run = 0; run < 5; ++run) {
            const Cost cost = costOf(sql);
            least = {std::min(least.megabytes, cost.megabytes),
                     std::min(least.milliseconds, cost.milliseconds)};
        }
        if (!kMeasures) continue;
        EXPECT_LT(least.megabytes, 10);
        EXPECT_LT(least.milliseconds, 100);
    }
}

TEST(AccessBounds, AsFarAsTheBoundTheContentIsTheSame) {
    const AccessAnalysed shorter(doublingChain(8));
    const AccessAnalysed longer(doublingChain(40));
    for (int at = 0; at <= 8; ++at) {
        const std::u16string alias = u"a" + number(at);
        EXPECT_EQ(longer.expression(alias), shorter.expression(alias)) << at;
    }
}

TEST(AccessBounds, BehindTheBoundAReferenceIsStillOne) {
    const AccessAnalysed a(doublingChain(40));
    ASSERT_EQ(a.query.m_aliases.GetCount(), 41);
    EXPECT_EQ(a.expression(u"a40"), "");
    EXPECT_EQ(itemText(*a.query.m_selectItems.GetTail()),
              "(4 name=AS op type=190 (4 name=+ op type=255 (10 field=a39) (10 field=a39)) (1 text=a40))");
}

// The walk by itself, with a limit.
struct Limited {
    ParsedMsAccess parsed;
    TestDatabase database;
    CZRQueryInfo query;

    Limited(std::u16string_view sql, std::size_t limit) : parsed(sql) {
        query.SetDatabase(&database);
        CZRSQLTree* const node =
            zr::findSelectNode(parsed.tree.get(), MSAccessSQL_v3StateSelectQuery::isSelectNode);
        MSAccessSQL_v3StateSelectQuery state(node);
        state.m_query = &query;
        state.setCopyLimit(limit);
        zr::runPasses(state);
    }
};

TEST(AccessBounds, ACopyThatJustFitsIsTaken) {
    // The expression of b has three items, and the copy below the reference as many.
    constexpr char16_t kSql[] = u"SELECT a AS b, b FROM t";
    const std::string whole = "(4 name=AS op type=190 (5 field=a) (1 text=b))";
    EXPECT_EQ(listText(Limited(kSql, 6).query.m_selectItems), whole + " (10 field=b " + whole + ")");
    EXPECT_EQ(listText(Limited(kSql, 5).query.m_selectItems), whole + " (10 field=b)");
    EXPECT_EQ(listText(Limited(kSql, 0).query.m_selectItems), whole + " (10 field=b)");
}

TEST(AccessBounds, BehindTheFirstRefusalNothingIsCopied) {
    const Limited walk(u"SELECT a + b + c AS d, e AS f, d, f FROM t", 8 + 3 + 2);
    EXPECT_EQ(itemText(*walk.query.m_selectItems.GetTail()), "(10 field=f)");
}

TEST(AccessBounds, ASubQueryWithoutCopiesStillKnowsTheNames) {
    const Limited walk(u"SELECT a AS b FROM t WHERE c IN (SELECT b FROM u AS x WHERE x.d = 1)", 0);
    const SelectItem& condition = *walk.query.m_whereItem->m_items.GetHead();
    const CZRQueryInfo& nested = subQueryOf(*condition.m_items.GetTail());
    EXPECT_TRUE(nested.m_aliases.IsEmpty());
    EXPECT_EQ(listText(nested.m_selectItems), "(10 field=b)");
    EXPECT_EQ(listText(nested.m_whereItem->m_items), "(4 name== op type=101 (5 field=d alias=x) (1 text=1))");
}

TEST(AccessBounds, DepthCostsNoMachineStack) {
    onSmallStack([] {
        for (const std::u16string& sql : {doublingChain(2'000), nestedTables(300)}) {
            const AccessAnalysed a(sql);
            EXPECT_FALSE(a.query.m_selectItems.IsEmpty());
        }
        // Each one stands for the one behind it, and all are made before the first is followed.
        std::u16string sql = u"SELECT b0";
        for (int at = 0; at < 3'000; ++at) sql += u", b" + number(at + 1) + u" AS b" + number(at);
        const AccessAnalysed a(sql + u" FROM t");
        EXPECT_EQ(a.query.m_selectItems.GetCount(), 3'001);
    });
}

// --------------------------------------------------------------------------------------------- nested
// queries

TEST(AccessSubQueries, SeeTheNamesAroundThem) {
    const AccessAnalysed a(u"SELECT a AS x FROM t AS y WHERE b IN (SELECT x FROM u WHERE y.c = d)");
    const SelectItem& condition = *a.query.m_whereItem->m_items.GetHead();
    EXPECT_EQ(itemText(condition), "(4 name=IN op type=155 (5 field=b) (6 name=SUB_QUERY query))");
    const CZRQueryInfo& nested = subQueryOf(*condition.m_items.GetTail());
    EXPECT_EQ(nested.DataType, 2);
    EXPECT_EQ(nested.m_database, &a.database);
    EXPECT_EQ(keysOf(nested.m_aliases), "x|y");
    EXPECT_EQ(keysOf(nested.m_sourceTables), "t|u");
    EXPECT_EQ(listText(nested.m_selectItems), "(10 field=x " + a.expression(u"x") + ")");
    EXPECT_EQ(listText(nested.m_whereItem->m_items),
              "(4 name== op type=101 (5 field=c alias=y) (5 field=d))");
    EXPECT_NE(*nested.m_aliases.Find(u"x"), *a.query.m_aliases.Find(u"x"));
    EXPECT_NE(*nested.m_fields.Find(u"a_1"), nullptr);
}

TEST(AccessSubQueries, OneInTheSelectListDoesNotEndTheAnalysis) {
    const AccessAnalysed a(u"SELECT (SELECT b FROM u) AS c, d FROM t");
    EXPECT_EQ(a.selectItems(), "(4 name=AS op type=190 (6 name=SUB_QUERY query) (1 text=c)) (5 field=d)");
    EXPECT_EQ(a.fromItems(), "(5 table=t)");
    EXPECT_TRUE(a.query.m_subQueries.IsEmpty());
}

TEST(AccessSubQueries, WithoutAnAliasOneInTheSelectListIsItsFirstColumn) {
    EXPECT_EQ(AccessAnalysed(u"SELECT (SELECT b, c FROM u) FROM t").selectItems(), "(5 field=b)");
}

TEST(AccessSubQueries, ADerivedTableIsOneBelowItsAlias) {
    const AccessAnalysed a(u"SELECT x.b FROM (SELECT b FROM u WHERE c = 1) AS x");
    EXPECT_EQ(a.fromItems(), "(4 name=ALIAS op type=7 (6 name=SUB_QUERY query) (1 text=x))");
    const CZRQueryInfo& nested = subQueryOf(*a.query.m_fromItems.GetHead()->m_items.GetHead());
    EXPECT_EQ(listText(nested.m_selectItems), "(5 field=b)");
    EXPECT_EQ(listText(nested.m_fromItems), "(5 table=u)");
    EXPECT_EQ(keysOf(nested.m_aliases), "x") << "the alias of the table itself is known in it";
    EXPECT_EQ(a.expression(u"x"), "(4 name=ALIAS op type=7 (6 name=SUB_QUERY query) (1 text=x))");
}

// -----------------------------------------------------------------------------------------------------
// unions

TEST(AccessUnions, AChainComesOutNested) {
    const AccessAnalysed a(u"SELECT a FROM t UNION SELECT b FROM u UNION SELECT c FROM v");
    ASSERT_EQ(listText(a.query.m_unionItems), "(8 name=UNION query)");
    const CZRQueryInfo& second = branchOf(a.query);
    EXPECT_EQ(second.DataType, 2);
    EXPECT_EQ(second.m_database, &a.database);
    EXPECT_EQ(listText(second.m_selectItems), "(5 field=b)");
    ASSERT_EQ(listText(second.m_unionItems), "(8 name=UNION query)");
    EXPECT_EQ(listText(branchOf(second).m_selectItems), "(5 field=c)");
    EXPECT_TRUE(branchOf(second).m_unionItems.IsEmpty());
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t|u|v") << "the passes of the first query read the whole tree";
}

TEST(AccessUnions, ABranchKnowsNoNamesAndRunsNoPasses) {
    const AccessAnalysed a(u"SELECT a AS x FROM t AS y UNION SELECT x FROM u AS z WHERE z.b = y.c");
    EXPECT_EQ(keysOf(a.query.m_aliases), "x|y|z");
    const CZRQueryInfo& branch = branchOf(a.query);
    EXPECT_TRUE(branch.m_aliases.IsEmpty());
    EXPECT_TRUE(branch.m_sourceTables.IsEmpty());
    EXPECT_EQ(listText(branch.m_selectItems), "(5 field=x)");
    EXPECT_EQ(listText(branch.m_whereItem->m_items),
              "(4 name== op type=101 (5 table=z field=b) (5 table=y field=c))");
    EXPECT_EQ(keysOf(branch.m_fields), "x_0|yc_0|zb_0");
}

TEST(AccessUnions, AllIsThePredicateOfTheOuterQuery) {
    const AccessAnalysed a(u"SELECT DISTINCT a FROM t UNION ALL SELECT DISTINCTROW b FROM u");
    EXPECT_EQ(a.query.m_predicate, 1);
    EXPECT_EQ(branchOf(a.query).m_predicate, 3);
    EXPECT_EQ(listText(branchOf(a.query).m_selectItems), "(5 field=b)");
}

TEST(AccessUnions, ASubQueryInABranchKnowsTheBranchAlone) {
    const AccessAnalysed a(u"SELECT a AS x FROM t UNION SELECT b FROM u WHERE c IN (SELECT x FROM w)");
    const CZRQueryInfo& branch = branchOf(a.query);
    const CZRQueryInfo& nested = subQueryOf(*branch.m_whereItem->m_items.GetHead()->m_items.GetTail());
    EXPECT_EQ(listText(nested.m_selectItems), "(5 field=x)");
    EXPECT_TRUE(nested.m_aliases.IsEmpty());
}

TEST(AccessUnions, WhatStandsBehindTheStatementIsNoUnion) {
    const AccessAnalysed a(u"SELECT a FROM t ORDER BY a UNION (SELECT b FROM u)");
    EXPECT_TRUE(a.query.m_unionItems.IsEmpty());
    EXPECT_EQ(a.selectItems(), "(5 field=a)");
}

// A root that holds unions beside the statement, as no text of the grammar gives it.
TEST(AccessUnions, UnionsBesideTheStatementStandEachInsideTheOneBefore) {
    const auto branch = [](const std::string& column) {
        return "(345 \"UNION\" (296 \"\" (295 \"\" (54 \"\" (53 \"\" (145 \"" + column + "\"))))))";
    };
    const auto root =
        HandMadeTree::read("(0 \"nil\" (296 \"\" (295 \"\" (54 \"\" (53 \"\" (145 \"a\"))))) " + branch("b") +
                           " " + branch("c") + " (145 \"x\") " + branch("d") + ")");
    CZRQueryInfo query;
    MSAccessSQL_v3StateSelectQuery state(root->GetChild(0));
    state.m_query = &query;
    zr::runPasses(state);
    state.ProcessTail(root.get());
    ASSERT_EQ(listText(query.m_unionItems), "(8 name=UNION query)");
    const CZRQueryInfo& second = branchOf(query);
    EXPECT_EQ(listText(second.m_selectItems), "(5 field=b)");
    ASSERT_EQ(listText(second.m_unionItems), "(8 name=UNION query)");
    EXPECT_EQ(listText(branchOf(second).m_selectItems), "(5 field=c)");
    EXPECT_TRUE(branchOf(second).m_unionItems.IsEmpty()) << "the first child of another type ends it";
}

}  // namespace
