// Plain queries that mean the same in every dialect come to the same descriptor, whichever dialect reads
// them. What differs on purpose is pinned below, one test each.
#include <gtest/gtest.h>

#include <algorithm>
#include <span>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>

#include "tests/analysis/analysed.h"
#include "tests/analysis/plain_descriptor.h"

namespace {

// Queries that Oracle reads otherwise: a literal by itself is no item, SUBSTRING is no word of its own, and
// the ON of a join keeps its logical operators below it.
constexpr std::u16string_view kOtherwiseInOracle[] = {
    u"SELECT 1 FROM t",
    u"SELECT 1, 2.5, 'text' FROM t",
    u"SELECT '' FROM t",
    u"SELECT 'two words' FROM t",
    u"SELECT NULL FROM t",
    u"SELECT a FROM t WHERE SUBSTRING(b, 1, 3) = 'x'",
    u"SELECT a FROM t INNER JOIN u ON t.id = u.id AND t.k = u.k",
};

// Queries that PostgreSQL reads otherwise, as postgresql_differences_test.cpp pins one by one: a leaf is no
// item, such as the words of a join and the asterisk of COUNT(*), directions lose their word, a decimal
// number keeps its first two tokens, and YEAR is no function.
constexpr std::u16string_view kOtherwiseInPostgresql[] = {
    u"SELECT t.a, u.b FROM t INNER JOIN u ON t.id = u.id",
    u"SELECT 1, 2.5, 'text' FROM t",
    u"SELECT o.a, c.b FROM orders o INNER JOIN customers c ON o.id = c.id",
    u"SELECT t.a * u.b FROM t INNER JOIN u ON t.id = u.id",
    u"SELECT COUNT(*) FROM t",
    u"SELECT a FROM t WHERE b = 'x' AND YEAR(c) = 2020",
    u"SELECT a FROM t INNER JOIN u ON t.id = u.id",
    u"SELECT a FROM t LEFT JOIN u ON t.id = u.id",
    u"SELECT a FROM t RIGHT JOIN u ON t.id = u.id",
    u"SELECT a FROM t LEFT OUTER JOIN u ON t.id = u.id",
    u"SELECT a FROM t RIGHT OUTER JOIN u ON t.id = u.id",
    u"SELECT a FROM t CROSS JOIN u",
    u"SELECT a FROM t INNER JOIN u ON t.id = u.id AND t.k = u.k",
    u"SELECT a FROM t o INNER JOIN u p ON o.id = p.id WHERE o.b = 1",
    u"SELECT a FROM t INNER JOIN u ON t.id = u.id INNER JOIN v ON u.id = v.id",
    u"SELECT a FROM t LEFT JOIN u ON t.id = u.id LEFT JOIN v ON u.id = v.id WHERE t.b > 1",
    u"SELECT a, COUNT(*) FROM t GROUP BY a",
    u"SELECT a, COUNT(*) FROM t GROUP BY a HAVING COUNT(*) > 1",
    u"SELECT a FROM t ORDER BY a ASC",
    u"SELECT a FROM t ORDER BY a DESC, b",
    u"SELECT a FROM t ORDER BY a, b DESC",
    u"SELECT a, SUM(b) FROM t WHERE c = 1 GROUP BY a HAVING SUM(b) > 10 ORDER BY a DESC",
};

// The dialects that are compared with SQL Server.
struct Compared {
    const char* name;
    DBTypes kind;
    Differences differences = {};
    std::span<const std::u16string_view> otherwise = {};
};
constexpr Compared kDialects[] = {
    {"mssql_20", DB_MSSQL_20},
    {"mysql", DB_MYSQL},
    {"oracle",
     DB_ORACLE,
     {.aliasesAreKept = true, .stringsAreQuoted = true, .joinPartsAreNested = true},
     kOtherwiseInOracle},
    {"postgresql", DB_POSTGRESQL, {}, kOtherwiseInPostgresql},
};

constexpr std::u16string_view kQueries[] = {
    // Columns and literals.
    u"SELECT a FROM t",
    u"SELECT a, b, c FROM t",
    u"SELECT t.a, t.b FROM t",
    u"SELECT t.a, u.b FROM t INNER JOIN u ON t.id = u.id",
    u"SELECT ALL a FROM t",
    u"SELECT DISTINCT a, b FROM t",
    u"SELECT 1 FROM t",
    u"SELECT 1, 2.5, 'text' FROM t",
    u"SELECT '' FROM t",
    u"SELECT 'two words' FROM t",
    u"SELECT NULL FROM t",
    u"select a from t where b = 1",
    // Aliases.
    u"SELECT a AS x FROM t",
    u"SELECT a x, b z FROM t",
    u"SELECT a + b AS total FROM t",
    u"SELECT o.a FROM t o",
    u"SELECT o.a, o.b AS x FROM t AS o",
    u"SELECT o.a, c.b FROM orders o INNER JOIN customers c ON o.id = c.id",
    // Expressions.
    u"SELECT a + b FROM t",
    u"SELECT a - b FROM t",
    u"SELECT a * b FROM t",
    u"SELECT a / b FROM t",
    u"SELECT a + b * c FROM t",
    u"SELECT a * b + c / 2 FROM t",
    u"SELECT a + b - c + 1 FROM t",
    u"SELECT (a + b) * c FROM t",
    u"SELECT t.a * u.b FROM t INNER JOIN u ON t.id = u.id",
    // Functions.
    u"SELECT COUNT(*) FROM t",
    u"SELECT COUNT(a) FROM t",
    u"SELECT COUNT(DISTINCT a) FROM t",
    u"SELECT SUM(a), AVG(b) FROM t",
    u"SELECT MIN(a), MAX(a) FROM t",
    u"SELECT SUM(a) AS total FROM t",
    u"SELECT ABS(a) FROM t",
    u"SELECT a FROM t WHERE ROUND(b, 2) > 1",
    u"SELECT UPPER(a), LOWER(b) FROM t",
    u"SELECT LTRIM(RTRIM(a)) FROM t",
    u"SELECT a FROM t WHERE SUBSTRING(b, 1, 3) = 'x'",
    u"SELECT a FROM t ORDER BY REPLACE(b, 'x', 'y')",
    u"SELECT ABS(a + b) FROM t WHERE ABS(c) > 1",
    // Conditions.
    u"SELECT a FROM t WHERE b = 1",
    u"SELECT a FROM t WHERE b = 'x'",
    u"SELECT a FROM t WHERE b <> 1",
    u"SELECT a FROM t WHERE b != 1",
    u"SELECT a FROM t WHERE b < 1",
    u"SELECT a FROM t WHERE b > 1",
    u"SELECT a FROM t WHERE b <= 1",
    u"SELECT a FROM t WHERE b >= 1",
    u"SELECT a FROM t WHERE b = 1 AND c = 2",
    u"SELECT a FROM t WHERE b = 1 OR c = 2",
    u"SELECT a FROM t WHERE b = 1 AND c = 2 OR e = 3",
    u"SELECT a FROM t WHERE b LIKE 'x%'",
    u"SELECT a FROM t WHERE b IS NULL",
    u"SELECT a FROM t WHERE b IN (1, 2, 3)",
    u"SELECT a FROM t WHERE b IN ('x', 'y')",
    u"SELECT a FROM t WHERE b + c > 10",
    u"SELECT a FROM t WHERE t.b = t.c",
    u"SELECT a FROM t WHERE NOT b = 1",
    u"SELECT a FROM t WHERE (b = 1)",
    u"SELECT a FROM t WHERE (b = 1 OR c = 2) AND e = 3",
    u"SELECT a FROM t WHERE b = 1 AND (c = 2 OR e = 3)",
    u"SELECT a FROM t WHERE b = 'x' AND YEAR(c) = 2020",
    u"SELECT a FROM t WHERE b IN (SELECT c FROM u)",
    u"SELECT a FROM t WHERE b IN (SELECT c FROM u) AND e = 1",
    u"SELECT a FROM t WHERE b = 1 AND c IN (SELECT c FROM u WHERE e = 2)",
    // Joins.
    u"SELECT a FROM t JOIN u ON t.id = u.id",
    u"SELECT a FROM t INNER JOIN u ON t.id = u.id",
    u"SELECT a FROM t LEFT JOIN u ON t.id = u.id",
    u"SELECT a FROM t RIGHT JOIN u ON t.id = u.id",
    u"SELECT a FROM t LEFT OUTER JOIN u ON t.id = u.id",
    u"SELECT a FROM t RIGHT OUTER JOIN u ON t.id = u.id",
    u"SELECT a FROM t CROSS JOIN u",
    u"SELECT a FROM t INNER JOIN u ON t.id = u.id AND t.k = u.k",
    u"SELECT a FROM t o INNER JOIN u p ON o.id = p.id WHERE o.b = 1",
    u"SELECT a FROM t INNER JOIN u ON t.id = u.id INNER JOIN v ON u.id = v.id",
    u"SELECT x.a FROM (SELECT a FROM t) x",
    u"SELECT a FROM t LEFT JOIN u ON t.id = u.id LEFT JOIN v ON u.id = v.id WHERE t.b > 1",
    // Clauses.
    u"SELECT a FROM t GROUP BY a",
    u"SELECT a, COUNT(*) FROM t GROUP BY a",
    u"SELECT a, b, SUM(c) FROM t GROUP BY a, b",
    u"SELECT a, COUNT(*) FROM t GROUP BY a HAVING COUNT(*) > 1",
    u"SELECT a FROM t ORDER BY a",
    u"SELECT a FROM t ORDER BY a, b",
    u"SELECT a FROM t ORDER BY a ASC",
    u"SELECT a FROM t ORDER BY a DESC, b",
    u"SELECT a FROM t ORDER BY a, b DESC",
    u"SELECT a, SUM(b) FROM t WHERE c = 1 GROUP BY a HAVING SUM(b) > 10 ORDER BY a DESC",
    // Unions.
    u"SELECT a FROM t UNION SELECT b FROM u",
    u"SELECT a FROM t UNION ALL SELECT b FROM u",
    u"SELECT a FROM t UNION SELECT b FROM u UNION SELECT c FROM v",
    u"SELECT a FROM t WHERE b = 1 UNION SELECT a FROM u WHERE c = 2",
    // CASE.
    u"SELECT CASE WHEN a = 1 THEN b ELSE c END FROM t",
    u"SELECT CASE a WHEN 1 THEN 'x' WHEN 2 THEN 'y' ELSE 'z' END FROM t",
    // Text that ends the analysis early.
    u"SELECT (SELECT a FROM u) FROM t",
    u"SELECT FROM t WHERE a = 1",
};

class CommonSubset : public testing::TestWithParam<Compared> {};

TEST_P(CommonSubset, ComesToTheSameDescriptor) {
    const Compared& dialect = GetParam();
    int compared = 0;
    for (const std::u16string_view sql : kQueries) {
        if (std::find(dialect.otherwise.begin(), dialect.otherwise.end(), sql) != dialect.otherwise.end())
            continue;
        const std::string expected = plainDescriptor(Analysed(sql, DB_MSSQL).query);
        EXPECT_EQ(plainDescriptor(Analysed(sql, dialect.kind).query, dialect.differences), expected)
            << CString(sql).toUtf8();
        EXPECT_GT(expected.size(), std::string_view("predicate 0\n").size()) << CString(sql).toUtf8();
        ++compared;
    }
    EXPECT_GE(compared, 60);
}

TEST_P(CommonSubset, HoldsNothingThatIsReadOtherwiseForNoReason) {
    const Compared& dialect = GetParam();
    for (const std::u16string_view sql : dialect.otherwise) {
        EXPECT_NE(std::find(std::begin(kQueries), std::end(kQueries), sql), std::end(kQueries));
        EXPECT_NE(plainDescriptor(Analysed(sql, dialect.kind).query, dialect.differences),
                  plainDescriptor(Analysed(sql, DB_MSSQL).query))
            << CString(sql).toUtf8();
    }
}

INSTANTIATE_TEST_SUITE_P(Dialects, CommonSubset, testing::ValuesIn(kDialects),
                         [](const auto& dialect) { return dialect.param.name; });

// ---- differences, one by one

std::vector<std::string> linesOf(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) lines.push_back(line);
    return lines;
}

// The lines of one descriptor that the other has not, in order, with "; " between them.
std::string linesWithout(const std::vector<std::string>& lines, std::vector<std::string> others) {
    std::string text;
    for (const std::string& line : lines) {
        if (const auto found = std::find(others.begin(), others.end(), line); found != others.end())
            others.erase(found);
        else
            text += (text.empty() ? "" : "; ") + line;
    }
    return text;
}

// Pins what the descriptors of one text do not share: lines of SQL Server's alone, and of the other
// dialect's.
void expectDifference(std::u16string_view sql, DBTypes kind, std::string_view ofSqlServer,
                      std::string_view ofOther) {
    const std::vector<std::string> first = linesOf(plainDescriptor(Analysed(sql, DB_MSSQL).query));
    const std::vector<std::string> second = linesOf(plainDescriptor(Analysed(sql, kind).query));
    EXPECT_EQ(linesWithout(first, second), ofSqlServer) << CString(sql).toUtf8();
    EXPECT_EQ(linesWithout(second, first), ofOther) << CString(sql).toUtf8();
}

void expectMysql(std::u16string_view sql, std::string_view ofSqlServer, std::string_view ofMysql) {
    expectDifference(sql, DB_MYSQL, ofSqlServer, ofMysql);
}

TEST(DialectDifferences, MysqlTablesOfAListHaveNoCommaOverThem) {
    expectMysql(u"SELECT a FROM t, u", "from 4 name=, operator token;   item 5 table=t;   item 5 table=u",
                "from 5 table=t; from 5 table=u");
}

TEST(DialectDifferences, MysqlAllColumnsAreALiteral) {
    expectMysql(u"SELECT * FROM t", "field |*; select 5 field=*", "select 1 text=*");
}

TEST(DialectDifferences, MysqlAllColumnsOfATableAreTheTableWithoutAColumn) {
    expectMysql(u"SELECT t.* FROM t", "field t|*; select 5 table=t field=*", "field t|; select 5 table=t");
    expectMysql(u"SELECT o.* FROM t o", "field |*; select 5 text=o field=* alias=o",
                "select 5 text=o alias=o");
}

TEST(DialectDifferences, MysqlTopAndLimitAreNoLimit) {
    expectMysql(u"SELECT TOP 5 a FROM t", "limit 0 5", "");
    expectMysql(u"SELECT a FROM t LIMIT 5",
                "alias limit name=LIMIT source=LIMIT of=.; from 4 name=ALIAS operator token; "
                "  item 5 table=t;   item 1 text=LIMIT",
                "from 5 table=t");
}

TEST(DialectDifferences, MysqlDistinctRowIsAPredicate) {
    expectMysql(u"SELECT DISTINCTROW a FROM t",
                "predicate 0; alias a name=a source=a of=.; field |DISTINCTROW; "
                "select 4 name=ALIAS operator token;   item 5 field=DISTINCTROW;   item 1 text=a",
                "predicate 3; field |a; select 5 field=a");
}

TEST(DialectDifferences, MysqlBetweenNeedsItsParenthesesAndKeepsItsOperator) {
    expectMysql(u"SELECT a FROM t WHERE b BETWEEN 1 AND 2",
                "where 4 name=BETWEEN operator token;   item 5 field=b;   item 1 text=1; "
                "  item 1 text=2",
                "where 5 field=b");
    expectMysql(u"SELECT a FROM t WHERE (b BETWEEN 1 AND 2)", "  item 1 text=1;   item 1 text=2",
                "  item 4 name=AND operator token;     item 1 text=1;     item 1 text=2");
}

TEST(DialectDifferences, MysqlNotInIsACondition) {
    expectMysql(u"SELECT a FROM t WHERE b NOT IN (1, 2)", "",
                "field |b; where 4 name=NOT IN token;   item 5 field=b;   item 1 text=1; "
                "  item 1 text=2");
}

TEST(DialectDifferences, MysqlNotNullKeepsItsSpelling) {
    expectMysql(u"SELECT a FROM t WHERE b is not null", "  item 1 text=NOT NULL", "  item 1 text=not null");
}

TEST(DialectDifferences, MysqlAnAliasHidesNoColumnInTheMap) {
    expectMysql(u"SELECT a AS x FROM t ORDER BY x", "", "field |x");
}

TEST(DialectDifferences, MysqlOnlyAnAliasOfExactlyThatNameHidesATableInTheMap) {
    expectMysql(u"SELECT O.a FROM t O", "", "field O|a table");
    expectMysql(u"SELECT d.o.a FROM d.o o", "", "field |a");
}

TEST(DialectDifferences, MysqlACastLosesItsType) {
    expectMysql(u"SELECT CAST(a AS INT) FROM t",
                "  item 4 name=AS operator token;     item 5 field=a;     item 9 text=INT",
                "  item 5 field=a");
}

TEST(DialectDifferences, MysqlBracketsAreNoQuotes) {
    expectMysql(u"SELECT [a] FROM t", "field |a; select 5 field=a", "");
}

TEST(DialectDifferences, MysqlAnOwnerMakesNoFunction) {
    expectMysql(u"SELECT dbo.f(a) FROM t",
                "table t=t; field |a; select 7 name=f token;   item 5 field=a; from 5 table=t",
                "table dbo=dbo; field dbo|f; select 5 table=dbo field=f");
}

TEST(DialectDifferences, MysqlNothingButANumberHasASign) {
    expectMysql(u"SELECT -a FROM t", "field |a; select 4 name=- operator token;   item 5 field=a", "");
}

TEST(DialectDifferences, MysqlExistsIsACondition) {
    expectMysql(u"SELECT a FROM t WHERE EXISTS (SELECT b FROM u)", "",
                "table u=u; field |b; where 4 name=EXISTS token;   item 6 name=SUB_QUERY; "
                "    predicate 0;     table t=t;     table u=u;     field |a;     field |b; "
                "    select 5 field=b;     from 5 table=u");
}

TEST(DialectDifferences, MysqlThereIsNoFullJoin) {
    expectMysql(u"SELECT a FROM t FULL JOIN u ON t.a = u.a",
                "table u=u; field t|a; field u|a; from 4 name=JOIN operator token; "
                "  item 0 name=  operator;     item 5 table=t;   item 5 table=u; "
                "  item 4 name=ON operator token;     item 4 name== operator token; "
                "      item 5 table=t field=a;       item 5 table=u field=a",
                "from 5 table=t");
}

TEST(DialectDifferences, MysqlGroupsBeginWithAColumn) {
    expectMysql(u"SELECT a FROM t GROUP BY YEAR(a)", "group 4 name=YEAR token;   item 5 field=a", "");
}

TEST(DialectDifferences, MysqlANestedQueryBehindJoinEndsTheReading) {
    expectMysql(u"SELECT a FROM t INNER JOIN (SELECT b FROM u) x ON t.a = x.b",
                "alias x name=x source=x of=.; table u=u; field |b; field t|a; "
                "  item 4 name=ALIAS operator token;     item 6 name=SUB_QUERY;       predicate 0; "
                "      alias x name=x source=x of=.;       table t=t;       table u=u; "
                "      field |a;       field |b;       field t|a table;       select 5 field=b; "
                "      from 5 table=u;     item 1 text=x;   item 4 name=ON operator token; "
                "    item 4 name== operator token;       item 5 table=t field=a; "
                "      item 5 text=x field=b alias=x",
                "");
}

TEST(DialectDifferences, MysqlACommaBehindAJoinBelongsToItsCondition) {
    expectMysql(u"SELECT a FROM t INNER JOIN u ON t.id = u.id, v",
                "table v=v; from 4 name=, operator token;   item 4 name=JOIN operator token; "
                "    item 0 name=  operator;       item 5 table=t;       item 1 text=INNER; "
                "    item 5 table=u;     item 4 name=ON operator token; "
                "      item 4 name== operator token;         item 5 table=t field=id; "
                "        item 5 table=u field=id;   item 5 table=v",
                "field |v; from 4 name=JOIN operator token;   item 0 name=  operator; "
                "    item 5 table=t;     item 1 text=INNER;   item 5 table=u; "
                "  item 4 name=ON operator token;     item 4 name== operator token; "
                "      item 5 table=t field=id;       item 5 table=u field=id;       item 5 field=v");
}

TEST(DialectDifferences, MysqlAnItemTakesAStrayParenthesisSoThatACallMayEndBeforeIt) {
    expectMysql(u"SELECT ROUND(a, 2) FROM t",
                "field |a; select 4 name=ROUND token;   item 5 field=a;   item 1 text=2",
                "alias a name=a source=a of=.; select 4 name=ALIAS operator token; "
                "  item 4 name=ROUND token;   item 1 text=a; select 1 text=2");
    expectMysql(u"SELECT SUM(a * b) FROM t",
                "select 4 name=SUM token;   item 4 name=* operator token;     item 5 field=b",
                "select 4 name=* operator token;   item 4 name=SUM token;   item 5 field=b");
}

TEST(DialectDifferences, MysqlASourceListTakesAStrayParenthesisSoThatANestedQueryMayGoOn) {
    expectMysql(u"SELECT a FROM t WHERE b IN (SELECT c FROM u) UNION SELECT e FROM v",
                "field |e;     field |e; union 8 name=UNION;   predicate 0;   table t=t;   table u=u; "
                "  table v=v;   field |a;   field |b;   field |c;   field |e;   select 5 field=e; "
                "  from 5 table=v",
                "    union 8 name=UNION;       predicate 0;       table t=t;       table u=u; "
                "      table v=v;       field |a;       field |b;       field |c;       field |e; "
                "      select 5 field=e;       from 5 table=v");
}

void expectOracle(std::u16string_view sql, std::string_view ofSqlServer, std::string_view ofOracle) {
    expectDifference(sql, DB_ORACLE, ofSqlServer, ofOracle);
}

TEST(DialectDifferences, OracleAliasesOfColumnsKnowTheirKindAndColumn) {
    expectOracle(u"SELECT t.a AS x FROM t", "alias x name=x source=x of=.",
                 "alias x_FIELD name=x source=x of=t.a");
}

TEST(DialectDifferences, OracleAliasesOfTablesKnowTheirKindAndTable) {
    expectOracle(u"SELECT o.a FROM t o", "alias o name=o source=o of=.",
                 "alias o_TABLE name=o source=o of=t.; field t|a table");
}

TEST(DialectDifferences, OracleAnAliasOfAColumnHidesNoTable) {
    expectOracle(u"SELECT a x FROM x", "alias x name=x source=x of=.",
                 "alias x_FIELD name=x source=x of=.a; table x=x");
}

TEST(DialectDifferences, OracleAnAliasOfATableHidesNoColumn) {
    expectOracle(u"SELECT x FROM t x", "alias x name=x source=x of=.; select 5 text=x",
                 "alias x_TABLE name=x source=x of=t.; field |x; select 5 field=x");
}

TEST(DialectDifferences, OracleStringsKeepTheirQuotes) {
    expectOracle(u"SELECT a FROM t WHERE b = 'x y'", "  item 2 text=x y", "  item 2 text='x y'");
    expectOracle(u"SELECT a FROM t WHERE b = ''", "  item 2 text= ", "  item 2 text=''");
}

TEST(DialectDifferences, OracleALiteralByItselfIsNoItem) {
    expectOracle(u"SELECT 1, 'x', a FROM t", "select 1 text=1; select 2 text=x", "");
}

TEST(DialectDifferences, OraclePartsOfAJoinAreNested) {
    expectOracle(u"SELECT a FROM t JOIN u ON b = 1", "  item 0 name=  operator",
                 "  item 0 name=  operator nested");
}

TEST(DialectDifferences, OracleAJoinWithoutAPrefixGetsABlank) {
    expectOracle(u"SELECT a FROM JOIN u", "", "  item 0 text= ");
}

TEST(DialectDifferences, OracleOnStaysAboveItsLogicalOperators) {
    expectOracle(
        u"SELECT a FROM t JOIN u ON b = 1 AND c = 2",
        "  item 0 name=  operator;   item 4 name=AND operator token;     item 4 name=ON operator token;     "
        "item 4 name== operator token;       item 5 field=c;       item 1 text=2",
        "  item 0 name=  operator nested;   item 4 name=ON operator token;     item 4 name=AND operator "
        "token;       item 4 name== operator token;         item 5 field=c;         item 1 text=2");
}

TEST(DialectDifferences, OracleATopOfAShareIsALimit) {
    expectOracle(u"SELECT TOP 5 PERCENT a FROM t", "", "limit 0 5");
}

TEST(DialectDifferences, OracleNewNamesKeepTheirQuotesInTheirItem) {
    expectOracle(u"SELECT a AS \"My X\" FROM t", "alias my x name=My X source=My X of=.;   item 1 text=My X",
                 "alias my x_FIELD name=My X source=My X of=.a;   item 1 text=\"My X\"");
}

TEST(DialectDifferences, OracleWordsOfSqlServerAreUserFunctions) {
    expectOracle(u"SELECT SUBSTRING(a, 1), ISNULL(b, 0) FROM t",
                 "select 4 name=SUBSTRING token; select 4 name=ISNULL token",
                 "select 7 name=SUBSTRING token; select 7 name=ISNULL token");
}

TEST(DialectDifferences, OracleAUserFunctionNeedsNoOwner) {
    expectOracle(u"SELECT f(a) FROM t", "field |f; select 5 field=f",
                 "table t=t; field |a; select 7 name=f token;   item 5 field=a; from 5 table=t");
}

TEST(DialectDifferences, OracleBoundsStandUnderTheirOperator) {
    expectOracle(u"SELECT a FROM t WHERE b BETWEEN 1 AND 2", "  item 1 text=1;   item 1 text=2",
                 "  item 4 name=AND operator token;     item 1 text=1;     item 1 text=2");
}

TEST(DialectDifferences, OracleAllColumnsAreALiteral) {
    expectOracle(u"SELECT * FROM t", "field |*; select 5 field=*", "select 1 text=*");
}

TEST(DialectDifferences, OracleNotInIsAnIn) {
    expectOracle(
        u"SELECT a FROM t WHERE b NOT IN (1, 2)", "",
        "field |b; where 4 name=IN operator token;   item 5 field=b;   item 1 text=1;   item 1 text=2");
}

TEST(DialectDifferences, OracleAMinusSignIsNoPartOfAName) {
    expectOracle(u"SELECT a-b FROM t", "field |a-b; select 5 field=a-b",
                 "field |a; field |b; select 4 name=- operator token;   item 5 field=a;   item 5 field=b");
}

TEST(DialectDifferences, OracleGroupsBeginWithAColumn) {
    expectOracle(u"SELECT a FROM t GROUP BY YEAR(a)", "group 4 name=YEAR token;   item 5 field=a", "");
}

TEST(DialectDifferences, OracleConcatenationIsAnOperator) {
    expectOracle(u"SELECT a || b FROM t", "select 5 field=a",
                 "table t=t; field |b; select 4 name=|| operator token;   item 5 field=a;   item 5 field=b; "
                 "from 5 table=t");
}

TEST(DialectDifferences, OracleAComparisonTakesTheItemsAroundIt) {
    expectOracle(u"SELECT a, b = 1 FROM t", "select 5 field=a", "  item 5 field=a");
}

TEST(DialectDifferences, OracleATableBehindAJoinBelongsToItsCondition) {
    expectOracle(
        u"SELECT a FROM t INNER JOIN u ON t.id = u.id, v",
        "table v=v; from 4 name=, operator token;   item 4 name=JOIN operator token;     item 0 name=  "
        "operator;       item 5 table=t;       item 1 text=INNER;     item 5 table=u;     item 4 name=ON "
        "operator token;       item 4 name== operator token;         item 5 table=t field=id;         item 5 "
        "table=u field=id;   item 5 table=v",
        "field |v; from 4 name=JOIN operator token;   item 0 name=  operator nested;     item 5 table=t;     "
        "item 1 text=INNER;   item 5 table=u;   item 4 name=ON operator token;     item 4 name== operator "
        "token;       item 5 table=t field=id;       item 5 table=u field=id;       item 5 field=v");
}

}  // namespace
