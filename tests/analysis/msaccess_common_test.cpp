// Queries that MS Access and SQL Server read to the same descriptor. Aliases, joins, "*" and numbers with a
// fraction are not among them: the two walks differ there on purpose, as the other tests of MS Access show.
#include <gtest/gtest.h>

#include <string_view>

#include "tests/analysis/analysed.h"
#include "tests/analysis/plain_descriptor.h"

namespace {

constexpr std::u16string_view kQueries[] = {
    u"SELECT a FROM t",
    u"SELECT a, b, c FROM t",
    u"SELECT t.a, t.b FROM t",
    u"SELECT ALL a FROM t",
    u"SELECT DISTINCT a, b FROM t",
    u"SELECT 1 FROM t",
    u"SELECT 'two words' FROM t",
    u"SELECT NULL FROM t",
    u"select a from t where b = 1",
    u"SELECT a + b FROM t",
    u"SELECT a - b FROM t",
    u"SELECT a * b FROM t",
    u"SELECT a / b FROM t",
    u"SELECT a + b * c FROM t",
    u"SELECT a * b + c / 2 FROM t",
    u"SELECT a + b - c + 1 FROM t",
    u"SELECT (a + b) * c FROM t",
    u"SELECT COUNT(a) FROM t",
    u"SELECT SUM(a), AVG(b) FROM t",
    u"SELECT MIN(a), MAX(a) FROM t",
    u"SELECT ABS(a) FROM t",
    u"SELECT a FROM t WHERE ROUND(b, 2) > 1",
    u"SELECT LTRIM(RTRIM(a)) FROM t",
    u"SELECT ABS(a + b) FROM t WHERE ABS(c) > 1",
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
    u"SELECT a FROM t WHERE (b = 1 OR c = 2) AND e = 3",
    u"SELECT a FROM t WHERE b = 'x' AND YEAR(c) = 2020",
    u"SELECT a FROM t WHERE b IN (SELECT c FROM u)",
    u"SELECT a FROM t WHERE b IN (SELECT c FROM u) AND e = 1",
    u"SELECT a FROM t WHERE b = 1 AND c IN (SELECT c FROM u WHERE e = 2)",
    u"SELECT a FROM t GROUP BY a",
    u"SELECT a, b, SUM(c) FROM t GROUP BY a, b",
    u"SELECT a FROM t ORDER BY a",
    u"SELECT a FROM t ORDER BY a, b",
    u"SELECT a FROM t ORDER BY a ASC",
    u"SELECT a FROM t ORDER BY a DESC, b",
    u"SELECT a FROM t ORDER BY a, b DESC",
    u"SELECT a, SUM(b) FROM t WHERE c = 1 GROUP BY a HAVING SUM(b) > 10 ORDER BY a DESC",
    u"SELECT FROM t WHERE a = 1",
};

TEST(AccessCommonSubset, ComesToTheDescriptorOfSqlServer) {
    for (const std::u16string_view sql : kQueries)
        EXPECT_EQ(plainDescriptor(Analysed(sql, DB_MSACCESS).query),
                  plainDescriptor(Analysed(sql, DB_MSSQL).query))
            << CString(sql).toUtf8();
}

}  // namespace
