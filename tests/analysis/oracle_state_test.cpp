// What the walk of Oracle does its own way, on real text. What it shares with SQL Server is tested there and
// by the comparison of dialects.
#include "analysis/oracle_state.h"

#include <gtest/gtest.h>
#include <zrparsersql/recognizers/Oracle_tokens.h>

#include <memory>
#include <string>

#include "analysis/driver.h"
#include "tests/analysis/analysed.h"
#include "tests/analysis/descriptor_text.h"
#include "tests/analysis/hand_made_tree.h"
#include "tests/parser/small_stack.h"
#include "zrparsersql/sql_parsers.h"

namespace {

struct OracleQuery : Analysed {
    explicit OracleQuery(std::u16string_view sql) : Analysed(sql, DB_ORACLE) {}

    std::string select() const { return listText(query.m_selectItems); }
    std::string from() const { return listText(query.m_fromItems); }
    std::string where() const { return query.m_whereItem ? listText(query.m_whereItem->m_items) : "none"; }
    std::string order() const { return listText(query.m_orderItems); }
    const CZRAliasInfo* alias(std::u16string_view key) const {
        CZRAliasInfo* const* const found = query.m_aliases.Find(key);
        return found ? *found : nullptr;
    }
    const CFieldObject* field(std::u16string_view key) const {
        CFieldObject* const* const found = query.m_fields.Find(key);
        return found ? *found : nullptr;
    }
};

std::string typed(int token) {
    return "type=" + std::to_string(token);
}

const CZRQueryInfo& nestedOf(const SelectItem& item) {
    if (const auto* branch = dynamic_cast<const SelectItemUnion*>(&item)) return *branch->m_query;
    return *dynamic_cast<const SelectItemSubQuery&>(item).m_query;
}

// A state whose passes were run, for the look-ups that hosts use.
class Walked {
 public:
    explicit Walked(std::u16string_view sql) : text_(sql) {
        parser_.SetSQL(text_);
        parser_.ParseSQL();
        CZRSQLTree* root = nullptr;
        parser_.GetSQLTree(&root);
        tree_.reset(root);
        state = std::make_unique<OracleStateSelectQuery>(
            zr::findSelectNode(root, OracleStateSelectQuery::isSelectNode));
        state->m_query = &query;
        state->CollectAliases(state->m_selectNode);
        state->CollectTables();
        state->CollectFields();
    }

    CZRQueryInfo query;
    std::unique_ptr<OracleStateSelectQuery> state;

 private:
    CString text_;
    CZROracleParser parser_;
    std::unique_ptr<CZRSQLTree> tree_;
};

// ---------------------------------------------------------------------------------------------- aliases

TEST(OracleAliases, KeysTellTablesAndColumnsApart) {
    const OracleQuery q(u"SELECT a AS Col FROM t Tab");
    EXPECT_EQ(keysOf(q.query.m_aliases), "col_FIELD|tab_TABLE");
    EXPECT_EQ(q.alias(u"col_FIELD")->GetName(), u"Col");
    EXPECT_EQ(q.alias(u"col_FIELD")->GetSrcName(), u"Col");
    EXPECT_EQ(q.alias(u"tab_TABLE")->GetName(), u"Tab");
    EXPECT_NE(q.alias(u"tab_TABLE")->Expression, nullptr);
}

TEST(OracleAliases, AColumnAliasAndATableOfOneNameDoNotHideEachOther) {
    const OracleQuery q(u"SELECT a AS x FROM x");
    EXPECT_EQ(keysOf(q.query.m_aliases), "x_FIELD");
    EXPECT_EQ(keysOf(q.query.m_sourceTables), "x");
    // SQL Server has one name space for both.
    EXPECT_EQ(keysOf(Analysed(u"SELECT a AS x FROM x").query.m_sourceTables), "");
}

TEST(OracleAliases, ATableAliasAndAColumnOfOneNameDoNotHideEachOther) {
    const OracleQuery q(u"SELECT x FROM t x");
    EXPECT_EQ(q.select(), "(5 field=x)");
    EXPECT_EQ(keysOf(q.query.m_fields), "x");
}

TEST(OracleAliases, BothKindsOfOneNameStandBesideEachOther) {
    const OracleQuery q(u"SELECT a x FROM t x");
    EXPECT_EQ(keysOf(q.query.m_aliases), "x_FIELD|x_TABLE");
}

TEST(OracleAliases, TheFirstOfOneKindAndNameWins) {
    const OracleQuery q(u"SELECT a AS X, b AS x FROM t");
    EXPECT_EQ(keysOf(q.query.m_aliases), "x_FIELD");
    EXPECT_EQ(q.alias(u"x_FIELD")->GetName(), u"X");
    EXPECT_EQ(q.alias(u"x_FIELD")->AliasField, u"a");
}

TEST(OracleAliases, QuotesOfNamesGo) {
    const OracleQuery q(u"SELECT a AS \"My X\", b [My Y] FROM \"My T\" AS \"T t\"");
    EXPECT_EQ(keysOf(q.query.m_aliases), "my x_FIELD|my y_FIELD|t t_TABLE");
    EXPECT_EQ(q.alias(u"my x_FIELD")->GetName(), u"My X");
    EXPECT_EQ(q.alias(u"t t_TABLE")->AliasTable, u"My T");
}

TEST(OracleAliases, KnowTheNameBehindThem) {
    const OracleQuery q(u"SELECT t.a AS x, b y FROM s.t z");
    EXPECT_EQ(q.alias(u"z_TABLE")->AliasTable, u"t");
    EXPECT_EQ(q.alias(u"z_TABLE")->AliasField, u"");
    EXPECT_EQ(q.alias(u"x_FIELD")->AliasTable, u"t");
    EXPECT_EQ(q.alias(u"x_FIELD")->AliasField, u"a");
    EXPECT_EQ(q.alias(u"y_FIELD")->AliasTable, u"");
    EXPECT_EQ(q.alias(u"y_FIELD")->AliasField, u"b");
}

TEST(OracleAliases, OfAnythingButANameKnowNone) {
    const OracleQuery q(u"SELECT a + 1 AS x, NVL(b, 0) y, 1 z FROM (SELECT c FROM u) w");
    for (const char16_t* const key : {u"x_FIELD", u"y_FIELD", u"z_FIELD", u"w_TABLE"}) {
        ASSERT_NE(q.alias(key), nullptr) << CString(key).toUtf8();
        EXPECT_EQ(q.alias(key)->AliasTable + q.alias(key)->AliasField, u"") << CString(key).toUtf8();
    }
}

TEST(OracleAliases, TheNearestClauseDecidesTheKind) {
    // In a FROM, but below a nested select's list; and in the nested select's own FROM.
    const OracleQuery q(u"SELECT a FROM (SELECT b AS c FROM u v WHERE NVL(e, 0) f = 1) w");
    EXPECT_EQ(keysOf(q.query.m_aliases), "c_FIELD|f_FIELD|v_TABLE|w_TABLE");
}

TEST(OracleAliases, OfACallInAConditionOfAJoinCountAsATables) {
    EXPECT_EQ(keysOf(OracleQuery(u"SELECT a FROM t JOIN u ON NVL(b, 0) c = 1").query.m_aliases), "c_TABLE");
}

TEST(OracleAliases, OfNestedSelectsInAConditionAreCollected) {
    EXPECT_EQ(keysOf(OracleQuery(u"SELECT a FROM t WHERE b IN (SELECT c AS d FROM u AS e)").query.m_aliases),
              "d_FIELD|e_TABLE");
}

TEST(OracleAliases, OfRowNumberIsAColumns) {
    EXPECT_EQ(keysOf(OracleQuery(u"SELECT ROW_NUMBER() OVER (ORDER BY a) rn FROM t").query.m_aliases),
              "rn_FIELD");
}

TEST(OracleAliases, AreCollectedAtAnyDepthOnASmallMachineStack) {
    std::u16string sql, end;
    for (int depth = 0; depth < 2'000; ++depth) {
        sql += u"SELECT a b FROM (";
        end += u") x";
    }
    onSmallStack([&] {
        const OracleQuery q(sql + u"SELECT c y FROM t z" + end);
        EXPECT_EQ(keysOf(q.query.m_aliases), "b_FIELD|x_TABLE|y_FIELD|z_TABLE");
        EXPECT_EQ(keysOf(q.query.m_sourceTables), "t");
    });
}

// ---------------------------------------------------------------------------------------------- look-ups

TEST(OracleLookUps, AnAliasIsKnownByItsNameAndSuffixInAnyCase) {
    const Walked w(u"SELECT a AS Col FROM t Tab");
    EXPECT_TRUE(w.state->IsKnownAliasOf(u"COL", OracleStateSelectQuery::kField));
    EXPECT_FALSE(w.state->IsKnownAliasOf(u"COL", OracleStateSelectQuery::kTable));
    EXPECT_TRUE(w.state->IsKnownAliasOf(u"tab", OracleStateSelectQuery::kTable));
    EXPECT_FALSE(w.state->IsKnownAliasOf(u"tab", OracleStateSelectQuery::kField));
}

TEST(OracleLookUps, ANameThatEqualsAWholeKeyIsKnownToo) {
    const Walked w(u"SELECT a AS col FROM t");
    EXPECT_TRUE(w.state->IsKnownAliasOf(u"Col_Field", OracleStateSelectQuery::kTable));
    EXPECT_EQ(w.state->GetAliasTable(u"Col_Field"), u"");
    EXPECT_EQ(w.state->GetAliasField(u"Col_Field"), u"Col_Field");
}

TEST(OracleLookUps, FieldsAndTablesAreKnownInAnyCase) {
    const Walked w(u"SELECT t.Abc FROM Orders");
    EXPECT_TRUE(w.state->IsKnownField(u"aBC"));
    EXPECT_FALSE(w.state->IsKnownField(u"tAbc"));
    EXPECT_FALSE(w.state->IsKnownField(u"t"));
    EXPECT_TRUE(w.state->IsKnownTable(u"ORDERS"));
    EXPECT_FALSE(w.state->IsKnownTable(u"Abc"));
}

TEST(OracleLookUps, AliasesAreReadBack) {
    const Walked w(u"SELECT o.a AS x, a + 1 y FROM orders O, (SELECT b FROM u) v");
    EXPECT_EQ(w.state->GetAliasTable(u"o"), u"orders");
    EXPECT_EQ(w.state->GetAliasTable(u"v"), u"");
    EXPECT_EQ(w.state->GetAliasTable(u"other"), u"other");
    EXPECT_EQ(w.state->GetAliasField(u"X"), u"a");
    EXPECT_EQ(w.state->GetAliasField(u"y"), u"");
    EXPECT_EQ(w.state->GetAliasField(u"Other"), u"Other");
}

// ------------------------------------------------------------------------------------- tables and fields

TEST(OracleTables, ATableThatIsATableAliasIsPassedOver) {
    EXPECT_EQ(keysOf(OracleQuery(u"SELECT X.a FROM t x").query.m_sourceTables), "t");
}

TEST(OracleTables, ATableThatIsAColumnAliasIsTaken) {
    EXPECT_EQ(keysOf(OracleQuery(u"SELECT x.a AS x FROM x").query.m_sourceTables), "x");
}

TEST(OracleTables, ATableBehindADatabaseIsTakenEvenIfItIsAnAlias) {
    EXPECT_EQ(keysOf(OracleQuery(u"SELECT s.t.a FROM s.t t").query.m_sourceTables), "t");
}

TEST(OracleTables, QuotesOfNamesGo) {
    const OracleQuery q(u"SELECT \"a b\", [c d] FROM \"My T\", [My U]");
    EXPECT_EQ(keysOf(q.query.m_sourceTables), "My T|My U");
    EXPECT_EQ(keysOf(q.query.m_fields), "a b|c d");
    EXPECT_EQ(q.select(), "(5 field=a b) (5 field=c d)");
    EXPECT_EQ(q.from(), "(4 name=, op " + typed(Oracle_COMMA) + " (5 table=My T) (5 table=My U))");
}

TEST(OracleTables, BehindADatabaseTheQuotesOfATableItemStay) {
    EXPECT_EQ(OracleQuery(u"SELECT a FROM s.\"My T\"").from(), "(5 table=\"My T\")");
}

TEST(OracleFields, OfAnAliasedTableStandUnderTheTableItself) {
    const OracleQuery q(u"SELECT e.name FROM emp e");
    // The clause enters the column once more, without the alias.
    EXPECT_EQ(keysOf(q.query.m_fields), "empname|name");
    EXPECT_EQ(q.field(u"empname")->m_table, u"emp");
    EXPECT_EQ(q.field(u"empname")->m_hasTable, 1);
    EXPECT_EQ(q.field(u"name")->m_hasTable, 0);
    EXPECT_EQ(q.select(), "(5 text=e field=name alias=e)");
}

TEST(OracleFields, OfAnAliasedQueryStandUnderNoTable) {
    const OracleQuery q(u"SELECT v.b FROM (SELECT b FROM u) v COMPUTE SUM(v.c)");
    EXPECT_EQ(q.field(u"c")->m_table, u"");
    EXPECT_EQ(q.field(u"c")->m_hasTable, 1);
}

TEST(OracleFields, AQualifiedColumnIsNoAlias) {
    const OracleQuery q(u"SELECT t.a AS a FROM t");
    EXPECT_EQ(keysOf(q.query.m_fields), "ta");
    EXPECT_EQ(q.select(), "(4 name=ALIAS op " + typed(Oracle_ALIAS) + " (5 table=t field=a) (1 text=a))");
}

TEST(OracleFields, AnOrderByASelectAliasStandsUnderTheColumnBehindIt) {
    const OracleQuery q(u"SELECT t.a AS x FROM t ORDER BY X");
    EXPECT_EQ(keysOf(q.query.m_fields), "a|ta");
    EXPECT_EQ(q.field(u"a")->m_field, u"a");
    EXPECT_EQ(q.order(), "(5 text=X)");
}

TEST(OracleFields, AnOrderByAnAliasOfAnExpressionLeavesNoField) {
    const OracleQuery q(u"SELECT a + 1 AS x FROM t ORDER BY x");
    EXPECT_EQ(keysOf(q.query.m_fields), "a");
    EXPECT_EQ(q.order(), "(5 text=x)");
}

TEST(OracleFields, AllColumnsOfATableIsAFieldNamedSo) {
    const OracleQuery q(u"SELECT t.*, * FROM t");
    EXPECT_EQ(q.select(), "(5 table=t field=*) (1 text=*)");
    EXPECT_EQ(keysOf(q.query.m_fields), "t*");
}

// ------------------------------------------------------------------------------------------------ clauses

TEST(OracleClauses, ALiteralByItselfIsNoItem) {
    EXPECT_EQ(OracleQuery(u"SELECT 1, 'x', a, NULL FROM t").select(), "(5 field=a)");
    EXPECT_EQ(OracleQuery(u"SELECT a FROM t WHERE 1").where(), "");
    EXPECT_EQ(OracleQuery(u"SELECT a FROM t ORDER BY 1, a").order(), "(5 field=a)");
    EXPECT_EQ(listText(OracleQuery(u"SELECT a FROM t HAVING 1").query.m_havingItems), "");
    EXPECT_EQ(listText(OracleQuery(u"SELECT a FROM t GROUP BY a, 1").query.m_groupItems), "(5 field=a)");
}

TEST(OracleClauses, ALiteralWithAnAliasOrAnOperatorIsAnItem) {
    EXPECT_EQ(OracleQuery(u"SELECT 1 AS x FROM t").select(),
              "(4 name=ALIAS op " + typed(Oracle_ALIAS) + " (1 text=1) (1 text=x))");
    EXPECT_EQ(OracleQuery(u"SELECT 1 + 2 FROM t").select(),
              "(4 name=+ op " + typed(Oracle_PLUS) + " (1 text=1) (1 text=2))");
}

TEST(OracleClauses, ADirectionBehindALiteralWithNothingAheadEndsTheAnalysis) {
    // The word goes to the first item of the clause, and there is none.
    const OracleQuery q(u"SELECT a FROM t ORDER BY 1 DESC");
    EXPECT_EQ(q.select(), "(5 field=a)");
    EXPECT_EQ(q.order(), "");
}

TEST(OracleClauses, DirectionsGoToTheFirstItem) {
    EXPECT_EQ(OracleQuery(u"SELECT a FROM t ORDER BY a, b DESC").order(),
              "(5 field=a (0 text=DESC)) (5 field=b)");
}

TEST(OracleClauses, TopIsALimitWhateverStandsBehindItsNumber) {
    for (const std::u16string_view sql :
         {u"SELECT TOP 5 a FROM t", u"SELECT TOP (5) a FROM t", u"SELECT TOP 5 PERCENT a FROM t",
          u"SELECT TOP 5 WITHTIES a FROM t", u"SELECT TOP 5 PERCENT WITHTIES a FROM t"}) {
        const OracleQuery q(sql);
        EXPECT_EQ(q.query.m_hasLimit, 1) << CString(sql).toUtf8();
        EXPECT_EQ(q.query.m_limitOffset, 0) << CString(sql).toUtf8();
        EXPECT_EQ(q.query.m_limitCount, 5) << CString(sql).toUtf8();
        EXPECT_EQ(q.query.m_predicate, 0) << CString(sql).toUtf8();
    }
}

TEST(OracleClauses, OnlyTheFirstWordOfAPredicateCounts) {
    const OracleQuery q(u"SELECT DISTINCT TOP 5 a FROM t");
    EXPECT_EQ(q.query.m_predicate, 2);
    EXPECT_EQ(q.query.m_hasLimit, 0);
    EXPECT_EQ(OracleQuery(u"SELECT ALL a FROM t").query.m_predicate, 1);
    EXPECT_EQ(OracleQuery(u"SELECT a FROM t").query.m_predicate, 0);
}

TEST(OracleClauses, AnErrorNodeGivesNoItemAndNoFailure) {
    const OracleQuery q(u"SELECT , FROM t x WHERE b = 1");
    EXPECT_EQ(q.select(), "");
    EXPECT_EQ(keysOf(q.query.m_sourceTables), "t");
    EXPECT_EQ(q.where(), "(4 name== op " + typed(Oracle_EQ) + " (5 field=b) (1 text=1))");
    EXPECT_EQ(OracleQuery(u"no statement").select(), "");
}

TEST(OracleClauses, ANestedSelectInTheFirstClauseEndsTheAnalysis) {
    const OracleQuery q(u"SELECT (SELECT b FROM u) FROM t");
    EXPECT_EQ(q.query.m_subQueries.GetCount(), 1);
    EXPECT_EQ(q.from(), "");
}

// ------------------------------------------------------------------------------------------- expressions

TEST(OracleExpressions, NotInIsAnInWithoutItsNot) {
    const OracleQuery q(u"SELECT a FROM t WHERE b NOT IN (1, 2)");
    EXPECT_EQ(q.where(), "(4 name=IN op " + typed(Oracle_IN_KEYWORD) + " (5 field=b) (1 text=1) (1 text=2))");
}

TEST(OracleExpressions, ANotConditionIsItsCondition) {
    EXPECT_EQ(OracleQuery(u"SELECT a FROM t WHERE NOT b = 1").where(),
              "(4 name== op " + typed(Oracle_EQ) + " (5 field=b) (1 text=1))");
}

TEST(OracleExpressions, BoundsStandUnderTheirOperator) {
    EXPECT_EQ(OracleQuery(u"SELECT a FROM t WHERE b BETWEEN 1 AND 2").where(),
              "(4 name=BETWEEN op " + typed(Oracle_BETWEEN_KEYWORD) + " (5 field=b) (4 name=AND op " +
                  typed(Oracle_AND_KEYWORD) + " (1 text=1) (1 text=2)))");
}

TEST(OracleExpressions, AParenthesisAheadOfABetweenLeavesNoItem) {
    EXPECT_EQ(OracleQuery(u"SELECT a FROM t WHERE (b BETWEEN 1 AND 2)").where(),
              OracleQuery(u"SELECT a FROM t WHERE b BETWEEN 1 AND 2").where());
}

TEST(OracleExpressions, TheFromOfExtractIsAnOperator) {
    EXPECT_EQ(OracleQuery(u"SELECT EXTRACT(YEAR FROM d) FROM t").select(),
              "(4 name=EXTRACT " + typed(Oracle_EXTRACT) + " (4 name=FROM op " + typed(Oracle_FROM_KEYWORD) +
                  " (1 text=YEAR) (5 field=d)))");
}

TEST(OracleExpressions, ConcatenationIsAnOperator) {
    EXPECT_EQ(OracleQuery(u"SELECT a || 'x' FROM t").select(),
              "(4 name=|| op " + typed(Oracle_OR_KEYWORD2) + " (5 field=a) (2 text='x'))");
}

TEST(OracleExpressions, StringsKeepTheirQuotes) {
    EXPECT_EQ(OracleQuery(u"SELECT a FROM t WHERE b = 'two  words' AND c = ''").where(),
              "(4 name=AND op " + typed(Oracle_AND_KEYWORD) + " (4 name== op " + typed(Oracle_EQ) +
                  " (5 field=b) (2 text='two  words')) (4 name== op " + typed(Oracle_EQ) +
                  " (5 field=c) (2 text='')))");
}

TEST(OracleExpressions, ItemsOfNewNamesKeepTheirQuotesAndTheirFirstTokenAlone) {
    const OracleQuery q(u"SELECT a AS \"My X\", b AS [y], c AS #z FROM t");
    const std::string alias = "(4 name=ALIAS op " + typed(Oracle_ALIAS);
    EXPECT_EQ(q.select(), alias + " (5 field=a) (1 text=\"My X\")) " + alias + " (5 field=b) (1 text=[y])) " +
                              alias + " (5 field=c) (1 text=#))");
    EXPECT_EQ(keysOf(q.query.m_aliases), "#z_FIELD|my x_FIELD|y_FIELD");
}

TEST(OracleExpressions, AnOuterJoinMarkLeavesNothing) {
    EXPECT_EQ(OracleQuery(u"SELECT a FROM t, u WHERE t.x = u.x (+)").where(),
              OracleQuery(u"SELECT a FROM t, u WHERE t.x = u.x").where());
}

TEST(OracleExpressions, UserFunctionsWithAndWithoutOwnerAreCounted) {
    const OracleQuery q(u"SELECT f(a, 1), p.g() FROM t");
    EXPECT_EQ(q.select(), "(7 name=f " + typed(Oracle_IDENTIFICATOR) + " (5 field=a) (1 text=1)) (7 name=g " +
                              typed(Oracle_IDENTIFICATOR) + ")");
    EXPECT_EQ(*q.database.UserFunctions.Find(u"f"), u"2");
    EXPECT_EQ(*q.database.UserFunctions.Find(u"g"), u"0");
}

TEST(OracleExpressions, SubstringIsAUsersFunctionAndSubstrIsNot) {
    const OracleQuery q(u"SELECT SUBSTRING(a, 1), SUBSTR(a, 1) FROM t");
    EXPECT_EQ(q.select(), "(7 name=SUBSTRING " + typed(Oracle_IDENTIFICATOR) +
                              " (5 field=a) (1 text=1)) (4 name=SUBSTR " + typed(Oracle_SUBSTR) +
                              " (5 field=a) (1 text=1))");
}

TEST(OracleExpressions, RowNumberHoldsOverWithTheFirstColumnOfEachPart) {
    EXPECT_EQ(OracleQuery(u"SELECT ROW_NUMBER() OVER (PARTITION BY a, b ORDER BY c DESC) FROM t").select(),
              "(4 name=ROW_NUMBER " + typed(Oracle_ROW_NUMBER) + " (4 name=OVER " + typed(Oracle_OVER) +
                  " (5 field=a) (5 field=c)))");
}

TEST(OracleExpressions, ATypeHoldsItsLengthAndUnit) {
    EXPECT_EQ(OracleQuery(u"SELECT CAST(a AS VARCHAR2(10 CHAR)), b FROM t").select(),
              "(4 name=CAST " + typed(Oracle_CAST) + " (4 name=AS op " + typed(Oracle_LITERAL_AS) +
                  " (5 field=a) (9 text=VARCHAR2 (1 text=10) (9 text=CHAR)))) (5 field=b)");
}

// -------------------------------------------------------------------------------------------------- joins

TEST(OracleJoins, PrefixAndPostfixPartsAreNestedOperators) {
    const OracleQuery q(u"SELECT a FROM t LEFT JOIN u ON t.x = u.x");
    EXPECT_EQ(q.from(), "(4 name=JOIN op " + typed(Oracle_JOIN_KEYWORD) +
                            " (0 name=  op nested (5 table=t) (1 text=LEFT)) (5 table=u) (4 name=ON op " +
                            typed(Oracle_ON_KEYWORD) + " (4 name== op " + typed(Oracle_EQ) +
                            " (5 table=t field=x) (5 table=u field=x))))");
    const OracleQuery inner(u"SELECT a FROM t JOIN (u JOIN v ON u.y = v.y) ON z");
    EXPECT_EQ(inner.from(), "(4 name=JOIN op " + typed(Oracle_JOIN_KEYWORD) +
                                " (0 name=  op nested (5 table=t)) (0 name=  op nested (4 name=JOIN op " +
                                typed(Oracle_JOIN_KEYWORD) +
                                " (0 name=  op nested (5 table=u)) (5 table=v) (4 name=ON op " +
                                typed(Oracle_ON_KEYWORD) + " (4 name== op " + typed(Oracle_EQ) +
                                " (5 table=u field=y) (5 table=v field=y))))) (4 name=ON op " +
                                typed(Oracle_ON_KEYWORD) + " (5 field=z)))");
}

TEST(OracleJoins, LogicalOperatorsStayBelowTheirOn) {
    EXPECT_EQ(OracleQuery(u"SELECT a FROM t JOIN u ON x AND y").from(),
              "(4 name=JOIN op " + typed(Oracle_JOIN_KEYWORD) +
                  " (0 name=  op nested (5 table=t)) (5 table=u) (4 name=ON op " + typed(Oracle_ON_KEYWORD) +
                  " (4 name=AND op " + typed(Oracle_AND_KEYWORD) + " (5 field=x) (5 field=y))))");
}

TEST(OracleJoins, AJoinWithoutAPrefixGetsABlankInItsPlace) {
    const OracleQuery q(u"SELECT a FROM t JOIN u ON x JOIN v ON y");
    const std::string join = "(4 name=JOIN op " + typed(Oracle_JOIN_KEYWORD);
    const std::string on = "(4 name=ON op " + typed(Oracle_ON_KEYWORD);
    EXPECT_EQ(q.from(), join + " (0 name=  op nested (5 table=t)) (5 table=u) " + on + " (5 field=x))) " +
                            join + " (0 text= ) (5 table=v) " + on + " (5 field=y)))");
}

TEST(OracleJoins, AnOperatorBelowANestedJoinIsNested) {
    // No text leads to that node.
    const auto tree =
        HandMadeTree::read("(90 \"FROM_DEF_\" (128 \"join\" (166 \"NESTED_JOIN\" (81 \"=\" (114 \"a\")))))");
    CZRQueryInfo query;
    OracleStateSelectQuery state(tree.get());
    state.m_query = &query;
    state.ProcessClause(tree.get());
    state.finish();
    EXPECT_EQ(listText(query.m_fromItems), "(4 name=join op " + typed(Oracle_JOIN_KEYWORD) +
                                               " (0 text= ) (4 name== op nested " + typed(Oracle_EQ) +
                                               " (0 text=a)))");
}

// --------------------------------------------------------------------------------------- nested queries

TEST(OracleNested, SubQueriesAreNamedAndNumberedLikeThoseOfSqlServer) {
    const OracleQuery q(u"SELECT a FROM t WHERE b IN (SELECT c FROM u)");
    EXPECT_EQ(q.where(),
              "(4 name=IN op " + typed(Oracle_IN_KEYWORD) + " (5 field=b) (6 name=SUB_QUERY query))");
    const CZRQueryInfo& nested = nestedOf(*q.query.m_whereItem->m_items.GetHead()->m_items.GetTail());
    EXPECT_EQ(nested.DataType, 8);
    EXPECT_EQ(listText(nested.m_selectItems), "(5 field=c)");
}

TEST(OracleNested, KnowTheAliasesAroundThem) {
    const OracleQuery q(u"SELECT a AS x FROM t y WHERE b IN (SELECT x FROM u WHERE y.c = d)");
    const CZRQueryInfo& nested = nestedOf(*q.query.m_whereItem->m_items.GetHead()->m_items.GetTail());
    EXPECT_EQ(keysOf(nested.m_aliases), "x_FIELD|y_TABLE");
    EXPECT_EQ(listText(nested.m_selectItems), "(5 text=x)");
    EXPECT_EQ(listText(nested.m_whereItem->m_items),
              "(4 name== op " + typed(Oracle_EQ) + " (5 text=y field=c alias=y) (5 field=d))");
}

TEST(OracleNested, UnionsAreNamedAndTakeTheDistinctAwayWithAll) {
    const OracleQuery q(u"SELECT DISTINCT a FROM t UNION ALL SELECT b FROM u UNION SELECT c FROM v");
    EXPECT_EQ(listText(q.query.m_unionItems), "(8 name=UNION query)");
    EXPECT_EQ(q.query.m_predicate, 0);
    const CZRQueryInfo& second = nestedOf(*q.query.m_unionItems.GetHead());
    EXPECT_EQ(second.DataType, 8);
    EXPECT_EQ(listText(second.m_selectItems), "(5 field=b)");
    EXPECT_EQ(listText(nestedOf(*second.m_unionItems.GetHead()).m_selectItems), "(5 field=c)");
    EXPECT_EQ(OracleQuery(u"SELECT DISTINCT a FROM t UNION SELECT b FROM u").query.m_predicate, 2);
}

TEST(OracleNested, ASecondAnalysisFillsTheClausesAnew) {
    OracleQuery q(u"SELECT a FROM t WHERE b = 1");
    q.again(u"SELECT c FROM u WHERE d = 2", DB_ORACLE);
    EXPECT_EQ(q.select(), "(5 field=c)");
    EXPECT_EQ(q.where(), "(4 name== op " + typed(Oracle_EQ) + " (5 field=d) (1 text=2))");
    EXPECT_EQ(keysOf(q.query.m_sourceTables), "t|u");
}

}  // namespace
