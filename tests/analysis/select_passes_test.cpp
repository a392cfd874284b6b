// The passes ahead of the clauses, on real SQL Server text.
#include <gtest/gtest.h>

#include "tests/analysis/analysed.h"
#include "tests/analysis/descriptor_text.h"

namespace {

TEST(CollectTables, TakesBracketsOffNames) {
    const Analysed a(u"SELECT [a b] FROM [t]");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t");
    EXPECT_EQ(keysOf(a.query.m_fields), "a b");
}

TEST(CollectTables, KeepsTheCaseOfNames) {
    EXPECT_EQ(keysOf(Analysed(u"SELECT a FROM Orders").query.m_sourceTables), "Orders");
}

TEST(CollectTables, FindsTablesOfJoinsConditionsAndNestedSelects) {
    const Analysed a(u"SELECT x.c FROM t JOIN u ON t.a = v.b WHERE a IN (SELECT b FROM w)");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t|u|v|w|x");
}

TEST(CollectTables, PassesOverATableThatIsAnAlias) {
    EXPECT_EQ(keysOf(Analysed(u"SELECT x.a FROM t AS x").query.m_sourceTables), "t");
    EXPECT_EQ(keysOf(Analysed(u"SELECT X.a FROM t AS x").query.m_sourceTables), "t");
}

TEST(CollectTables, TakesATableBehindADatabaseEvenIfItIsAnAlias) {
    const Analysed a(u"SELECT db.t.x FROM db.t AS t");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t");
    EXPECT_EQ(keysOf(Analysed(u"SELECT t.x FROM u AS t").query.m_sourceTables), "u");
}

TEST(CollectTables, StoresTheNameAsItsOwnValueUntilItIsResolved) {
    const Analysed a(u"SELECT a FROM t");
    ASSERT_NE(a.query.m_sourceTables.Find(u"t"), nullptr);
    EXPECT_EQ(*a.query.m_sourceTables.Find(u"t"), u"t");
}

TEST(CollectAliases, KeysAreInLowerCaseAndNamesAsWritten) {
    const Analysed a(u"SELECT a AS [My Name], b BB FROM T Tt");
    EXPECT_EQ(keysOf(a.query.m_aliases), "bb|my name|tt");
    CZRAliasInfo* const* alias = a.query.m_aliases.Find(u"my name");
    ASSERT_NE(alias, nullptr);
    EXPECT_EQ((*alias)->GetName(), u"My Name");
    EXPECT_EQ((*alias)->GetSrcName(), u"My Name");
    EXPECT_EQ((*alias)->Computed, 1);
    ASSERT_NE((*alias)->Expression, nullptr);
    EXPECT_TRUE((*alias)->Expression->m_items.IsEmpty());
}

TEST(CollectAliases, TheFirstOfOneNameWins) {
    const Analysed a(u"SELECT a AS X, b AS x FROM t");
    EXPECT_EQ(keysOf(a.query.m_aliases), "x");
    EXPECT_EQ((*a.query.m_aliases.Find(u"x"))->GetName(), u"X");
}

TEST(CollectAliases, GoesIntoNestedSelects) {
    EXPECT_EQ(keysOf(Analysed(u"SELECT a FROM t WHERE b IN (SELECT c AS d FROM u AS e)").query.m_aliases),
              "d|e");
}

TEST(CollectFields, KeysAreTableAndColumnWithNothingBetween) {
    const Analysed a(u"SELECT t.x, y FROM t");
    EXPECT_EQ(keysOf(a.query.m_fields), "tx|y");
    const CFieldObject* const field = *a.query.m_fields.Find(u"tx");
    EXPECT_EQ(field->m_table, u"t");
    EXPECT_EQ(field->m_field, u"x");
}

TEST(CollectFields, LeavesOutABareNameThatIsAnAlias) {
    EXPECT_EQ(keysOf(Analysed(u"SELECT x FROM t AS x").query.m_fields), "");
}

TEST(CollectFields, MarksTheTableWhereNoClauseReplacesTheEntry) {
    // The clauses enter what they read once more, without the mark; COMPUTE is no clause to them.
    const Analysed a(u"SELECT t.x FROM t COMPUTE SUM(t.y)");
    EXPECT_EQ(keysOf(a.query.m_fields), "tx|ty");
    EXPECT_EQ((*a.query.m_fields.Find(u"tx"))->m_hasTable, 0);
    EXPECT_EQ((*a.query.m_fields.Find(u"ty"))->m_hasTable, 1);
}

TEST(CollectFields, TakesOnlyTheFirstClauseOfANestedSelect) {
    const Analysed a(u"SELECT a FROM t UNION SELECT b FROM u WHERE c = 1");
    EXPECT_EQ(keysOf(a.query.m_fields), "a|b");
}

TEST(CollectFields, QualifiedByAnAliasTheFieldStandsByItselfToo) {
    // The pass drops the qualifier that is an alias, and so does the clause.
    EXPECT_EQ(keysOf(Analysed(u"SELECT x.a FROM t AS x").query.m_fields), "a");
    // The pass drops a column that is an alias, the clause keeps it behind a table.
    EXPECT_EQ(keysOf(Analysed(u"SELECT t.a AS a FROM t").query.m_fields), "t|ta");
}

TEST(CollectSubQueries, OneDescriptorForEachNestedSelectOfTheFirstClause) {
    const Analysed a(u"SELECT (SELECT 1), (SELECT b FROM u WHERE c IN (SELECT d FROM v)) FROM t");
    ASSERT_EQ(a.query.m_subQueries.GetCount(), 3);
    for (const CZRQueryInfo* nested : a.query.m_subQueries) {
        EXPECT_EQ(nested->m_database, &a.database);
        EXPECT_EQ(nested->DataType, 0);
        EXPECT_TRUE(nested->m_selectItems.IsEmpty());
    }
}

TEST(NodeText, TrimsBracketsOffANameThatBeginsWithOne) {
    // Within other quotes the brackets are part of the text.
    EXPECT_EQ(keysOf(Analysed(u"SELECT \"[x]\", \"[ y\", \"z]\" FROM t").query.m_fields), "x|y|z]");
}

TEST(NodeText, KeepsCharactersThatNoTokenTook) {
    const Analysed a(u"SELECT [na\u00efve $;x] FROM [\u00e9 t \u00e9 u]");
    EXPECT_EQ(keysOf(a.query.m_fields), "na\u00efve $;x");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t \u00e9 u");
}

TEST(NodeText, AcceptsAllThreeKindsOfQuotes) {
    const Analysed a(u"SELECT [a b], \"c d\", `e f` FROM t");
    EXPECT_EQ(keysOf(a.query.m_fields), "a b|c d|e f");
}

}  // namespace
