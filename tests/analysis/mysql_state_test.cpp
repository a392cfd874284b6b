// What the walk of MySQL does otherwise than the common one, on text and on trees that no text leads to.
#include "analysis/mysql_state.h"

#include <gtest/gtest.h>
#include <zrparsersql/recognizers/MySQLSelect_tokens.h>

#include <memory>
#include <set>
#include <string>

#include "tests/analysis/analysed.h"
#include "tests/analysis/descriptor_text.h"
#include "tests/analysis/hand_made_tree.h"

namespace {

Analysed analysed(std::u16string_view sql) {
    return Analysed(sql, DB_MYSQL);
}
std::string selectOf(std::u16string_view sql) {
    return listText(analysed(sql).query.m_selectItems);
}
std::string fromOf(std::u16string_view sql) {
    return listText(analysed(sql).query.m_fromItems);
}
std::string whereOf(std::u16string_view condition) {
    const Analysed a = analysed(std::u16string(u"SELECT a FROM t WHERE ").append(condition));
    return a.query.m_whereItem ? listText(a.query.m_whereItem->m_items) : "none";
}
int predicateOf(std::u16string_view sql) {
    return analysed(sql).query.m_predicate;
}

struct Walk {
    TestDatabase database;
    CZRQueryInfo query;
    std::unique_ptr<HandMadeTree> tree;
    MySQLStateSelectQuery state;
    CList<SelectItem*> items;

    explicit Walk(std::string_view text) : tree(HandMadeTree::read(text)), state(tree.get()) {
        query.SetDatabase(&database);
        state.m_query = &query;
    }
    ~Walk() { query.RetireItems(items); }

    std::string expression() {
        state.ProcessExpression(tree.get(), &items, nullptr);
        state.finish();
        return listText(items);
    }
};

TEST(MysqlState, IsWhatKindOneTakes) {
    EXPECT_EQ(selectOf(u"SELECT `a` FROM t"), "(5 field=a)");
    EXPECT_EQ(listText(Analysed(u"SELECT `a` FROM t", DB_MSSQL_20).query.m_fromItems), "(5 table=t)");
}

TEST(MysqlState, KnowsItsOperators) {
    const std::set<unsigned int> operators{MySQLSelect_ALIAS,
                                           MySQLSelect_AND,
                                           MySQLSelect_LITERAL_AS,
                                           MySQLSelect_JOIN_KEYWORD,
                                           MySQLSelect_ON_KEYWORD,
                                           MySQLSelect_UNION_KEYWORD,
                                           MySQLSelect_AND_KEYWORD,
                                           MySQLSelect_AND_KEYWORD2,
                                           MySQLSelect_OR_KEYWORD,
                                           MySQLSelect_OR_KEYWORD2,
                                           MySQLSelect_BETWEEN_KEYWORD,
                                           MySQLSelect_LIKE_KEYWORD,
                                           MySQLSelect_IS_KEYWORD,
                                           MySQLSelect_IN_KEYWORD,
                                           MySQLSelect_COMMA,
                                           MySQLSelect_ASTERISK,
                                           MySQLSelect_PLUS,
                                           MySQLSelect_MINUS,
                                           MySQLSelect_EQ,
                                           MySQLSelect_L_T,
                                           MySQLSelect_GT,
                                           MySQLSelect_NOT_EQ,
                                           MySQLSelect_LE,
                                           MySQLSelect_GE,
                                           MySQLSelect_LOJ,
                                           MySQLSelect_GOJ,
                                           MySQLSelect_DIVIDE,
                                           MySQLSelect_AMPERSAND};
    ASSERT_EQ(operators.size(), 28u);
    const Walk walk("(4 \"\")");
    for (unsigned int type = 0; type < 1000; ++type) {
        HandMadeTree node(type, u"");
        EXPECT_EQ(walk.state.IsOperator(&node), operators.contains(type)) << type;
    }
}

// ---- names

TEST(MysqlNames, ComeOutWithoutBackQuotes) {
    const Analysed a = analysed(u"SELECT `Orders`.`Total` FROM `Orders`");
    EXPECT_EQ(listText(a.query.m_selectItems), "(5 table=Orders field=Total)");
    EXPECT_EQ(listText(a.query.m_fromItems), "(5 table=Orders)");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "Orders");
    EXPECT_EQ(keysOf(a.query.m_fields), "OrdersTotal");
}

TEST(MysqlNames, KeepTheBlanksBetweenTheirWords) {
    EXPECT_EQ(selectOf(u"SELECT `a  b;c` FROM t"), "(5 field=a  b;c)");
}

TEST(MysqlNames, LoseBackQuotesThatATreeStillHas) {
    EXPECT_EQ(Walk("(11 \"\" (15 \"\" (317 \"`t`\")) (16 \"\" (317 \"`a b`\")))").expression(),
              "(5 table=t field=a b)");
    EXPECT_EQ(Walk("(11 \"\" (16 \"\" (317 \"`a\")))").expression(), "(5 field=a)");
    EXPECT_EQ(Walk("(11 \"\" (16 \"\" (317 \"[a]\")))").expression(), "(5 field=[a])");
}

TEST(MysqlNames, AnAliasIsKnownInLowerCase) {
    const Analysed a = analysed(u"SELECT a AS `My Total` FROM t AS `T 2`");
    EXPECT_EQ(keysOf(a.query.m_aliases), "my total|t 2");
    EXPECT_EQ((*a.query.m_aliases.Find(u"my total"))->GetName(), u"My Total");
    EXPECT_EQ((*a.query.m_aliases.Find(u"my total"))->GetSrcName(), u"My Total");
}

TEST(MysqlNames, AnAliasLosesQuotesThatATreeStillHas) {
    Walk walk("(4 \"\" (19 \"ALIAS\" (11 \"\") (18 \"\" (317 \"` X`\"))))");
    walk.state.CollectAliases(walk.tree.get());
    EXPECT_EQ(keysOf(walk.query.m_aliases), "x");
}

// ---- columns

TEST(MysqlColumns, AllColumnsOfATableAreTheTableWithoutAColumn) {
    const Analysed a = analysed(u"SELECT t.*, a FROM t");
    EXPECT_EQ(listText(a.query.m_selectItems), "(5 table=t) (5 field=a)");
    EXPECT_TRUE(a.query.m_selectItems.GetHead()->m_items.IsEmpty());
    EXPECT_EQ(keysOf(a.query.m_fields), "a|t");
    EXPECT_EQ((*a.query.m_fields.Find(u"t"))->m_field, u"");
}

TEST(MysqlColumns, AllColumnsOfAnAliasAreTheAlias) {
    const Analysed a = analysed(u"SELECT o.* FROM t o");
    EXPECT_EQ(listText(a.query.m_selectItems), "(5 text=o alias=o)");
    EXPECT_TRUE(a.query.m_fields.IsEmpty());
}

TEST(MysqlColumns, AnAsteriskByItselfIsALiteral) {
    EXPECT_EQ(selectOf(u"SELECT * FROM t"), "(1 text=*)");
}

TEST(MysqlColumns, ANodeThatCallsItselfAnAsteriskHasAllColumns) {
    EXPECT_EQ(Walk("(11 \"*\" (15 \"\" (317 \"t\")))").expression(), "(5 table=t field=* (0 text=*))");
    EXPECT_EQ(Walk("(11 \"*\" (16 \"\" (317 \"a\")))").expression(), "(5 field=a)") << "only behind a table";
}

TEST(MysqlColumns, AnAliasDoesNotHideAColumnOfItsNameInTheMap) {
    const Analysed a = analysed(u"SELECT a AS x FROM t ORDER BY x");
    EXPECT_EQ(listText(a.query.m_orderItems), "(5 text=x)");
    EXPECT_EQ(keysOf(a.query.m_fields), "a|x");
    EXPECT_EQ((*a.query.m_fields.Find(u"x"))->m_field, u"x");
}

TEST(MysqlColumns, OnlyAnAliasOfExactlyThatNameHidesATableInTheMap) {
    EXPECT_EQ(keysOf(analysed(u"SELECT o.a FROM t AS o").query.m_fields), "a");
    // The key of an alias is in lower case, so a qualifier with a capital misses it there; the item does not.
    const Analysed a = analysed(u"SELECT O.a FROM t AS O");
    EXPECT_EQ(keysOf(a.query.m_fields), "Oa|a");
    EXPECT_EQ((*a.query.m_fields.Find(u"Oa"))->m_hasTable, 1);
    EXPECT_EQ(listText(a.query.m_selectItems), "(5 text=O field=a alias=O)");
}

TEST(MysqlColumns, ADatabaseInFrontChangesNothingAboutThatInTheMap) {
    const Analysed a = analysed(u"SELECT d.t.a FROM d.t AS t");
    EXPECT_EQ(listText(a.query.m_selectItems), "(5 table=t field=a)");
    EXPECT_EQ(keysOf(a.query.m_fields), "a|ta");
    EXPECT_EQ((*a.query.m_fields.Find(u"a"))->m_table, u"");
}

TEST(MysqlColumns, DatabaseTableAndColumn) {
    const Analysed a = analysed(u"SELECT d.t.a, t.b FROM d.t");
    EXPECT_EQ(listText(a.query.m_selectItems), "(5 table=t field=a) (5 table=t field=b)");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t");
}

// ---- predicate and limit

TEST(MysqlPredicate, IsANumberForEachWord) {
    EXPECT_EQ(predicateOf(u"SELECT a FROM t"), 0);
    EXPECT_EQ(predicateOf(u"SELECT ALL a FROM t"), 1);
    EXPECT_EQ(predicateOf(u"SELECT DISTINCT a FROM t"), 2);
    EXPECT_EQ(predicateOf(u"SELECT DISTINCTROW a FROM t"), 3);
    EXPECT_EQ(predicateOf(u"SELECT TOP 5 a FROM t"), 0);
}

TEST(MysqlPredicate, NothingIsALimit) {
    for (const std::u16string_view sql :
         {u"SELECT a FROM t LIMIT 5", u"SELECT a FROM t LIMIT 5, 10", u"SELECT TOP 5 a FROM t"}) {
        const Analysed a = analysed(sql);
        EXPECT_EQ(a.query.m_hasLimit, 0);
        EXPECT_EQ(a.query.m_limitCount, 0);
        EXPECT_EQ(listText(a.query.m_fromItems), "(5 table=t)");
    }
}

TEST(MysqlPredicate, UnionAllTakesItAway) {
    EXPECT_EQ(predicateOf(u"SELECT DISTINCT a FROM t UNION SELECT b FROM u"), 2);
    EXPECT_EQ(predicateOf(u"SELECT DISTINCT a FROM t UNION ALL SELECT b FROM u"), 0);
}

// ---- functions

TEST(MysqlFunctions, TakeTheirParametersFromTheSecondChild) {
    EXPECT_EQ(selectOf(u"SELECT CONCAT(a, 'x') AS b FROM t"),
              "(4 name=ALIAS op type=19 (4 name=CONCAT type=236 (5 field=a) (2 text=x)) (1 text=b))");
}

TEST(MysqlFunctions, AnEscapeLeavesNothingButTheFunction) {
    EXPECT_EQ(selectOf(u"SELECT {fn YEAR(a)} FROM t"), "(4 name=YEAR type=227 (5 field=a))");
}

TEST(MysqlFunctions, ANameThatSpellsAnEscapeIsAFunctionLikeAnyOther) {
    EXPECT_EQ(selectOf(u"SELECT `fn`(1) FROM t"), "(7 name=fn type=358 (1 text=1))");
}

TEST(MysqlFunctions, AColumnInFrontOfAFunctionIsItsName) {
    EXPECT_EQ(
        Walk("(27 \"FUNCTION_MY\" (11 \"c\" (16 \"\" (317 \"x\"))) (28 \"\" (317 \"y\")))").expression(),
        "(4 name=c type=11 (0 text=y))");
}

TEST(MysqlFunctions, TheirNamesLoseBackQuotesAndLeadingBlanks) {
    EXPECT_EQ(Walk("(27 \"FUNCTION_MY\" (317 \"` f`\") (28 \"\" (317 \"x\")))").expression(),
              "(4 name=f type=317 (0 text=x))");
    EXPECT_EQ(Walk("(27 \"FUNCTION_MY\" (317 \" f\"))").expression(), "(4 name=f type=317)");
}

TEST(MysqlFunctions, AUserFunctionIsNotedWithTheNumberOfItsParameters) {
    const Analysed a = analysed(u"SELECT `f`(a, 1, 'x') AS b, `g`() c FROM t");
    EXPECT_EQ(listText(a.query.m_selectItems),
              "(4 name=ALIAS op type=19 (7 name=f type=317 (5 field=a) (1 text=1) (2 text=x)) (1 text=b)) "
              "(4 name=ALIAS op type=19 (7 name=g type=317) (1 text=c))");
    EXPECT_EQ(keysOf(a.database.UserFunctions), "f|g");
    EXPECT_EQ(*a.database.UserFunctions.Find(u"f"), u"3");
    EXPECT_EQ(*a.database.UserFunctions.Find(u"g"), u"0");
}

TEST(MysqlFunctions, OfAUserFunctionOfTwoWordsTheFirstIsTheNameAndTheSecondHasNoParameters) {
    const Analysed a = analysed(u"SELECT `my f`(a) FROM t");
    EXPECT_EQ(listText(a.query.m_selectItems), "(7 name=my type=317)");
    EXPECT_EQ(*a.database.UserFunctions.Find(u"my"), u"0");
}

TEST(MysqlFunctions, LikeAsAFunctionIsAnOperatorWithoutParameters) {
    EXPECT_EQ(selectOf(u"SELECT LIKE(a, b) FROM t"),
              "(4 name=ALIAS op type=19 (4 name=LIKE op type=250) (1 text=a)) (5 field=b)");
    EXPECT_EQ(Walk("(27 \"FUNCTION_MY\" (250 \"LIKE\" (317 \"x\")) (28 \"\" (317 \"y\")))").expression(),
              "(4 name=LIKE op type=250 (0 text=x))");
}

TEST(MysqlFunctions, ABetweenTakesItsParametersFromItsFirstChild) {
    EXPECT_EQ(Walk("(27 \"FUNCTION_MY\" (121 \"BETWEEN\" (317 \"x\") (317 \"y\")) (28 \"\" (317 \"z\")))")
                  .expression(),
              "(4 name=BETWEEN op type=121 (0 text=x) (0 text=y))");
}

TEST(MysqlFunctions, OfACastTheTypeIsLost) {
    EXPECT_EQ(selectOf(u"SELECT CAST(a AS CHAR(10)) FROM t"), "(4 name=CAST type=307 (5 field=a))");
}

TEST(MysqlFunctions, AConversionKeepsTypeValueAndStyle) {
    EXPECT_EQ(selectOf(u"SELECT CONVERT(DECIMAL(10, 2), a, 1) b FROM t"),
              "(4 name=ALIAS op type=19 (4 name=CONVERT type=353 (9 text=DECIMAL (1 text=10) (1 text=2)) (5 "
              "field=a) (0 text=1)) (1 text=b))");
}

// ---- conditions and expressions

TEST(MysqlConditions, NotInIsNoOperatorAndHoldsItsOperands) {
    EXPECT_EQ(whereOf(u"x NOT IN (1, 2)"), "(4 name=NOT IN type=126 (5 field=x) (1 text=1) (1 text=2))");
}

TEST(MysqlConditions, IsNotNullHoldsTheWordsAsTheyAreWritten) {
    EXPECT_EQ(whereOf(u"x IS NOT NULL"), "(4 name=IS op type=247 (5 field=x) (1 text=NOT NULL))");
    EXPECT_EQ(whereOf(u"x is not null"), "(4 name=is op type=247 (5 field=x) (1 text=not null))");
}

TEST(MysqlConditions, BetweenHoldsTheColumnAndTheOperatorBetweenTheBounds) {
    EXPECT_EQ(whereOf(u"(x BETWEEN 1 AND 2)"),
              "(4 name=BETWEEN op type=121 (5 field=x) (4 name=AND op type=119 (1 text=1) (1 text=2)))");
    EXPECT_EQ(whereOf(u"(x NOT BETWEEN 1 AND 2)"), whereOf(u"(x BETWEEN 1 AND 2)")) << "NOT has no item";
}

TEST(MysqlConditions, LikeIsAnOperator) {
    EXPECT_EQ(whereOf(u"x LIKE 'a%'"), "(4 name=LIKE op type=250 (5 field=x) (2 text=a%))");
}

TEST(MysqlConditions, NotLeavesNoItem) {
    EXPECT_EQ(whereOf(u"NOT x = 1"), "(4 name== op type=319 (5 field=x) (1 text=1))");
}

TEST(MysqlConditions, ExistsHoldsTheQuery) {
    EXPECT_EQ(whereOf(u"EXISTS (SELECT b FROM u)"), "(4 name=EXISTS type=99 (6 name=SUB_QUERY query))");
    EXPECT_EQ(whereOf(u"NOT EXISTS (SELECT b FROM u)"),
              "(4 name=NOT EXISTS type=100 (6 name=SUB_QUERY query))");
}

TEST(MysqlExpressions, ARemainderIsItsFirstOperand) {
    EXPECT_EQ(selectOf(u"SELECT a % b, a * b FROM t"),
              "(5 field=a) (4 name=* op type=315 (5 field=a) (5 field=b))");
}

TEST(MysqlExpressions, LiteralsOfEveryKind) {
    EXPECT_EQ(selectOf(u"SELECT -1.5, 'a  b', '', '1/2/2000', NULL, NOT NULL FROM t"),
              "(1 text=-1.5) (2 text=a  b) (2 text= ) (3 text='1/2/2000') (1 text=NULL) (1 text=NOT NULL)");
}

// ---- clauses, nested queries

TEST(MysqlClauses, TablesOfAListStandSideBySide) {
    EXPECT_EQ(fromOf(u"SELECT a FROM t, d.u"), "(5 table=t) (5 table=u)");
}

TEST(MysqlClauses, ComputeForAndOptionYieldNothing) {
    const Analysed a = analysed(u"SELECT a FROM t COMPUTE SUM(a) FOR BROWSE OPTION FAST 1");
    EXPECT_EQ(listText(a.query.m_selectItems), "(5 field=a)");
    EXPECT_EQ(listText(a.query.m_fromItems), "(5 table=t)");
    EXPECT_EQ(a.query.m_whereItem, nullptr);
    EXPECT_TRUE(a.query.m_groupItems.IsEmpty() && a.query.m_havingItems.IsEmpty() &&
                a.query.m_orderItems.IsEmpty() && a.query.m_unionItems.IsEmpty());
}

TEST(MysqlClauses, WordsOfJoinsThatTheWalkDoesNotKnowAreLeftOut) {
    EXPECT_EQ(fromOf(u"SELECT a FROM t NATURAL LEFT OUTER JOIN u"),
              "(4 name=JOIN op type=87 (0 name=  op (5 table=t) (1 text=LEFT)) (5 table=u))");
    EXPECT_EQ(fromOf(u"SELECT a FROM t STRAIGHT JOIN u"),
              "(4 name=JOIN op type=87 (0 name=  op (5 table=t)) (5 table=u))");
}

TEST(MysqlNested, ASubQuerySaysSqlServer) {
    const Analysed a = analysed(u"SELECT a FROM t WHERE b IN (SELECT c FROM u)");
    const SelectItem& in = *a.query.m_whereItem->m_items.GetHead();
    const auto& subQuery = dynamic_cast<const SelectItemSubQuery&>(*in.m_items.GetTail());
    EXPECT_EQ(subQuery.m_name, u"SUB_QUERY");
    EXPECT_EQ(subQuery.m_query->DataType, 8);
    EXPECT_EQ(listText(subQuery.m_query->m_selectItems), "(5 field=c)");
}

TEST(MysqlNested, AUnionBranchSaysSqlServer) {
    const Analysed a = analysed(u"SELECT a FROM t UNION SELECT e FROM v");
    const auto& branch = dynamic_cast<const SelectItemUnion&>(*a.query.m_unionItems.GetHead());
    EXPECT_EQ(branch.m_name, u"UNION");
    EXPECT_EQ(branch.m_query->DataType, 8);
    EXPECT_EQ(listText(branch.m_query->m_fromItems), "(5 table=v)");
}

TEST(MysqlNested, AQueryInTheFirstClauseEndsTheAnalysis) {
    const Analysed a = analysed(u"SELECT (SELECT b FROM u) AS x FROM t");
    EXPECT_EQ(a.query.m_subQueries.GetCount(), 1);
    EXPECT_TRUE(a.query.m_selectItems.IsEmpty());
    EXPECT_TRUE(a.query.m_sourceTables.IsEmpty());
}

TEST(MysqlNested, TextWithoutASelectLeavesTheQueryAsItWas) {
    const Analysed a = analysed(u"UPDATE t SET a = 1");
    EXPECT_TRUE(a.query.m_selectItems.IsEmpty());
    EXPECT_TRUE(a.query.m_sourceTables.IsEmpty());
}

}  // namespace
