// Machine stack that deep queries of each dialect need, from the text to the end of the descriptor: it is the
// same for ten levels as for ten thousand.
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "tests/analysis/analysed.h"
#include "tests/parser/small_stack.h"
#include "zrparsersql/sql_parsers.h"

namespace {

std::u16string repeated(std::u16string_view text, int count) {
    std::u16string all;
    for (int i = 0; i < count; ++i) all += text;
    return all;
}

/// A text that is the deeper the larger the number.
struct Shape {
    const char* name;
    std::u16string (*of)(int depth);
};

const Shape kShapes[] = {
    {"Parentheses",
     [](int depth) {
         return u"SELECT a FROM t WHERE b = " + repeated(u"(", depth) + u"c" + repeated(u")", depth);
     }},
    {"Operators", [](int depth) { return u"SELECT a AS x FROM t WHERE b = c" + repeated(u" + c", depth); }},
    {"Conditions", [](int depth) { return u"SELECT a FROM t WHERE b = 1" + repeated(u" AND b = 1", depth); }},
    {"SubQueries",
     [](int depth) {
         return repeated(u"SELECT a FROM t WHERE b IN (", depth) + u"SELECT c FROM u" + repeated(u")", depth);
     }},
    {"Unions", [](int depth) { return u"SELECT a FROM t" + repeated(u" UNION SELECT a FROM t", depth); }},
    {"Calls",
     [](int depth) {
         return u"SELECT a FROM t WHERE b = " + repeated(u"ABS(", depth) + u"t.c" + repeated(u")", depth);
     }},
    {"NoSql", [](int depth) { return u"SELECT " + repeated(u"(SELECT (", depth); }},
};

struct Dialect {
    const char* name;
    DBTypes kind;
    void (*walk)(CString& text);
};

/// Goes over all nodes of the tree, without a stack of its own that is the machine's.
template <class Facade>
void walk(CString& text) {
    Facade facade;
    facade.SetSQL(text);
    facade.ParseSQL();
    CZRSQLTree* root = nullptr;
    facade.GetSQLTree(&root);
    const std::unique_ptr<CZRSQLTree> owned(root);
    std::size_t nodes = 0;
    std::vector<CZRSQLTree*> open{root};
    while (!open.empty()) {
        CZRSQLTree* const node = open.back();
        open.pop_back();
        nodes += node->GetText().IsEmpty() ? 0 : 1;
        for (unsigned int i = 0; i < node->GetChildCount(); ++i) open.push_back(node->GetChild(i));
    }
    EXPECT_GT(nodes, 0U);
}

const Dialect kDialects[] = {
    {"Mssql", DB_MSSQL, &walk<CZRMSSQLParser>},
    {"Mysql", DB_MYSQL, &walk<CZRMySQLParcer>},
    {"Oracle", DB_ORACLE, &walk<CZROracleParser>},
    {"Postgresql", DB_POSTGRESQL, &walk<CZRPostgreParser>},
    {"Msaccess", DB_MSACCESS, &walk<CZRMSAccessSQL_v3Parcer>},
};

std::size_t stackFor(const Dialect& dialect, const std::u16string& sql) {
    return onSmallStack([&] {
        CString text(sql);
        dialect.walk(text);
        auto analysed = std::make_unique<Analysed>(sql, dialect.kind);
        const std::unique_ptr<CZRQueryInfo> copy(analysed->query.Clone());
        analysed.reset();
    });
}

class StackUse : public testing::TestWithParam<std::tuple<Dialect, Shape>> {};

TEST_P(StackUse, IsTheSameAtAnyDepth) {
    constexpr int kShallow = 10, kDeep = 10'000;
    // Frames differ with what a query has; recursion of a dozen bytes a level would be seen.
    constexpr std::size_t kSlack = 16 * 1024;
    const auto& [dialect, shape] = GetParam();
    const std::size_t shallow = stackFor(dialect, shape.of(kShallow));
    const std::size_t deep = stackFor(dialect, shape.of(kDeep));
    EXPECT_GT(shallow, 0U);
    EXPECT_LE(deep, shallow + kSlack);
    RecordProperty("shallow_bytes", static_cast<int>(shallow));
    RecordProperty("deep_bytes", static_cast<int>(deep));
}

INSTANTIATE_TEST_SUITE_P(Queries, StackUse,
                         testing::Combine(testing::ValuesIn(kDialects), testing::ValuesIn(kShapes)),
                         [](const auto& where) {
                             return std::string(std::get<0>(where.param).name) +
                                    std::get<1>(where.param).name;
                         });

}  // namespace
