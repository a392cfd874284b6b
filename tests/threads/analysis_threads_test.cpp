// Analyses on many threads at once find what one thread finds, over one database and over several. The thread
// sanitizer tells whether they do so without luck (./dev tsan -R threads).

#include <gtest/gtest.h>

#include <barrier>
#include <functional>
#include <memory>
#include <thread>
#include <vector>

#include "descriptor_json.h"
#include "host/catalog.h"
#include "host/registry.h"
#include "json_text.h"
#include "zrparsersql/analysis.h"

namespace zr::tool {
namespace {

constexpr int kThreads = 8;
constexpr int kRounds = 6;

struct Text {
    DBTypes kind;
    std::u16string_view sql;
};

const std::vector<Text>& plainTexts() {
    static const std::vector<Text> texts = {
        {DB_MSSQL, u"SELECT o.id, c.name AS customer FROM orders o JOIN customers c ON c.id = o.customer"},
        {DB_MSSQL,
         u"SELECT TOP 5 city, SUM(total) AS s FROM orders GROUP BY city HAVING SUM(total) > 5 ORDER BY city"},
        {DB_MSSQL,
         u"SELECT id FROM open_orders WHERE city IN (SELECT city FROM customers WHERE name LIKE 'a%')"},
        {DB_MSSQL, u"SELECT a FROM orders UNION ALL SELECT b FROM nowhere"},
        {DB_MYSQL,
         u"SELECT o.id, o.city FROM orders o, customers c WHERE o.customer = c.id AND c.name = 'x'"},
        {DB_MYSQL, u"SELECT COUNT(id) AS n FROM open_orders WHERE id IN (SELECT id FROM orders) LIMIT 3"},
        {DB_ORACLE,
         u"SELECT o.id, c.name FROM orders o, customers c WHERE o.customer = c.id(+) ORDER BY o.id"},
        {DB_ORACLE, u"SELECT city, MAX(total) AS top FROM open_orders GROUP BY city"},
        {DB_POSTGRESQL,
         u"SELECT o.id AS number, c.name FROM orders AS o LEFT JOIN customers AS c ON c.id = o.customer"},
        {DB_POSTGRESQL, u"INSERT INTO orders (id, city) SELECT id, city FROM open_orders"},
        {DB_MSACCESS,
         u"SELECT [orders.id], total AS t, t * 2 AS double FROM orders WHERE ((orders.city)='Gent')"},
        {DB_MSACCESS,
         u"SELECT x.id FROM (SELECT id FROM open_orders) AS x INNER JOIN customers ON customers.id = x.id"},
        {DB_MSSQL, u"what is this"},
        {DB_MYSQL, u"SELECT FROM (("},
        {DB_ORACLE, u"SELECT a FROM"},
        {DB_POSTGRESQL, u""},
    };
    return texts;
}

// With calls of user functions, which an analysis notes in the database.
const std::vector<Text>& allTexts() {
    static const std::vector<Text> texts = [] {
        std::vector<Text> all = plainTexts();
        all.push_back({DB_MSSQL, u"SELECT dbo.first_of(a, b) AS x FROM orders WHERE dbo.second_of(id) = 1"});
        all.push_back({DB_MSACCESS, u"SELECT third_of(id, 1, 2) AS x FROM orders"});
        all.push_back({DB_MSSQL, u"SELECT dbo.first_of(a) AS x FROM customers"});
        return all;
    }();
    return texts;
}

// Tables, and a query that others read from.
std::unique_ptr<host::Database> catalogue() {
    auto database = host::readCatalog(
        R"([{"table": "orders", "columns": ["id", "city", "customer", "total"], "id": "{7}"},
            {"table": "customers", "columns": ["id", "name", "city"]}])");
    database->SetSchemaName(u"shop");
    auto query = std::make_unique<host::Query>(DB_MSSQL);
    host::setNames(*query, u"open_orders");
    query->SetID(u"{9}");
    query->SetSQL(u"SELECT o.id, o.city AS city, o.total AS total FROM orders o WHERE o.total = 0");
    BuildQueryInfo(&database->addQuery(std::move(query)), DB_MSSQL);
    return database;
}

// What an analysis finds, and the user functions that it met.
std::string found(const Text& text, CZRDatabaseInfo& database, bool withUserFunctions) {
    if (withUserFunctions) database.UserFunctions.RemoveAll();
    CZRQueryInfo query;
    query.SetSQL(CString(text.sql));
    query.SetDatabase(&database);
    BuildQueryInfo(&query, text.kind);
    std::string result;
    appendQuery(result, query);
    if (withUserFunctions) appendTextMap(result, database.UserFunctions);
    return result;
}

std::vector<std::string> foundByOneThread(const std::vector<Text>& texts) {
    const auto database = catalogue();
    std::vector<std::string> all;
    for (const Text& text : texts) all.push_back(found(text, *database, true));
    return all;
}

// Each thread goes through all texts, from one of its own on, against the database that is made for it. All
// set out at once.
void expectTheSameOnAllThreads(const std::vector<Text>& texts, bool withUserFunctions,
                               const std::function<std::shared_ptr<CZRDatabaseInfo>()>& databaseOfThread) {
    const auto expected = [&] {
        if (withUserFunctions) return foundByOneThread(texts);
        const auto database = catalogue();
        std::vector<std::string> all;
        for (const Text& text : texts) all.push_back(found(text, *database, false));
        return all;
    }();
    std::vector<std::string> wrong(kThreads);
    {
        std::barrier start(kThreads);
        std::vector<std::jthread> threads;
        for (std::size_t thread = 0; thread < kThreads; ++thread)
            threads.emplace_back([&, thread, database = databaseOfThread()] {
                start.arrive_and_wait();
                for (std::size_t step = 0; step < kRounds * texts.size(); ++step) {
                    const std::size_t at = (step + 3 * thread) % texts.size();
                    const std::string result = found(texts[at], *database, withUserFunctions);
                    if (result != expected[at])
                        wrong[thread] += result + "\ninstead of\n" + expected[at] + "\n";
                }
            });
    }
    for (const std::string& text : wrong) EXPECT_EQ(text, "");
}

TEST(AnalysesOnThreads, HaveSomethingToCompare) {
    const auto all = foundByOneThread(allTexts());
    EXPECT_NE(all[0].find("\"{7}\""), std::string::npos) << "a table is resolved: " << all[0];
    EXPECT_NE(all[2].find("\"{9}\""), std::string::npos) << "a query is resolved: " << all[2];
    EXPECT_NE(all[plainTexts().size()].find("\"first_of\":\"2\""), std::string::npos)
        << "a user function is noted: " << all[plainTexts().size()];
    for (std::size_t at = 0; at < plainTexts().size(); ++at)
        EXPECT_TRUE(all[at].ends_with("{}")) << "no user function is called: " << all[at];
}

TEST(AnalysesOnThreads, MayShareADatabaseThatIsOnlyRead) {
    for (int round = 0; round < 3; ++round) {  // each time the first look-ups meet
        const std::shared_ptr<CZRDatabaseInfo> shared = catalogue();
        expectTheSameOnAllThreads(plainTexts(), false, [&shared] { return shared; });
    }
}

TEST(AnalysesOnThreads, MayHaveADatabaseEach) {
    expectTheSameOnAllThreads(allTexts(), true, [] { return std::shared_ptr<CZRDatabaseInfo>(catalogue()); });
}

TEST(AnalysesOnThreads, MayHaveACloneEach) {
    const auto original = catalogue();
    expectTheSameOnAllThreads(allTexts(), true,
                              [&] { return std::shared_ptr<CZRDatabaseInfo>(original->Clone()); });
}

TEST(AnalysesOnThreads, MayShareACatalogueAndHaveARegistryOfUserFunctionsEach) {
    const auto shared = catalogue();
    expectTheSameOnAllThreads(allTexts(), true, [&] { return std::make_shared<host::Registry>(*shared); });
    EXPECT_EQ(shared->UserFunctions.GetCount(), 0);
    EXPECT_EQ(shared->Tables.GetCount(), 2);
    EXPECT_EQ(shared->Queries.GetCount(), 1);
}

}  // namespace
}  // namespace zr::tool
