#include "host/access_queries.h"

#include <gtest/gtest.h>

namespace zr::host {
namespace {

using Parts = std::vector<AccessQueryPart>;

std::string complaint(const Parts& parts) {
    try {
        return "text: " + textOfAccessQuery(parts);
    } catch (const NoAccessQuery& why) {
        return why.what();
    }
}

TEST(TextOfAccessQuery, HasColumnsTablesAndTheirAliases) {
    EXPECT_EQ(
        textOfAccessQuery({{1, 1, "", "", ""},
                           {5, 0, "orders", "o", ""},
                           {5, 0, "order lines", "", ""},
                           {6, 0, "", "", "o.id"},
                           {6, 0, "the sum", "", "o.price * [order lines].amount"},
                           {8, 0, "", "", "o.id > 5"},
                           {255, 0, "", "", ""}}),
        "SELECT o.id, o.price * [order lines].amount AS [the sum]\nFROM [orders] AS [o], [order lines]\n"
        "WHERE o.id > 5");
}

TEST(TextOfAccessQuery, HasOptionsGroupsAndOrder) {
    EXPECT_EQ(textOfAccessQuery({{3, 0x30, "10", "", ""},
                                 {5, 0, "t", "", ""},
                                 {6, 0, "", "", "a"},
                                 {6, 0, "n", "", "Count(*)"},
                                 {9, 0, "", "", "a"},
                                 {9, 0, "", "", "b"},
                                 {10, 0, "", "", "Count(*) > 1"},
                                 {11, 0, "D", "", "a"},
                                 {11, 0, "", "", "b"}}),
              "SELECT TOP 10 PERCENT a, Count(*) AS [n]\nFROM [t]\nGROUP BY a, b\nHAVING Count(*) > 1\n"
              "ORDER BY a DESC, b");
    EXPECT_EQ(textOfAccessQuery({{3, 0x09, "", "", ""}, {5, 0, "t", "", ""}}),
              "SELECT DISTINCTROW *\nFROM [t]");
    EXPECT_EQ(textOfAccessQuery({{3, 0x02, "", "", ""}, {5, 0, "t", "", ""}, {6, 0, "", "", "a"}}),
              "SELECT DISTINCT a\nFROM [t]");
}

TEST(TextOfAccessQuery, PutsJoinsOnJoinsIntoParentheses) {
    EXPECT_EQ(
        textOfAccessQuery({{5, 0, "a", "", ""},
                           {5, 0, "b", "", ""},
                           {5, 0, "c", "x", ""},
                           {5, 0, "alone", "", ""},
                           {6, 0, "", "", "a.id"},
                           {7, 1, "A", "b", "a.id = b.a"},
                           {7, 2, "b", "x", "b.id = x.b"},
                           {7, 1, "a", "b", "a.no = b.no"}}),
        "SELECT a.id\nFROM ([a] INNER JOIN [b] ON (a.id = b.a) AND (a.no = b.no)) LEFT JOIN [c] AS [x] ON "
        "b.id = x.b, [alone]");
    EXPECT_EQ(
        textOfAccessQuery(
            {{5, 0, "a", "", ""}, {5, 0, "b", "", ""}, {6, 0, "", "", "*"}, {7, 3, "b", "a", "a.id = b.a"}}),
        "SELECT *\nFROM [b] RIGHT JOIN [a] ON a.id = b.a");
}

TEST(TextOfAccessQuery, JoinsTheBranchesOfAUnion) {
    const AccessQueryPart one{5, 0, "", "X7YZ_____1", "SELECT a FROM t;\r\n"};
    const AccessQueryPart two{5, 0, "", "X7YZ_____2", "SELECT b FROM u"};
    EXPECT_EQ(textOfAccessQuery({{1, 9, "", "", ""}, {3, 0x03, "", "", ""}, one, two, {11, 0, "", "", "a"}}),
              "SELECT a FROM t\nUNION SELECT b FROM u\nORDER BY a");
    EXPECT_EQ(textOfAccessQuery({{1, 9, "", "", ""}, one, two}),
              "SELECT a FROM t\nUNION ALL SELECT b FROM u");
}

TEST(TextOfAccessQuery, KeepsTablesOfOtherFilesAndNestedSelections) {
    EXPECT_EQ(
        textOfAccessQuery(
            {{5, 0, "t", "", "C:\\old.mdb"}, {5, 0, "(SELECT a FROM u)", "v", ""}, {6, 0, "", "", "v.a"}}),
        "SELECT v.a\nFROM [C:\\old.mdb].[t], (SELECT a FROM u) AS [v]");
}

TEST(TextOfAccessQuery, IsTheStoredTextForAServer) {
    EXPECT_EQ(textOfAccessQuery({{1, 8, "", "", "exec all_orders"}}), "exec all_orders");
}

TEST(TextOfAccessQuery, TellsWhatHasNone) {
    EXPECT_EQ(complaint({{1, 4, "", "", ""}, {5, 0, "t", "", ""}, {6, 0, "a", "", "1"}}), "it changes data");
    EXPECT_EQ(complaint({{1, 6, "", "", ""}}), "it is a crosstab");
    EXPECT_EQ(complaint({{1, 9, "", "", ""}}), "it has no branches");
    EXPECT_EQ(complaint({}), "it has no columns");
    EXPECT_EQ(complaint({{5, 0, "a", "", ""}, {6, 0, "", "", "1"}, {7, 1, "a", "gone", "x"}}),
              "its join of a and gone can't be placed");
}

}  // namespace
}  // namespace zr::host
