// Projects made of a MariaDB server that runs for these tests.

#include <csignal>
#include <fstream>

#include "broken_line.h"
#include "expected_lineage.h"
#include "host/catalog_reader.h"
#include "host/project.h"
#include "imports.h"

namespace zr::test {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;

const std::string kClient = "MYSQL_PWD= mariadb --no-defaults -S FOLDER/socket -u root -N -B ";

class Server : public testing::Environment {
 public:
    void SetUp() override {
        running.start(kClient + "-e 'SELECT 1'");
        if (!running.absence().empty()) return;
        const std::string shop = "tests/servers/shop/";
        running.shell("(echo 'CREATE DATABASE shop; USE shop;'; cat " + shop + "tables.sql " + shop +
                      "views.sql " + shop + "views_mariadb.sql) | " + kClient);
        running.shell(kClient + "< tests/servers/odd_mariadb.sql");
    }
    void TearDown() override { running.stop(); }

    static PrivateServer running;
};
PrivateServer Server::running(ZR_SOURCE_DIR "/tests/servers/run_mariadb.sh", SIGTERM);
const auto* const server = testing::AddGlobalTestEnvironment(new Server);

class FromMariaDb : public ServerTest {
 protected:
    FromMariaDb() : ServerTest(Server::running) {}

    static std::string address(const std::string& rest, const std::string& port = Server::running.port()) {
        return "mariadb://reader@127.0.0.1:" + port + "/" + rest;
    }
    std::string failure(const std::string& given) const { return failureOf(given, "mysql"); }
    std::string sql(const std::string& statement) const {
        return server.shell(kClient + "-e \"" + statement + "\"").output;
    }

    // The client's files of whoever runs the tests are out of it.
    const Variable home{"HOME", "/nonexistent"};
    const Variable password{"MYSQL_PWD", "secret of reader"};
};

TEST_F(FromMariaDb, TheLineageIsTheExpectedOne) {
    const ProgramResult made = import(address("shop"), "mysql");
    ASSERT_EQ(made.exitStatus, 0) << made.errors;
    EXPECT_EQ(made.summary, "40 tables and 60 queries done");

    expectLineage(project(), {"lineage.txt", "lineage_mariadb.txt"}, "gaps_mariadb.txt");
}

TEST_F(FromMariaDb, TheOtherNameOfTheAddressAndTheSocketServeAsWell) {
    const std::string socket = "mysql://reader@localhost/?schema=shop&socket=" + server.folder() + "/socket";
    EXPECT_EQ(import(socket, "mysql").summary, "40 tables and 60 queries done");
}

TEST_F(FromMariaDb, RowsHaveTypesKeysAndFunctions) {
    host::CatalogRows rows;
    host::readerFor(address("odd%20one"))->read(rows);
    std::vector<std::string> columns;
    for (const auto& row : rows.columns)
        columns.push_back(row.table.toUtf8() + "." + row.name.toUtf8() + " " + row.type.toUtf8());
    EXPECT_THAT(columns,
                ElementsAre("child.id int(11)", "child.a int(11)", "child.b varchar(20)",
                            "t `x` \u00e9.Id int(11)", "t `x` \u00e9.word varchar(20)",
                            "t `x` \u00e9.kind enum('a','b')", "t `x` \u00e9.amount decimal(10,2) unsigned"))
        << "tables alone: the columns of views come with their text";
    std::vector<std::string> keys;
    for (const auto& row : rows.keys)
        keys.push_back(row.table.toUtf8() + " " + row.name.toUtf8() + " " +
                       std::to_string(static_cast<int>(row.kind)) + " " + row.column.toUtf8() +
                       std::to_string(row.place) + " " + row.referencedTable.toUtf8() + "." +
                       row.referencedColumn.toUtf8());
    EXPECT_THAT(keys, ElementsAre("child PRIMARY 0 id1 .", "child to_t 2 b1 t `x` \u00e9.word",
                                  "child to_t 2 a2 t `x` \u00e9.Id", "t `x` \u00e9 pair 1 word1 .",
                                  "t `x` \u00e9 pair 1 Id2 .", "t `x` \u00e9 PRIMARY 0 Id1 ."));
    ASSERT_EQ(rows.functions.size(), 1u) << "no procedure";
    EXPECT_EQ(rows.functions[0].name, u"twice");
    EXPECT_EQ(rows.functions[0].parameters, 2);
    ASSERT_EQ(rows.views.size(), 1u);
    EXPECT_THAT(rows.views[0].text->toUtf8(), HasSubstr("`odd one`.`child`"));
}

TEST_F(FromMariaDb, AViewWhoseTextTheUserMayNotSeeIsLeftOutWithALine) {
    const Variable other("MYSQL_PWD", "");
    const ProgramResult result = import("mariadb://guest@127.0.0.1:" + server.port() + "/shop", "mysql");
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    const auto lines = splitLines(result.errors);
    EXPECT_EQ(lines.size(), 60u);
    EXPECT_EQ(lines.at(0),
              "zrsql: mariadb://guest@127.0.0.1:" + server.port() +
                  "/shop: view all_products: left out; the server does not tell its text, for which the "
                  "user needs the right SHOW VIEW");
    EXPECT_EQ(result.summary, "40 tables and 0 queries done, 60 left out");
}

TEST_F(FromMariaDb, AReadingThatEndsWhileViewsAreReadCanBeGoneOnWith) {
    ASSERT_EQ(import(address("shop"), "mysql").exitStatus, 0);
    const std::string whole = readFile(project());

    struct End {};
    host::CatalogReading reading;
    reading.look = [](const host::CatalogRows& rows) {
        if (rows.isWholeButViews) throw End();
    };
    host::CatalogRows rows;
    const auto reader = host::readerFor(address("shop"));
    EXPECT_THROW(reader->read(rows, reading), End);
    EXPECT_EQ(rows.views.size(), 60u);
    host::saveProject(*host::makeDatabase(rows, DB_MYSQL, reader->schema()), project(),
                      host::StorageForm::Json);
    EXPECT_FALSE(readFile(project()) == whole);

    const ProgramResult rest = runZrsql({"project", "import", address("shop"), project(), "--continue"});
    EXPECT_EQ(rest.summary, "0 tables and 10 queries done, 40 tables and 50 queries there before");
    EXPECT_TRUE(readFile(project()) == whole);
}

TEST_F(FromMariaDb, AViewThatNoLongerHoldsDoesNotKeepTheRestFromComing) {
    sql("CREATE TABLE shop.short_lived (a INT); CREATE VIEW shop.orphan AS SELECT a FROM shop.short_lived; "
        "DROP TABLE shop.short_lived");
    const ProgramResult result = import(address("shop"), "mysql");
    sql("DROP VIEW shop.orphan");
    EXPECT_EQ(result.summary, "40 tables and 61 queries done") << result.errors;
}

TEST_F(FromMariaDb, ASchemaWithoutRightsIsNotThereForTheUser) {
    EXPECT_EQ(
        failure(address("secret")),
        address("secret") + ": there is no schema \"secret\" that the user may see; there are odd one, shop");
}

TEST_F(FromMariaDb, AllSchemasThatTheUserMaySeeAreRead) {
    EXPECT_THAT(import(address(""), "mysql").summary, testing::StartsWith("42 tables and 61 queries done"));
}

TEST_F(FromMariaDb, ThePasswordComesFromTheClientsFileToo) {
    const std::string folder = server.folder() + ".home";
    std::filesystem::create_directory(folder);
    std::ofstream(folder + "/.my.cnf") << "[client]\npassword=\"secret of reader\"\n";
    const Variable none("MYSQL_PWD", nullptr);
    const Variable there("HOME", folder.c_str());
    EXPECT_EQ(import(address("shop"), "mysql").exitStatus, 0);
    std::filesystem::remove_all(folder);
}

TEST_F(FromMariaDb, AWrongPasswordIsOneLine) {
    const Variable wrong("MYSQL_PWD", "guessed");
    EXPECT_THAT(failure(address("shop")),
                HasSubstr("Access denied for user 'reader'@'127.0.0.1' (using password: YES)"));
}

TEST_F(FromMariaDb, AMissingPasswordIsToldWithWhereToPutIt) {
    const Variable none("MYSQL_PWD", nullptr);
    const std::string message = failure(address("shop"));
    EXPECT_TRUE(message.starts_with(address("shop") + ": Access denied")) << message;
    EXPECT_THAT(message, HasSubstr("; it is taken from MYSQL_PWD or the group [client] of ~/.my.cnf"));
}

TEST_F(FromMariaDb, AServerThatIsNotThereIsOneLine) {
    EXPECT_THAT(failure(address("shop", std::to_string(freePort()))), HasSubstr("Can't connect to server"));
}

TEST_F(FromMariaDb, AServerThatDoesNotAnswerIsGivenUp) {
    kill(server.process(), SIGSTOP);
    failure(address("shop?connect_timeout=2"));
    kill(server.process(), SIGCONT);
}

TEST_F(FromMariaDb, AConnectionThatBreaksGivesOneLineAndNoProject) {
    for (const std::size_t bytes : {1, 60, 150, 400, 20000}) {
        const BrokenLine line(static_cast<unsigned>(std::stoi(server.port())), bytes, BrokenLine::Break::Cut);
        const std::string message = failure(address("shop", line.port()));
        EXPECT_THAT(message, testing::ContainsRegex("Lost connection|server has gone away|handshake"))
            << bytes;
        if (bytes == 20000) {
            EXPECT_THAT(message, HasSubstr(": while ")) << "what was done then";
        }
    }
}

TEST_F(FromMariaDb, AServerThatFallsSilentIsGivenUp) {
    const BrokenLine line(static_cast<unsigned>(std::stoi(server.port())), 20000, BrokenLine::Break::Silent);
    EXPECT_THAT(failure(address("shop?statement_timeout=1", line.port())), HasSubstr(": while "));
}

TEST_F(FromMariaDb, AParameterThatIsNotKnownIsOneLine) {
    EXPECT_EQ(failure(address("shop?colour=red")),
              address("shop") +
                  ": there is no parameter \"colour\"; there are schema, connect_timeout, "
                  "statement_timeout and socket");
}

}  // namespace
}  // namespace zr::test
