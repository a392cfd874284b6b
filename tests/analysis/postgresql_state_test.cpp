// What the PostgreSQL select state makes of real text: every step that differs from the common walk.
#include "analysis/postgresql_state.h"

#include <gtest/gtest.h>
#include <zrparsersql/recognizers/PostgreSQL_tokens.h>

#include <memory>
#include <set>

#include "tests/analysis/hand_made_tree.h"
#include "tests/analysis/postgresql_analysed.h"

namespace {

using Pg = PostgresqlAnalysed;

std::string selectOf(std::u16string_view sql) {
    return Pg(sql).select();
}
std::string fromOf(std::u16string_view sql) {
    return Pg(sql).from();
}
std::string whereOf(std::u16string_view sql) {
    return Pg(sql).where();
}
std::string orderOf(std::u16string_view sql) {
    return Pg(sql).order();
}
std::string tablesOf(std::u16string_view sql) {
    return keysOf(Pg(sql).query.m_sourceTables);
}
std::string fieldsOf(std::u16string_view sql) {
    return keysOf(Pg(sql).query.m_fields);
}
int predicateOf(std::u16string_view sql) {
    return Pg(sql).query.m_predicate;
}

const CZRQueryInfo& nestedOf(const SelectItem& item) {
    return *dynamic_cast<const SelectItemSubQuery&>(item).m_query;
}

TEST(PostgresqlState, KnowsItsOperators) {
    const std::set<unsigned int> operators{PostgreSQL_ALIAS,
                                           PostgreSQL_AS,
                                           PostgreSQL_AND,
                                           PostgreSQL_JOIN_KEYWORD,
                                           PostgreSQL_ON_KEYWORD,
                                           PostgreSQL_UNION_KEYWORD,
                                           PostgreSQL_AND_KEYWORD,
                                           PostgreSQL_OR_KEYWORD,
                                           PostgreSQL_BETWEEN_KEYWORD,
                                           PostgreSQL_IN_KEYWORD,
                                           PostgreSQL_NOT_IN_KEYWORD,
                                           PostgreSQL_AND_KEYWORD2,
                                           PostgreSQL_IS_KEYWORD,
                                           PostgreSQL_LIKE_KEYWORD,
                                           PostgreSQL_NOT_LIKE_KEYWORD,
                                           PostgreSQL_ASTERISK,
                                           PostgreSQL_EQ,
                                           PostgreSQL_PLUS,
                                           PostgreSQL_MINUS,
                                           PostgreSQL_L_T,
                                           PostgreSQL_GT,
                                           PostgreSQL_NOT_EQ,
                                           PostgreSQL_LE,
                                           PostgreSQL_GE,
                                           PostgreSQL_LOJ,
                                           PostgreSQL_GOJ,
                                           PostgreSQL_DIVIDE,
                                           PostgreSQL_AMPERSAND};
    ASSERT_EQ(operators.size(), 28u);
    HandMadeTree root(PostgreSQL_SELECT_QUERY_POST, u"");
    const PostgreStateSelectQuery state(&root);
    for (unsigned int type = 0; type < 1000; ++type) {
        HandMadeTree node(type, u"");
        EXPECT_EQ(state.IsOperator(&node), operators.contains(type)) << type;
    }
}

// ---- names

TEST(PostgresqlNames, ATableInASchemaHasBothNamesWithoutBackQuotes) {
    EXPECT_EQ(fromOf(u"SELECT a FROM `public`.`t`"), "(5 table=t schema=public)");
}

TEST(PostgresqlNames, ATableInADatabaseAndASchemaHasAllThreeNames) {
    EXPECT_EQ(fromOf(u"SELECT a FROM d1.public.t"), "(5 table=t schema=public db=d1)");
}

TEST(PostgresqlNames, ATableWithoutASchemaHasItsName) {
    EXPECT_EQ(fromOf(u"SELECT a FROM t, \"two words\""), "(5 table=t) (5 table=two words)");
}

TEST(PostgresqlNames, OfATableBehindASchemaTheFirstTokenCounts) {
    EXPECT_EQ(fromOf(u"SELECT a FROM public.\"two words\""), "(5 table=two schema=public)");
}

TEST(PostgresqlNames, ABackQuoteBehindTheFirstCharacterStays) {
    EXPECT_EQ(selectOf(u"SELECT \"a`b\" FROM t"), "(5 field=a`b)");
}

TEST(PostgresqlNames, BackQuotesAreTakenOffBothEndsOfATableItem) {
    HandMadeTree root(PostgreSQL_SELECT_QUERY_POST, u"");
    PostgreStateSelectQuery state(&root);
    const auto table = HandMadeTree::read("(12 \"\" (15 \"\" (353 \"`s1`\")) (16 \"\" (353 \"`t`\")))");
    const auto item = state.MakeTableItem(table.get());
    EXPECT_EQ(itemText(*item), "(5 table=t schema=`s1`)") << "only the table's name loses them";
}

TEST(PostgresqlNames, AnAliasedTableInASchemaHasTheSchemaForItsTable) {
    EXPECT_EQ(fromOf(u"SELECT a FROM public.t AS q"),
              "(4 name=ALIAS op type=20 (5 table=public) (1 text=q))");
    EXPECT_EQ(tablesOf(u"SELECT a FROM public.t AS q"), "t");
}

TEST(PostgresqlNames, AnAliasedTableInADatabaseHasAllItsNames) {
    EXPECT_EQ(fromOf(u"SELECT a FROM d1.public.t AS q"),
              "(4 name=ALIAS op type=20 (5 table=t schema=public db=d1) (1 text=q))");
}

TEST(PostgresqlNames, AColumnInASchemaAndDatabaseHasAllItsNames) {
    EXPECT_EQ(selectOf(u"SELECT public.t.a FROM public.t"), "(5 table=t field=a schema=public)");
    EXPECT_EQ(selectOf(u"SELECT d1.public.t.a FROM t"), "(5 table=t field=a schema=public db=d1)");
}

TEST(PostgresqlNames, AColumnInASchemaIsNoFieldOfTheFieldPass) {
    // The entry comes from the select list, where the table is not marked as read.
    const Pg a(u"SELECT public.t.a FROM public.t");
    EXPECT_EQ(keysOf(a.query.m_fields), "ta");
    EXPECT_EQ((*a.query.m_fields.Find(u"ta"))->m_hasTable, 0);
    EXPECT_EQ(fieldsOf(u"SELECT b FROM t WHERE a BETWEEN 1 AND f(public.t.c)"), "a|b|tc");
    EXPECT_EQ(fieldsOf(u"SELECT b FROM t LIMIT public.t.c"), "b") << "LIMIT is no clause of the walk";
}

TEST(PostgresqlNames, ACastIsPartOfTheFieldsName) {
    EXPECT_EQ(selectOf(u"SELECT a::int FROM t"), "(5 field=aCAST)");
    EXPECT_EQ(selectOf(u"SELECT t.a::int::text FROM t"), "(5 table=t field=aCAST)");
    EXPECT_EQ(fieldsOf(u"SELECT a::int FROM t"), "aCAST");
    EXPECT_EQ(tablesOf(u"SELECT a FROM t::text"), "tCAST");
}

TEST(PostgresqlNames, QuotedNamesKeepTheirBlanks) {
    EXPECT_EQ(selectOf(u"SELECT \"a  b\", \"x\".\"y z\" FROM \"x\""), "(5 field=a  b) (5 table=x field=y z)");
}

TEST(PostgresqlNames, UnitsOfIntervalsCannotBeNames) {
    for (const std::u16string_view unit : {u"s", u"S", u"d", u"D", u"m", u"M", u"h", u"H", u"y", u"Y"}) {
        EXPECT_EQ(selectOf(u"SELECT " + std::u16string(unit) + u" FROM t"), "") << CString(unit).toUtf8();
        EXPECT_EQ(selectOf(u"SELECT a AS " + std::u16string(unit) + u" FROM t"), "(5 field=a)");
    }
}

// ---- aliases

TEST(PostgresqlAliases, ABareColumnStaysAFieldThoughAnAliasHasItsName) {
    EXPECT_EQ(selectOf(u"SELECT x FROM t x"), "(5 field=x)");
    EXPECT_EQ(fieldsOf(u"SELECT x FROM t x"), "x");
    EXPECT_EQ(orderOf(u"SELECT a AS x FROM t ORDER BY x"), "(5 field=x)");
}

TEST(PostgresqlAliases, AQualifierThatIsAnAliasIsKeptAsOne) {
    EXPECT_EQ(selectOf(u"SELECT x.a FROM t x"), "(5 text=x field=a alias=x)");
    EXPECT_EQ(fieldsOf(u"SELECT x.a FROM t x"), "a");
    EXPECT_EQ(tablesOf(u"SELECT x.a FROM t x"), "t");
}

TEST(PostgresqlAliases, ANameInCapitalsIsNotFound) {
    // Keys are in lower case, and a name is looked up as it stands.
    EXPECT_EQ(selectOf(u"SELECT X.a FROM t X"), "(5 table=X field=a)");
    EXPECT_EQ(selectOf(u"SELECT x.a FROM t X"), "(5 text=x field=a alias=x)");
    EXPECT_EQ(fieldsOf(u"SELECT X.a FROM t X"), "Xa");
    EXPECT_EQ(tablesOf(u"SELECT T.a FROM T AS T"), "T");
    EXPECT_EQ(tablesOf(u"SELECT t.a FROM t AS T"), "");
}

TEST(PostgresqlAliases, KeysAreInLowerCaseAndNamesAsTheyStand) {
    const Pg a(u"SELECT b AS \"My Name\" FROM t AS X");
    EXPECT_EQ(keysOf(a.query.m_aliases), "my name|x");
    EXPECT_EQ((*a.query.m_aliases.Find(u"my name"))->GetName(), u"My Name");
    EXPECT_EQ((*a.query.m_aliases.Find(u"x"))->GetSrcName(), u"X");
}

TEST(PostgresqlAliases, TheFirstOfANameWins) {
    const Pg a(u"SELECT b AS x, c AS X FROM t");
    EXPECT_EQ(keysOf(a.query.m_aliases), "x");
    EXPECT_EQ((*a.query.m_aliases.Find(u"x"))->GetName(), u"x");
}

// ---- tables and fields

TEST(PostgresqlTables, SchemaAndDatabasePlayNoPart) {
    EXPECT_EQ(tablesOf(u"SELECT a FROM d1.public.t, sch.u"), "t|u");
    EXPECT_EQ(tablesOf(u"SELECT a FROM public.t AS t"), "")
        << "nothing forces a name that is an alias through";
}

TEST(PostgresqlTables, AQualifierIsATableToo) {
    EXPECT_EQ(tablesOf(u"SELECT v.a FROM t"), "t|v");
}

TEST(PostgresqlTables, NestedSelectsCount) {
    EXPECT_EQ(tablesOf(u"SELECT a FROM t WHERE b IN (SELECT c FROM u)"), "t|u");
}

TEST(PostgresqlFields, AllColumnsOfATableAreAnItemWithATableAndNoField) {
    const Pg a(u"SELECT t.* FROM t");
    EXPECT_EQ(a.select(), "(5 table=t)") << "and without an item for the asterisk";
    EXPECT_EQ(keysOf(a.query.m_fields), "t|t*");
    EXPECT_EQ((*a.query.m_fields.Find(u"t*"))->m_field, u"*");
    EXPECT_EQ((*a.query.m_fields.Find(u"t*"))->m_hasTable, 1);
    EXPECT_EQ((*a.query.m_fields.Find(u"t"))->m_field, u"");
}

TEST(PostgresqlFields, AllColumnsOfAnAliasAreAnItemWithTheAlias) {
    EXPECT_EQ(selectOf(u"SELECT x.* FROM t x"), "(5 text=x alias=x)");
    EXPECT_EQ(fieldsOf(u"SELECT x.* FROM t x"), "*");
}

TEST(PostgresqlFields, AnAsteriskByItselfWhereAColumnIsWantedIsAField) {
    EXPECT_EQ(Pg(u"SELECT a FROM t GROUP BY *").group(), "(5 field=*)");
}

TEST(PostgresqlFields, OfANestedSelectOnlyTheFirstClauseCounts) {
    // The rest comes with the nested descriptor.
    const Pg a(u"SELECT a FROM t WHERE b IN (SELECT c FROM u WHERE e = 1)");
    EXPECT_EQ(keysOf(a.query.m_fields), "a|b|c");
    EXPECT_EQ(keysOf(nestedOf(*a.query.m_whereItem->m_items.GetHead()->m_items.GetTail()).m_fields),
              "a|b|c|e");
}

// ---- predicates

TEST(PostgresqlPredicate, StandsForAllDistinctAndDistinctrow) {
    EXPECT_EQ(predicateOf(u"SELECT a FROM t"), 0);
    EXPECT_EQ(predicateOf(u"SELECT ALL a FROM t"), 1);
    EXPECT_EQ(predicateOf(u"SELECT DISTINCT a FROM t"), 2);
    EXPECT_EQ(predicateOf(u"SELECT DISTINCTROW a FROM t"), 3);
}

TEST(PostgresqlPredicate, StandsForTheFormsWithParenthesesToo) {
    EXPECT_EQ(predicateOf(u"SELECT ALL (a), FROM t"), 1);
    EXPECT_EQ(predicateOf(u"SELECT DISTINCT ON (a) b FROM t"), 2);
}

TEST(PostgresqlPredicate, AnAsteriskAloneIsOne) {
    const Pg a(u"SELECT * FROM t");
    EXPECT_EQ(a.query.m_predicate, 5);
    EXPECT_EQ(a.select(), "");
    EXPECT_EQ(a.from(), "(5 table=t)");
}

TEST(PostgresqlPredicate, AnAsteriskAloneHidesTheWordAheadOfIt) {
    EXPECT_EQ(predicateOf(u"SELECT DISTINCT * FROM t"), 5);
}

TEST(PostgresqlPredicate, AnAsteriskInAListIsAnOperator) {
    const Pg a(u"SELECT *, a FROM t");
    EXPECT_EQ(a.query.m_predicate, 0);
    EXPECT_EQ(a.select(), "(4 name=* op type=350) (5 field=a)");
}

TEST(PostgresqlPredicate, HasNoRowLimit) {
    const Pg a(u"SELECT a FROM t LIMIT 5, 10");
    EXPECT_EQ(a.query.m_hasLimit, 0);
    EXPECT_EQ(a.query.m_predicate, 0);
}

TEST(PostgresqlPredicate, IsTakenAwayByUnionAll) {
    EXPECT_EQ(predicateOf(u"SELECT DISTINCT a FROM t UNION SELECT b FROM u"), 2);
    EXPECT_EQ(predicateOf(u"SELECT DISTINCT a FROM t UNION ALL SELECT b FROM u"), 0);
}

// ---- select items

TEST(PostgresqlSelectItem, AUsersFunctionByItselfIsNoItem) {
    EXPECT_EQ(selectOf(u"SELECT f(a), b FROM t"), "(5 field=b)");
}

TEST(PostgresqlSelectItem, AUsersFunctionUnderAnOperatorIsOne) {
    Pg a(u"SELECT f(a) AS x FROM t");
    EXPECT_EQ(a.select(), "(4 name=ALIAS op type=20 (7 name=f type=353 (5 field=a)) (1 text=x))");
    EXPECT_EQ(*a.database.UserFunctions.Find(u"f"), u"1");
}

TEST(PostgresqlSelectItem, ANestedQueryIsNone) {
    EXPECT_EQ(whereOf(u"SELECT a FROM t WHERE (SELECT b FROM u)"), "");
}

TEST(PostgresqlSelectItem, ATypedLiteralIsNone) {
    EXPECT_EQ(selectOf(u"SELECT DATE '2020-01-02', INTERVAL '1 year', a FROM t"), "(5 field=a)");
    EXPECT_EQ(whereOf(u"SELECT a FROM t WHERE b > INTERVAL 'P1Y'"), "(4 name=> op type=368 (5 field=b))");
}

TEST(PostgresqlSelectItem, AConcatenationIsAFunctionWithItsParts) {
    EXPECT_EQ(selectOf(u"SELECT a || ' x' || LOWER(b) FROM t"),
              "(4 name=CONCAT_ARG type=62 (5 field=a) (2 text= x) (4 name=LOWER type=237 (5 field=b)))");
}

TEST(PostgresqlSelectItem, AnAliasedConcatenationKeepsItsFirstOperand) {
    EXPECT_EQ(selectOf(u"SELECT a || b AS x FROM t"), "(4 name=ALIAS op type=20 (5 field=a) (1 text=x))");
}

TEST(PostgresqlSelectItem, ACastBehindACallIsNone) {
    EXPECT_EQ(selectOf(u"SELECT LOWER(a)::text, b FROM t"),
              "(4 name=LOWER type=237 (5 field=a)) (5 field=b)");
}

// ---- orders

TEST(PostgresqlOrder, OnlyItsPresenceIsNotedAtTheFirstItem) {
    EXPECT_EQ(orderOf(u"SELECT a FROM t ORDER BY a DESC"), "(5 field=a (0))");
    EXPECT_EQ(orderOf(u"SELECT a FROM t ORDER BY a ASC"), "(5 field=a (0))");
    EXPECT_EQ(orderOf(u"SELECT a FROM t ORDER BY a, b DESC, c ASC"),
              "(5 field=a (0) (0)) (5 field=b) (5 field=c)");
}

TEST(PostgresqlOrder, WithoutItemsIsAnInvalidArgument) {
    HandMadeTree root(PostgreSQL_SELECT_QUERY_POST, u"");
    PostgreStateSelectQuery state(&root);
    CZRQueryInfo query;
    state.m_query = &query;
    HandMadeTree word(PostgreSQL_DESC_KEYWORD, u"DESC");
    EXPECT_THROW(state.ProcessOrder(&word, &query.m_orderItems), CInvalidArgException);
}

TEST(PostgresqlOrder, BehindAUsersFunctionAloneEndsTheAnalysis) {
    // The function is no item, so there is nothing that the direction could go to.
    const Pg a(u"SELECT a FROM t ORDER BY f(a) DESC UNION SELECT b FROM u");
    EXPECT_EQ(a.select(), "(5 field=a)");
    EXPECT_EQ(a.order(), "");
    EXPECT_TRUE(a.query.m_unionItems.IsEmpty());
}

// ---- operators and joins

TEST(PostgresqlJoin, AJoinHasItsSidesAndNoWords) {
    EXPECT_EQ(fromOf(u"SELECT a FROM t LEFT JOIN u ON t.id = u.id"),
              "(4 name=JOIN op type=111 (0 name=  op (5 table=t)) (5 table=u) "
              "(4 name=ON op type=125 (4 name== op type=354 (5 table=t field=id) (5 table=u field=id))))");
}

TEST(PostgresqlJoin, AJoinWithoutAPrefixGetsAnItemInItsPlace) {
    EXPECT_EQ(fromOf(u"SELECT a FROM t JOIN u ON b = c JOIN v ON e = f"),
              "(4 name=JOIN op type=111 (0 name=  op (5 table=t)) (5 table=u) "
              "(4 name=ON op type=125 (4 name== op type=354 (5 field=b) (5 field=c)))) "
              "(4 name=JOIN op type=111 (0 text= ) (5 table=v) "
              "(4 name=ON op type=125 (4 name== op type=354 (5 field=e) (5 field=f))))");
}

TEST(PostgresqlJoin, ATableInASchemaHasTheSchemaForItsTableInAJoin) {
    EXPECT_EQ(fromOf(u"SELECT a FROM sch.t CROSS JOIN d1.sch.u"),
              "(4 name=JOIN op type=111 (0 name=  op (5 table=sch)) (5 table=u schema=sch db=d1))");
}

TEST(PostgresqlJoin, ADerivedTableIsOnlyNamed) {
    EXPECT_EQ(fromOf(u"SELECT a FROM (SELECT b FROM u)"), "(0 name=select)");
    EXPECT_EQ(fromOf(u"SELECT a FROM (SELECT b FROM u) x"),
              "(4 name=ALIAS op type=20 (6 name=SUB_QUERY query) (1 text=x))");
}

// ---- conditions and functions

TEST(PostgresqlConditions, ALeafUnderAnOperatorIsNoItem) {
    EXPECT_EQ(whereOf(u"SELECT a FROM t WHERE b = @x"), "(4 name== op type=354 (5 field=b))")
        << "neither the sign nor the name behind it";
    HandMadeTree root(PostgreSQL_SELECT_QUERY_POST, u"");
    PostgreStateSelectQuery state(&root);
    CZRQueryInfo query;
    state.m_query = &query;
    const auto sum = HandMadeTree::read("(355 \"+\" (353 \"a\") (350 \"*\"))");
    state.ProcessExpression(sum.get(), &query.m_selectItems, nullptr);
    state.finish();
    EXPECT_EQ(listText(query.m_selectItems), "(4 name=+ op type=355)");
}

TEST(PostgresqlConditions, ConditionsTakeTheirParametersFromTheOperator) {
    EXPECT_EQ(whereOf(u"SELECT a FROM t WHERE b = 1 AND c LIKE 'x%'"),
              "(4 name=AND op type=144 (4 name== op type=354 (5 field=b) (1 text=1)) "
              "(4 name=LIKE op type=273 (5 field=c) (2 text=x%)))");
}

TEST(PostgresqlConditions, NotNullAndNullAreNumbers) {
    EXPECT_EQ(whereOf(u"SELECT a FROM t WHERE b IS NOT NULL"),
              "(4 name=IS op type=272 (5 field=b) (1 text=NOT NULL))");
    EXPECT_EQ(whereOf(u"SELECT a FROM t WHERE b IS NULL"),
              "(4 name=IS op type=272 (5 field=b) (1 text=NULL))");
}

TEST(PostgresqlConditions, ABetweenHasItsBoundsUnderAnAnd) {
    EXPECT_EQ(whereOf(u"SELECT a FROM t WHERE b BETWEEN 1 AND 2"),
              "(4 name=BETWEEN op type=146 (5 field=b) (4 name=AND op type=144 (1 text=1) (1 text=2)))");
}

TEST(PostgresqlConditions, ParametersEndAtTheParenthesisThatABetweenKeeps) {
    EXPECT_EQ(whereOf(u"SELECT a FROM t WHERE (b BETWEEN 1 AND 2)"),
              "(4 name=BETWEEN op type=146 (5 field=b) (4 name=AND op type=144 (1 text=1) (1 text=2)))");
}

TEST(PostgresqlConditions, ParametersEndAtTheParenthesisThatAListKeeps) {
    EXPECT_EQ(whereOf(u"SELECT a FROM t WHERE b IN ((1, 2), (3, 4))"),
              "(4 name=IN op type=148 (5 field=b) (1 text=1) (1 text=2))");
}

TEST(PostgresqlConditions, ACastBehindAnOperandIsNoItem) {
    EXPECT_EQ(whereOf(u"SELECT a FROM t WHERE (b + c)::int = 1"),
              "(4 name== op type=354 (4 name=+ op type=355 (5 field=b) (5 field=c)) (1 text=1))");
}

TEST(PostgresqlConditions, ANestedQueryIsAnItemWithADescriptorOfTheDialect) {
    const Pg a(u"SELECT a FROM t WHERE b IN (SELECT c FROM u)");
    EXPECT_EQ(a.where(), "(4 name=IN op type=148 (5 field=b) (6 name=SUB_QUERY query))");
    const CZRQueryInfo& nested = nestedOf(*a.query.m_whereItem->m_items.GetHead()->m_items.GetTail());
    EXPECT_EQ(nested.DataType, DB_POSTGRESQL);
    EXPECT_EQ(nested.m_database, &a.database);
    EXPECT_EQ(listText(nested.m_selectItems), "(5 field=c)");
}

TEST(PostgresqlFunctions, ABuiltInOneHasItsParameters) {
    EXPECT_EQ(orderOf(u"SELECT 1 ORDER BY COALESCE(a, 0), NOW()"),
              "(4 name=COALESCE type=331 (5 field=a) (1 text=0)) (4 name=NOW type=225)");
}

TEST(PostgresqlFunctions, AnAggregateOfAllRowsHasNoParameter) {
    EXPECT_EQ(selectOf(u"SELECT COUNT(*) FROM t"), "(4 name=COUNT type=317)");
}

TEST(PostgresqlFunctions, LikeAsAFunctionIsAnOperatorWithoutParameters) {
    EXPECT_EQ(orderOf(u"SELECT 1 ORDER BY LIKE(a, b), NOT LIKE(a, b)"),
              "(4 name=LIKE op type=273) (4 name=NOT LIKE op type=274)");
}

TEST(PostgresqlFunctions, AUsersOneWithAQuotedNameOfSeveralTokensHasTheFirst) {
    Pg a(u"SELECT \"my f\"(a) AS x FROM t");
    EXPECT_EQ(a.select(), "(4 name=ALIAS op type=20 (7 name=my type=353) (1 text=x))");
    EXPECT_EQ(*a.database.UserFunctions.Find(u"my"), u"0");
}

TEST(PostgresqlFunctions, ACaseHasItsPartsAsFunctions) {
    EXPECT_EQ(selectOf(u"SELECT CASE a WHEN 1 THEN b ELSE c END FROM t"),
              "(4 name=CASE type=326 (5 field=a) (4 name=WHEN type=327 (1 text=1)) (4 name=THEN type=328 (5 "
              "field=b)) "
              "(4 name=ELSE type=329 (5 field=c)))");
}

TEST(PostgresqlFunctions, AnExistsHasTheQuery) {
    EXPECT_EQ(whereOf(u"SELECT a FROM t WHERE EXISTS (SELECT b FROM u)"),
              "(4 name=EXISTS type=123 (6 name=SUB_QUERY query))");
}

TEST(PostgresqlFunctions, ACastIsAFunctionOverAs) {
    EXPECT_EQ(selectOf(u"SELECT CAST(a AS int) FROM t"),
              "(4 name=CAST type=310 (4 name=AS op type=51 (5 field=a) (1 text=int)))");
}

TEST(PostgresqlFunctions, TheFunctionEscapeDoesNotExist) {
    EXPECT_EQ(orderOf(u"SELECT 1 ORDER BY a + fN(b)"),
              "(4 name=+ op type=355 (5 field=a) (7 name=fN type=353 (5 field=b)))");
}

// ---- literals

TEST(PostgresqlLiterals, ANumberHasItsFirstTwoTokens) {
    EXPECT_EQ(selectOf(u"SELECT 1, -2, 1.5, -1.5, .5 FROM t"),
              "(1 text=1) (1 text=-2) (1 text=1.) (1 text=-1) (1 text=.5)");
}

TEST(PostgresqlLiterals, AStringHasItsTextAndAnEmptyOneABlank) {
    EXPECT_EQ(selectOf(u"SELECT 'two  words', '', 'a''b' FROM t"),
              "(2 text=two  words) (2 text= ) (2 text=a'b)");
}

TEST(PostgresqlLiterals, ADataTypeIsOneTextWithoutItems) {
    EXPECT_EQ(selectOf(u"SELECT CAST(a AS varchar(10)) FROM t"),
              "(4 name=CAST type=310 (4 name=AS op type=51 (5 field=a) (1 text=varcharNUMBER_LITERAL)))");
    EXPECT_EQ(selectOf(u"SELECT CAST(a AS double precision) FROM t"),
              "(4 name=CAST type=310 (4 name=AS op type=51 (5 field=a) (1 text=double precision)))");
}

TEST(PostgresqlLiterals, AStyleHasNoText) {
    EXPECT_EQ(orderOf(u"SELECT 1 ORDER BY CONVERT(int, a, 104)"),
              "(4 name=CONVERT type=397 (1 text=int) (5 field=a) (0))");
}

TEST(PostgresqlLiterals, ADateWithoutChildrenIsABlank) {
    HandMadeTree root(PostgreSQL_SELECT_QUERY_POST, u"");
    PostgreStateSelectQuery state(&root);
    CZRQueryInfo query;
    state.m_query = &query;
    for (const char* const text :
         {"(44 \"DATE\")", "(44 \"DATE\" (353 \"a\") (359 \"1\"))", "(353 \"`x`\" (353 \"`a`\"))"}) {
        const auto node = HandMadeTree::read(text);
        state.ProcessLiteral(node.get(), &query.m_selectItems);
    }
    EXPECT_EQ(listText(query.m_selectItems), "(3 text= ) (3 text=a1) (0 text=a)");
}

TEST(PostgresqlLiterals, ANotNullOfTwoWordsIsNotJoined) {
    HandMadeTree root(PostgreSQL_SELECT_QUERY_POST, u"");
    PostgreStateSelectQuery state(&root);
    CZRQueryInfo query;
    state.m_query = &query;
    const auto node = HandMadeTree::read("(43 \"\" (150 \"NOT\") (126 \"NULL\"))");
    state.ProcessLiteral(node.get(), &query.m_selectItems);
    EXPECT_EQ(listText(query.m_selectItems), "(1 text=NOTNULL)");
}

// ---- clauses, unions, nested queries

TEST(PostgresqlClauses, EachGoesToItsList) {
    const Pg a(u"SELECT a FROM t WHERE b = 1 GROUP BY a, c HAVING MAX(e) > 2 ORDER BY a LIMIT 3");
    EXPECT_EQ(a.select(), "(5 field=a)");
    EXPECT_EQ(a.from(), "(5 table=t)");
    EXPECT_EQ(a.where(), "(4 name== op type=354 (5 field=b) (1 text=1))");
    EXPECT_EQ(a.group(), "(5 field=a) (5 field=c)");
    EXPECT_EQ(a.having(), "(4 name=> op type=368 (4 name=MAX type=321 (5 field=e)) (1 text=2))");
    EXPECT_EQ(a.order(), "(5 field=a)");
}

TEST(PostgresqlClauses, AnOptionYieldsNothing) {
    const Pg a(u"SELECT a FROM t OPTION FAST 10");
    EXPECT_EQ(a.select(), "(5 field=a)");
    EXPECT_EQ(a.where(), "none");
}

TEST(PostgresqlClauses, AQueryWithNothingSelectedHasItsOtherClauses) {
    const Pg a(u"SELECT FROM t WHERE b = 1");
    EXPECT_EQ(a.select(), "");
    EXPECT_EQ(a.from(), "(5 table=t)");
    EXPECT_EQ(a.where(), "(4 name== op type=354 (5 field=b) (1 text=1))");
}

TEST(PostgresqlUnion, BranchesStandNestedWithTheDialectsDataType) {
    const Pg a(u"SELECT a FROM t UNION SELECT b FROM u UNION ALL SELECT c FROM v");
    EXPECT_EQ(listText(a.query.m_unionItems), "(8 name=UNION query)");
    const CZRQueryInfo& second =
        *dynamic_cast<const SelectItemUnion&>(*a.query.m_unionItems.GetHead()).m_query;
    EXPECT_EQ(second.DataType, DB_POSTGRESQL);
    EXPECT_EQ(listText(second.m_selectItems), "(5 field=b)");
    const CZRQueryInfo& third = *dynamic_cast<const SelectItemUnion&>(*second.m_unionItems.GetHead()).m_query;
    EXPECT_EQ(listText(third.m_selectItems), "(5 field=c)");
}

TEST(PostgresqlNested, ASelectInTheFirstClauseEndsTheAnalysis) {
    const Pg a(u"SELECT (SELECT b FROM u) FROM t");
    EXPECT_EQ(a.select(), "");
    EXPECT_EQ(a.from(), "");
    EXPECT_EQ(a.query.m_subQueries.GetCount(), 1);
    EXPECT_TRUE(a.query.m_sourceTables.IsEmpty());
}

TEST(PostgresqlNested, AWordAheadOfTheListIsTheFirstClause) {
    const Pg a(u"SELECT DISTINCT (SELECT b FROM u) FROM t");
    EXPECT_TRUE(a.query.m_subQueries.IsEmpty());
    EXPECT_EQ(a.from(), "(5 table=t)");
    EXPECT_EQ(a.query.m_predicate, 2);
}

TEST(PostgresqlNested, ASelectInTheFromListOfAQueryWithNothingSelectedEndsTheAnalysis) {
    const Pg a(u"SELECT FROM (SELECT b FROM u) x");
    EXPECT_EQ(a.query.m_subQueries.GetCount(), 1);
    EXPECT_EQ(a.from(), "");
}

TEST(PostgresqlNested, AParenthesisedQueryIsAnalysed) {
    EXPECT_EQ(selectOf(u"(SELECT a FROM t)"), "(5 field=a)");
}

// ---- statements that change data

TEST(PostgresqlStatements, AnInsertGivesItsTablesAndTheColumnsOfItsQuery) {
    const Pg a(u"INSERT INTO public.t (a, b) SELECT c, u.e FROM u WHERE f = 1");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t|u");
    EXPECT_EQ(keysOf(a.query.m_fields), "c|ue") << "a list of plain columns is none of column references";
    EXPECT_EQ(a.select(), "");
    EXPECT_EQ(a.from(), "");
    EXPECT_EQ(a.where(), "none");
    EXPECT_TRUE(a.query.m_subQueries.IsEmpty());
}

TEST(PostgresqlStatements, AnInsertOfValuesGivesItsTableAndAliases) {
    const Pg a(
        u"INSERT INTO t AS x (a) VALUES (b + 1, DEFAULT) ON CONFLICT (c) DO UPDATE SET e = f WHERE g = 1");
    EXPECT_EQ(keysOf(a.query.m_sourceTables), "t");
    EXPECT_EQ(keysOf(a.query.m_aliases), "x");
    EXPECT_EQ(keysOf(a.query.m_fields), "b|c|f|g");
    EXPECT_EQ(a.where(), "none") << "the condition of an action is no clause of the statement";
}

TEST(PostgresqlStatements, UpdateAndDeleteLeaveTheDescriptorAsItWas) {
    for (const std::u16string_view sql :
         {u"UPDATE t SET a = 1 WHERE b = 2", u"UPDATE ONLY t * SET a = (SELECT b FROM u)",
          u"DELETE FROM t WHERE a IN (SELECT b FROM u)", u"DELETE FROM t USING u RETURNING *",
          u"UPDATE 5 SET a = 1"}) {
        Pg a(u"SELECT a FROM t");
        a.again(sql, DB_POSTGRESQL);
        EXPECT_EQ(a.select(), "(5 field=a)") << CString(sql).toUtf8();
        EXPECT_EQ(keysOf(a.query.m_sourceTables), "t") << CString(sql).toUtf8();
        EXPECT_TRUE(a.query.m_subQueries.IsEmpty()) << CString(sql).toUtf8();
    }
}

TEST(PostgresqlStatements, ATextWithoutAStatementLeavesTheDescriptorAsItWas) {
    for (const std::u16string_view sql :
         {std::u16string_view(u""), std::u16string_view(u"hello"), std::u16string_view(u"INSERT INTO t"),
          std::u16string_view(u"((SELECT a))"), std::u16string_view(u"\xd800'\"")}) {
        const Pg a(sql);
        EXPECT_TRUE(a.query.m_sourceTables.IsEmpty());
        EXPECT_EQ(a.select(), "");
    }
}

TEST(PostgresqlStatements, NeverThrowWhereverTheTextIsCut) {
    constexpr std::u16string_view kSql =
        u"SELECT DISTINCT ON (a) CAST(a AS varchar(10))::text AS \"x z\", 'b''c' || INTERVAL '1 year 2m "
        u"ago', f(c, 1.5) "
        u"FROM ((t AS u INNER JOIN public.v ON (u.a = v.b AND e = 1)) LEFT JOIN w ON w.a = v.a), (SELECT g "
        u"FROM k) x1 "
        u"WHERE (a BETWEEN 1 AND 2) OR c NOT IN (SELECT e FROM w WHERE f = g (+)) GROUP BY a HAVING COUNT(*) "
        u"> 1 "
        u"ORDER BY a DESC LIMIT 5, 10 UNION ALL (SELECT g FROM k)";
    for (std::size_t length = 0; length <= kSql.size(); ++length) {
        EXPECT_NO_THROW(Pg{kSql.substr(0, length)}) << length;
        EXPECT_NO_THROW(Pg{kSql.substr(length)}) << length;
    }
}

}  // namespace
