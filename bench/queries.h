#pragma once

#include <string>
#include <vector>

/// Fixed inputs of the benchmarks: shapes of text that grow in one way each. `n` counts what the name says.
namespace zr::bench {

inline std::string repeat(const std::string& what, int n) {
    std::string text;
    text.reserve(what.size() * static_cast<std::size_t>(n));
    for (int i = 0; i < n; ++i) text += what;
    return text;
}

inline std::string join(const std::string& what, const std::string& between, int n) {
    return n <= 0 ? std::string() : what + repeat(between + what, n - 1);
}

struct Family {
    const char* name;
    int n;  ///< the size at which the ratio time(2n)/time(n) is taken
    std::string (*text)(int n);
};

inline const std::vector<Family>& families() {
    static const std::vector<Family> all{
        {"parentheses", 500,
         [](int n) { return "SELECT " + repeat("(", n) + "a" + repeat(")", n) + " FROM t"; }},
        {"parentheses_before_alias", 500,
         [](int n) { return "SELECT " + repeat("(", n) + "a" + repeat(")", n) + ", b x FROM t"; }},
        {"calls", 500,
         [](int n) { return "SELECT " + repeat("ABS(", n) + "a" + repeat(")", n) + " FROM t"; }},
        {"calls_before_alias", 500,
         [](int n) { return "SELECT " + repeat("ABS(", n) + "a" + repeat(")", n) + ", b x FROM t"; }},
        {"calls_in_where", 500,
         [](int n) {
             return "SELECT a FROM t WHERE " + repeat("LOWER(", n) + "a" + repeat(")", n) + " = 1";
         }},
        {"aggregates", 500,
         [](int n) { return "SELECT " + repeat("SUM(", n) + "a" + repeat(")", n) + ", b x FROM t"; }},
        {"casts", 500,
         [](int n) { return "SELECT " + repeat("CAST(", n) + "a" + repeat(" AS INT)", n) + ", b x FROM t"; }},
        {"case", 500,
         [](int n) {
             return "SELECT " + repeat("CASE WHEN a = 1 THEN ", n) + "a" + repeat(" ELSE 0 END", n) +
                    " FROM t";
         }},
        {"subqueries_in", 500,
         [](int n) {
             return "SELECT a FROM t WHERE a IN (" + join("SELECT a FROM t", " WHERE a IN (", n) +
                    repeat(")", n);
         }},
        {"subqueries_from", 500,
         [](int n) { return repeat("SELECT a FROM (", n) + "SELECT a FROM t" + repeat(") x", n); }},
        {"subqueries_scalar", 500, [](int n) { return repeat("SELECT (", n) + "SELECT 1" + repeat(")", n); }},
        {"and_terms", 5000, [](int n) { return "SELECT a FROM t WHERE " + join("a = 1", " AND ", n); }},
        {"mixed_conditions", 1000,
         [](int n) {
             return "SELECT a FROM t WHERE " + join(
                                                   "(a = 1 OR b = 2) AND x IS NULL AND c BETWEEN 1 AND 2 AND "
                                                   "d LIKE 'x' AND e IN (1, 2, 3)",
                                                   " AND ", n);
         }},
        {"select_items", 5000, [](int n) { return "SELECT " + join("a", ", ", n) + " FROM t"; }},
        {"aliased_items", 5000, [](int n) { return "SELECT " + join("t.a AS b", ", ", n) + " FROM t"; }},
        {"mixed_items", 1000,
         [](int n) {
             return "SELECT " + join("t.a AS b, ISNULL(c, 0), a + b * 2, 'x y', COUNT(*) n", ", ", n) +
                    " FROM t";
         }},
        {"sum", 5000, [](int n) { return "SELECT " + join("a", " + ", n) + " FROM t"; }},
        {"union_branches", 1000, [](int n) { return join("SELECT a FROM t", " UNION ", n); }},
        {"joins", 250, [](int n) { return "SELECT a FROM t" + repeat(" JOIN t ON a = b", n); }},
        {"aliased_joins", 250,
         [](int n) {
             return "SELECT x.a FROM t x" +
                    repeat(" LEFT OUTER JOIN dbo.t AS y ON x.a = y.b AND x.c = y.d", n);
         }},
    };
    return all;
}

/// A query as people write them, of about 60 tokens, and the same shape grown.
inline std::string plainQuery(int blocks) {
    return "SELECT " +
           join("c.CustomerID, c.Name AS CustomerName, o.Total * 1.2 AS Gross, ISNULL(o.Note, 'none')", ", ",
                blocks) +
           " FROM dbo.Customers AS c INNER JOIN dbo.Orders AS o ON c.CustomerID = o.CustomerID WHERE " +
           join("o.Total > 100 AND c.City LIKE 'A%'", " AND ", blocks) + " ORDER BY c.Name DESC";
}

}  // namespace zr::bench
