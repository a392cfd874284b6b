// zrsql project as its users meet it.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <filesystem>
#include <nlohmann/json.hpp>

#include "program.h"

namespace zr::test {
namespace {

using nlohmann::json;
using testing::AllOf;
using testing::HasSubstr;
using testing::StartsWith;

class ZrsqlProject : public testing::Test {
 protected:
    ZrsqlProject() : folder_(testing::TempDir() + "zrsql_project_XXXXXX") {
        EXPECT_NE(mkdtemp(folder_.data()), nullptr);
    }
    ~ZrsqlProject() override { std::filesystem::remove_all(folder_); }

    std::string path(const std::string& name) const { return folder_ + "/" + name; }
    static ProgramResult project(std::vector<std::string> words, const std::string& input = {}) {
        words.insert(words.begin(), "project");
        return runZrsql(words, input);
    }
    // What a command writes that has to succeed.
    static std::string output(const std::vector<std::string>& words, const std::string& input = {}) {
        const ProgramResult result = project(words, input);
        EXPECT_EQ(result.exitStatus, 0) << words.front() << ": " << result.errors;
        EXPECT_EQ(result.errors, "");
        return result.output;
    }
    // What a command complains about that has to fail with a status.
    static std::string errors(int status, const std::vector<std::string>& words) {
        const ProgramResult result = project(words);
        EXPECT_EQ(result.exitStatus, status) << words.front();
        EXPECT_EQ(result.output, "");
        EXPECT_THAT(result.errors, StartsWith("zrsql: "));
        return result.errors;
    }
    // A project with two tables and two queries, one of which reads from the other.
    std::string shop(const std::string& name) {
        const std::string file = path(name);
        output({"new", file, "-d", "mssql", "--schema", "dbo"});
        output({"add-table", file, "customers", "id:int", "name:varchar(50)", "--key", "id"});
        output({"add-table", file, "orders", "id:int", "customer_id", "total:decimal(10, 2)", "--key", "id",
                "--unique", "customer_id, id", "--references", "customer_id=customers(id)"});
        output(
            {"add-query", file, "named_orders",
             "SELECT o.id, c.name AS customer, total * 2 AS twice FROM orders o JOIN customers c ON c.id = "
             "o.customer_id"});
        output({"add-query", file, "large", "-f", "-"}, "SELECT customer, n.*\nFROM named_orders n\n");
        return file;
    }

 private:
    std::string folder_;
};

class ZrsqlProjectForm : public ZrsqlProject, public testing::WithParamInterface<std::string> {};

TEST_P(ZrsqlProjectForm, ListsWhatWasPutIn) {
    const std::string file = shop(GetParam());
    EXPECT_THAT(output({"list", file}),
                AllOf(HasSubstr("customers  2 columns, 1 index\n"),
                      HasSubstr("orders     3 columns, 2 indexes, 1 foreign key\n"),
                      HasSubstr("large         SELECT customer, n.* FROM named_orders n\n")));
}

TEST_P(ZrsqlProjectForm, ShowsTablesQueriesAndItself) {
    const std::string file = shop(GetParam());
    EXPECT_EQ(
        output({"show", file, "ORDERS"}),
        "Table orders\n\nColumns\n  id           int\n  customer_id\n  total        decimal(10, 2)\n"
        "\nIndexes\n  pk_orders    id               primary key\n  ux_orders_2  customer_id, id  unique\n"
        "\nForeign keys\n  fk_orders_1  customer_id  to customers (id)\n");
    EXPECT_EQ(output({"show", file, "large"}),
              "Query large\n\n  SELECT customer, n.*\n  FROM named_orders n\n");
    EXPECT_THAT(output({"show", file}), AllOf(HasSubstr("Dialect"), HasSubstr("mssql"), HasSubstr("dbo")));
}

TEST_P(ZrsqlProjectForm, ShowsWhereEachResultColumnComesFrom) {
    const std::string file = shop(GetParam());
    EXPECT_EQ(output({"analyze", file}),
              "Query named_orders\n\nColumns\n"
              "  1  id        o.id       from orders.id\n"
              "  2  customer  c.name     from customers.name\n"
              "  3  twice     total * 2  from orders.total\n"
              "\nSources\n  customers  table\n  orders     table\n"
              "\nQuery large\n\nColumns\n"
              "  1  customer  customer  from customers.name\n"
              "  2  id        *         from orders.id\n"
              "  3  customer  *         from customers.name\n"
              "  4  twice     *         from orders.total\n"
              "\nSources\n  named_orders  query\n");
}

TEST_P(ZrsqlProjectForm, IsACatalogueOfOtherQueries) {
    const std::string file = shop(GetParam());
    const auto answer = json::parse(
        runZrsql({"analyze", "-d", "mssql", "--catalog", file, "SELECT * FROM orders, large, other"}).output);
    EXPECT_EQ(answer["query"]["m_sourceTables"],
              json({{"orders", "{orders}"}, {"large", "{large}"}, {"other", "other"}}));
}

INSTANTIATE_TEST_SUITE_P(Forms, ZrsqlProjectForm, testing::Values("p.json", "p.db"),
                         [](const testing::TestParamInfo<std::string>& name) {
                             return name.param == "p.json" ? "Json" : "Sqlite";
                         });

TEST_F(ZrsqlProject, IsConvertedThereAndBackWithoutLoss) {
    const std::string file = shop("a.json");
    output({"convert", file, path("b.db")});
    output({"save", path("b.db"), path("c.json")});
    EXPECT_EQ(readFile(path("c.json")), readFile(file));
    output({"convert", path("b.db"), path("d"), "--form", "json"});
    EXPECT_EQ(readFile(path("d")), readFile(file));
    EXPECT_THAT(output({"list", path("b.db")}), HasSubstr("b.db: SQLite, mssql, schema dbo"));
}

TEST_F(ZrsqlProject, ReplacesAFileOnlyWhenTold) {
    const std::string file = shop("a.json");
    EXPECT_THAT(errors(1, {"new", file, "-d", "mssql"}), HasSubstr("a.json: is there already"));
    EXPECT_THAT(errors(1, {"convert", file, file}), HasSubstr("is there already"));
    output({"convert", file, file, "--force"});
    EXPECT_THAT(output({"list", file}), HasSubstr("large"));
    output({"new", file, "-d", "mssql", "--force"});
    EXPECT_EQ(output({"list", file}), file + ": JSON, mssql\n");
}

TEST_F(ZrsqlProject, BeginsWithTheTablesOfACatalogue) {
    output({"new", path("p.db"), "-d", "mssql", "--catalog", "examples/catalog.json"});
    EXPECT_THAT(output({"list", path("p.db")}), HasSubstr("order_lines  4 columns\n"));
    const std::string other = shop("other.json");
    output({"new", path("q.json"), "-d", "mssql", "--schema", "dbo", "--catalog", other});
    EXPECT_EQ(readFile(path("q.json")), readFile(other)) << "a whole project is taken over";
}

TEST_F(ZrsqlProject, HoldsDialectsThatAreNotInThisBuild) {
    for (const char* dialect : {"mysql", "oracle", "postgresql", "msaccess"}) {
        const std::string file = path(std::string(dialect) + ".json");
        output({"new", file, "-d", dialect});
        EXPECT_EQ(output({"list", file}), file + ": JSON, " + dialect + "\n");
    }
}

TEST_F(ZrsqlProject, AnalysisAsJsonTellsTheSame) {
    const std::string file = shop("a.json");
    const auto answer = json::parse(output({"analyze", file, "named_orders", "--format", "json"}));
    ASSERT_EQ(answer["queries"].size(), 1u);
    const auto& query = answer["queries"][0];
    EXPECT_EQ(query["name"], "named_orders");
    EXPECT_EQ(query["columns"][1],
              json({{"name", "customer"},
                    {"expression", "c.name"},
                    {"from", json::array({{{"table", "customers"}, {"column", "name"}, {"known", true}}})}}));
    EXPECT_EQ(query["sources"],
              json::array({{{"name", "customers"}, {"is", "table"}}, {{"name", "orders"}, {"is", "table"}}}));
    EXPECT_EQ(query["read"]["stop"], nullptr);
    EXPECT_EQ(json::parse(output({"analyze", file, "--format", "json"}))["queries"].size(), 2u);
}

TEST_F(ZrsqlProject, ColumnsAreFollowedThroughNestedQueriesAndUnions) {
    const std::string file = shop("a.json");
    output({"add-query", file, "nested",
            "SELECT x.who, x.n FROM (SELECT c.name AS who, o.total n FROM customers c, orders o) x"});
    output({"add-query", file, "both",
            "SELECT id FROM orders UNION SELECT id FROM customers UNION ALL SELECT twice FROM named_orders"});
    output({"add-query", file, "open",
            "SELECT id, nowhere.a, orders.nothing, total FROM orders, customers, nowhere"});
    EXPECT_EQ(
        output({"analyze", file, "nested"}),
        "Query nested\n\nColumns\n  1  who  x.who  from customers.name\n  2  n    x.n    from orders.total\n"
        "\nSources\n  customers  table\n  orders     table\n");
    EXPECT_THAT(output({"analyze", file, "both"}),
                HasSubstr("  1  id  id  from orders.id, customers.id, orders.total\n"));
    EXPECT_THAT(output({"analyze", file, "open"}),
                AllOf(HasSubstr("  1  id       id              from ?.id\n"), HasSubstr("from nowhere.a\n"),
                      HasSubstr("from orders.nothing\n"), HasSubstr("from orders.total\n"),
                      HasSubstr("nowhere    not in the project\n")));
}

TEST_F(ZrsqlProject, WrongTextsAreShownAsFarAsTheyAreRead) {
    const std::string file = shop("a.json");
    output(
        {"add-query", file, "stops", "SELECT id FROM orders WHERE id IN (SELECT id FROM customers) LIMIT 5"});
    output({"add-query", file, "nothing", "what is this"});
    EXPECT_THAT(output({"analyze", file, "stops"}),
                HasSubstr("\nRead 13 of 15 tokens; stopped at line 1, column 62, before \"LIMIT\"\n"));
    EXPECT_THAT(output({"analyze", file, "nothing"}), HasSubstr("Columns\n  none\n"));
}

TEST_F(ZrsqlProject, QueriesThatReadFromEachOtherAreNamed) {
    const std::string file = shop("a.json");
    output({"add-query", file, "one", "SELECT a FROM two"});
    output({"add-query", file, "two", "SELECT a FROM one"});
    EXPECT_EQ(
        errors(1, {"analyze", file}),
        "zrsql: " + file + ": queries read from each other in a ring: one reads from two reads from one\n");
}

TEST_F(ZrsqlProject, FailuresTellWhatAndWhere) {
    const std::string file = shop("a.json");
    EXPECT_THAT(errors(1, {"list", path("none.json")}),
                HasSubstr("none.json: can't be opened: No such file"));
    EXPECT_THAT(errors(1, {"show", file, "nothing"}), HasSubstr("there is no table or query nothing"));
    EXPECT_THAT(errors(1, {"analyze", file, "orders"}), HasSubstr("there is no query orders"));
    EXPECT_THAT(errors(1, {"add-table", file, "Orders", "a"}), HasSubstr("there is a table Orders already"));
    EXPECT_THAT(errors(1, {"add-query", file, "large", "SELECT 1"}),
                HasSubstr("there is a query large already"));
    EXPECT_THAT(errors(1, {"add-query", file, "x", ""}), HasSubstr("the text of the query is empty"));
    EXPECT_THAT(errors(1, {"add-query", file, "x", "-f", path("none.sql")}),
                HasSubstr("none.sql: No such file"));
    EXPECT_THAT(errors(1, {"convert", file, path("no/b.db")}), HasSubstr("no/b.db: "));
    EXPECT_THAT(errors(1, {"new", path("b.json"), "-d", "mssql", "--catalog", path("none")}),
                HasSubstr("none: "));
    const TemporaryFile wrong("{\n\"Format\": \"ZRParserSQL project\",\n\"Version\": 1,\n\"DBType\": 4\n}");
    EXPECT_EQ(errors(1, {"list", wrong.path()}),
              "zrsql: " + wrong.path() + ": line 4: there is no kind of database 4\n");
    const TemporaryFile text("SELECT a FROM t");
    for (const char* command : {"list", "show", "analyze"})
        EXPECT_THAT(errors(1, {command, text.path()}),
                    HasSubstr(text.path() + ": parse error at line 1, column 1"));
    const std::string before = readFile(file);
    EXPECT_EQ(before, readFile(shop("same.json"))) << "no failure left a trace";
}

TEST_F(ZrsqlProject, EachDialectExpandsTheStar) {
    for (const std::string dialect : {"mssql", "mysql", "oracle", "postgresql", "msaccess"}) {
        const std::string file = path(dialect + ".json");
        output({"new", file, "-d", dialect});
        output({"add-table", file, "t", "a", "b"});
        output({"add-query", file, "q", "SELECT t.* FROM t"});
        // The walk of MS Access has written the star out itself.
        const bool isWrittenOut = dialect == "msaccess";
        EXPECT_THAT(output({"analyze", file}),
                    AllOf(HasSubstr(isWrittenOut ? "  1  a  t.a  from t.a\n" : "  1  a  *  from t.a\n"),
                          HasSubstr(isWrittenOut ? "  2  b  t.b  from t.b\n" : "  2  b  *  from t.b\n")))
            << dialect;
    }
}

TEST_F(ZrsqlProject, ColumnsOfDeepNestingAreFollowed) {
    const std::string file = shop("a.json");
    constexpr int depth = 2000;
    std::string text;
    for (int level = 0; level < depth; ++level) text += "SELECT id FROM (";
    text += "SELECT id FROM orders";
    for (int level = 0; level < depth; ++level) text += ") x";
    output({"add-query", file, "deep", "-f", "-"}, text);
    EXPECT_THAT(output({"analyze", file, "deep"}), HasSubstr("  1  id  id  from orders.id\n"));
}

TEST_F(ZrsqlProject, WrongUseEndsWithStatus2) {
    const std::string file = shop("a.json");
    const std::vector<std::vector<std::string>> wrong = {
        {"new", path("x.json")},
        {"new", path("x.json"), "-d", "cobol"},
        {"new", path("x.json"), "-d", "mssqlfrom"},
        {"new", path("x.txt"), "-d", "mssql"},
        {"new", path("x"), "-d", "mssql", "--form", "xml"},
        {"convert", file, path("x")},
        {"convert", file},
        {"list"},
        {"nosuch", file},
        {"add-table", file},
        {"add-table", file, " "},
        {"add-table", file, "x", ":int"},
        {"add-table", file, "x", "a:"},
        {"add-table", file, "x", "a", "A"},
        {"add-table", file, "x", "a", "--key", "b"},
        {"add-table", file, "x", "a", "--unique", "a,,a"},
        {"add-table", file, "x", "a", "--references", "a"},
        {"add-table", file, "x", "a", "--references", "b=orders(id)"},
        {"add-table", file, "x", "a", "--references", "a=orders(id"},
        {"add-table", file, "x", "a", "--references", "a=(id)"},
        {"add-table", file, "x", "a", "--references", "a=orders(id,id)"},
        {"add-query", file, "x", "SELECT 1", "-f", "y"},
        {"analyze", file, "--format", "xml"},
    };
    for (const auto& words : wrong) errors(2, words);
    EXPECT_FALSE(std::filesystem::exists(path("x.json")));
    EXPECT_EQ(project({}).exitStatus, 2);
}

TEST_F(ZrsqlProject, HelpIsNoFailure) {
    EXPECT_THAT(output({"--help"}), AllOf(HasSubstr("add-table"), HasSubstr("convert")));
    for (const char* command :
         {"new", "add-table", "add-query", "list", "show", "convert", "save", "analyze"})
        EXPECT_THAT(output({command, "--help"}), HasSubstr("FILE")) << command;
}

}  // namespace
}  // namespace zr::test
