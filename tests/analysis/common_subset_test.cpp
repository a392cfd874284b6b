// Plain queries that mean the same in every dialect come to the same descriptor, whichever dialect reads
// them. What differs on purpose is pinned below, one test each.
#include <gtest/gtest.h>

#include <string>
#include <string_view>

#include "tests/analysis/analysed.h"
#include "tests/analysis/plain_descriptor.h"

namespace {

// The dialects that are compared with SQL Server.
struct Compared {
    const char* name;
    DBTypes kind;
};
constexpr Compared kDialects[] = {
    {"mssql_20", DB_MSSQL_20},
    {"mysql", DB_MYSQL},
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
    u"SELECT a x, b y FROM t",
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
    u"SELECT a FROM t WHERE b IN (SELECT c FROM u)",
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
    for (const std::u16string_view sql : kQueries) {
        const std::string expected = plainDescriptor(Analysed(sql, DB_MSSQL).query);
        EXPECT_EQ(plainDescriptor(Analysed(sql, GetParam().kind).query), expected) << CString(sql).toUtf8();
        EXPECT_GT(expected.size(), std::string_view("predicate 0\n").size()) << CString(sql).toUtf8();
    }
}

INSTANTIATE_TEST_SUITE_P(Dialects, CommonSubset, testing::ValuesIn(kDialects),
                         [](const auto& dialect) { return dialect.param.name; });

}  // namespace
