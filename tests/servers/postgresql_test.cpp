// Projects made of a PostgreSQL server that runs for these tests.

#include <csignal>
#include <fstream>

#include "broken_line.h"
#include "expected_lineage.h"
#include "host/catalog_reader.h"
#include "imports.h"
#include "started_program.h"

namespace zr::test {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::MatchesRegex;

constexpr const char* kPassword = "a secret: of reader\\s";
const std::string kPsql = "psql -h FOLDER -p PORT -U owner -d postgres -q -v ON_ERROR_STOP=1 -AtF ' ' ";

class Server : public testing::Environment {
 public:
    void SetUp() override {
        running.start("pg_isready -q -h FOLDER -p PORT");
        if (!running.absence().empty()) return;
        const std::string shop = "tests/servers/shop/";
        running.shell("(echo 'CREATE SCHEMA shop; SET search_path = shop;'; cat " + shop + "tables.sql " +
                      shop + "views.sql " + shop + "views_postgresql.sql) | " + kPsql);
        running.shell(kPsql +
                      "-c \"CREATE ROLE reader LOGIN PASSWORD E'a secret: of reader\\\\\\\\s'; "
                      "GRANT USAGE ON SCHEMA shop TO reader; "
                      "CREATE SCHEMA secret; CREATE TABLE secret.plans (id integer)\"");
        running.shell(kPsql + "-f tests/servers/odd_postgresql.sql");
    }
    void TearDown() override { running.stop(); }

    static PrivateServer running;
};
PrivateServer Server::running(ZR_SOURCE_DIR "/tests/servers/run_postgresql.sh", SIGINT);
const auto* const server = testing::AddGlobalTestEnvironment(new Server);

class FromPostgresql : public ServerTest {
 protected:
    FromPostgresql() : ServerTest(Server::running) {}

    static std::string address(const std::string& rest, const std::string& port = Server::running.port()) {
        return "postgresql://reader@127.0.0.1:" + port + "/" + rest;
    }
    std::string shown() const { return address("postgres"); }
    std::string failure(const std::string& given) const { return failureOf(given, "postgresql"); }
    std::string sql(const std::string& statement) const {
        return server.shell(kPsql + "-c \"" + statement + "\"").output;
    }

    // Lets whoever reads a view on this table wait.
    void lockCarriers() const {
        server.shell("PGAPPNAME=holder " + kPsql +
                     "-c 'BEGIN; LOCK TABLE shop.carriers; SELECT pg_sleep(60)' >/dev/null 2>&1 &");
        while (sql("SELECT count(*) FROM pg_locks WHERE relation = 'shop.carriers'::regclass AND mode = "
                   "'AccessExclusiveLock' AND granted") != "1\n") {
        }
    }
    void unlockCarriers() const {
        sql("SELECT pg_terminate_backend(pid) FROM pg_stat_activity WHERE application_name = 'holder'");
    }

    const Variable password{"PGPASSWORD", kPassword};
};

TEST_F(FromPostgresql, TheLineageIsTheExpectedOne) {
    const ProgramResult made = import(address("postgres?schema=shop"), "postgresql");
    ASSERT_EQ(made.exitStatus, 0) << made.errors;
    EXPECT_EQ(made.summary, "40 tables and 60 queries done");

    expectLineage(project(), {"lineage.txt", "lineage_postgresql.txt"}, "gaps_postgresql.txt");
}

// The server's own record of what a view depends on has every column that stands anywhere in it, of tables
// and views alike, one step deep. The same is what the descriptors name in all their clauses.
TEST_F(FromPostgresql, WhatViewsNameIsWhatTheServerHasAsTheirDependencies) {
    ASSERT_EQ(import(address("postgres?schema=shop"), "postgresql").exitStatus, 0);
    std::map<std::string, Names> recorded;
    for (const std::string& line : splitLines(
             sql("SELECT DISTINCT v.relname, t.relname || '.' || a.attname FROM pg_rewrite r "
                 "JOIN pg_class v ON v.oid = r.ev_class JOIN pg_namespace n ON n.oid = v.relnamespace "
                 "JOIN pg_depend d ON d.classid = 'pg_rewrite'::regclass AND d.objid = r.oid "
                 "AND d.refclassid = 'pg_class'::regclass AND d.refobjsubid > 0 AND d.refobjid <> v.oid "
                 "JOIN pg_class t ON t.oid = d.refobjid "
                 "JOIN pg_attribute a ON a.attrelid = t.oid AND a.attnum = d.refobjsubid "
                 "WHERE n.nspname = 'shop'")))
        recorded[line.substr(0, line.find(' '))].insert(line.substr(line.find(' ') + 1));
    ASSERT_EQ(recorded.size(), 60u);

    tool::TracedProject traced(project());
    Score score;
    std::size_t views = 0;
    Names differences;
    for (const CZRQueryInfo* query : traced.database().Queries) {
        if (traced.readPlaceOf(*query).stop) continue;
        ++views;
        const std::string view = query->GetSrcName().toUtf8();
        const Names named = namedBy(traced, *query);
        score.add(recorded[view], named);
        for (const std::string& name : recorded[view])
            if (!named.contains(name)) differences.insert(view + " misses " + name);
        for (const std::string& name : named)
            if (!recorded[view].contains(name)) differences.insert(view + " has " + name);
    }
    EXPECT_THAT(differences, ElementsAre("supplier_labels misses addresses.city"));
    EXPECT_EQ(score.precision(), 1.0);
    std::cout << "Columns that " << views << " views name anywhere, against pg_depend: " << score << "\n";
}

TEST_F(FromPostgresql, ViewsThatAreNotReadToTheirEndAreToldWithThePlace) {
    ASSERT_EQ(import(address("postgres?schema=shop"), "postgresql").exitStatus, 0);
    const ProgramResult result = runZrsql({"project", "analyze", project(), "category_tree", "all_products"});
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    EXPECT_THAT(result.output, HasSubstr("stopped at line 1, column 1, before \"WITH\""));
    EXPECT_THAT(result.output, HasSubstr("from products.sku"));
}

class RowsOfPostgresql : public FromPostgresql {
 protected:
    void SetUp() override {
        FromPostgresql::SetUp();
        if (!IsSkipped()) host::readerFor(address("postgres?schema=Odd%20One"))->read(rows);
    }
    std::vector<std::string> columns(const CString& table) const {
        std::vector<std::string> all;
        for (const auto& row : rows.columns)
            if (row.table == table)
                all.push_back(std::to_string(row.place) + " " + row.name.toUtf8() + " " + row.type.toUtf8());
        return all;
    }
    std::vector<std::string> keys(const CString& table) const {
        std::vector<std::string> all;
        for (const auto& row : rows.keys) {
            if (row.table != table) continue;
            const char* const kinds[] = {"primary", "unique", "foreign"};
            all.push_back(row.name.toUtf8() + " " + kinds[static_cast<int>(row.kind)] + " " +
                          row.column.toUtf8() + std::to_string(row.place));
            if (!row.referencedTable.IsEmpty())
                all.back() += " " + row.referencedTable.toUtf8() + "." + row.referencedColumn.toUtf8();
        }
        return all;
    }

    host::CatalogRows rows;
};

TEST_F(RowsOfPostgresql, HaveColumnsAsTheServerPrintsTheirTypes) {
    EXPECT_THAT(columns(u"T \"x\" \u00e9"),
                ElementsAre("1 Id integer", "3 amount numeric(10,2)", "4 words character varying(20)[]",
                            "5 at timestamp(3) without time zone"))
        << "a dropped column is not told";
    EXPECT_THAT(columns(u"nothing"), ElementsAre("0  ")) << "a table without columns";
    EXPECT_THAT(columns(u"parts"), ElementsAre("1 id integer", "2 day date"));
    EXPECT_THAT(columns(u"in_view"), IsEmpty()) << "the columns of views come with their text";
}

TEST_F(RowsOfPostgresql, HaveKeysPartByPart) {
    EXPECT_THAT(keys(u"T \"x\" \u00e9"),
                ElementsAre("T key primary Id1", "T key primary at2", "whole unique amount1"))
        << "neither an index on part of the rows, nor one on an expression, nor included columns";
    EXPECT_THAT(keys(u"child"), ElementsAre("to_T foreign b1 T \"x\" \u00e9.at",
                                            "to_T foreign a2 T \"x\" \u00e9.Id", "child_pkey primary id1"));
}

TEST_F(RowsOfPostgresql, HaveViewsMaterialisedOnesAndFunctions) {
    std::vector<std::string> views;
    for (const auto& row : rows.views) views.push_back(row.name.toUtf8());
    EXPECT_THAT(views, ElementsAre("in_view", "kept"));
    EXPECT_THAT(rows.views[0].text->toUtf8(), HasSubstr("FROM child")) << "no schema where it is clear";
    EXPECT_THAT(rows.views[1].text->toUtf8(), HasSubstr("FROM shop.tags")) << "another schema is told";
    ASSERT_EQ(rows.functions.size(), 2u) << "no procedure";
    EXPECT_EQ(rows.functions[1].name, u"twice");
    EXPECT_EQ(rows.functions[1].parameters, 2);
    const auto database = host::makeDatabase(rows, DB_POSTGRESQL, u"Odd One");
    EXPECT_EQ(*database->UserFunctions.Find(u"twice"), u"2") << "of two the one with more parameters";
}

TEST_F(FromPostgresql, AllSchemasAreReadAndOneWithoutRightsIsLeftOutWithALine) {
    const ProgramResult result = import(address("postgres"), "postgresql");
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_THAT(splitLines(result.errors),
                testing::Contains("zrsql: " + shown() +
                                  ": schema secret: left out; the user reader has no right to use it"));
    EXPECT_THAT(result.summary, HasSubstr(" 62 queries"));
}

TEST_F(FromPostgresql, ASchemaWithoutRightsAloneGivesNoProject) {
    const ProgramResult result = import(address("postgres?schema=secret"), "postgresql");
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_THAT(
        splitLines(result.errors),
        ElementsAre("zrsql: " + shown() + ": schema secret: left out; the user reader has no right to use it",
                    "zrsql: " + address("postgres?schema=secret") + ": there is no table or view in it"));
}

TEST_F(FromPostgresql, TheAddressTellsTheDialectAndTheOptionTheSchema) {
    const ProgramResult result =
        runZrsql({"project", "import", address("postgres"), project(), "--schema", "shop", "--force"});
    EXPECT_EQ(result.summary, "40 tables and 60 queries done") << result.errors;
    EXPECT_THAT(runZrsql({"project", "list", project()}).output,
                HasSubstr(": JSON, postgresql, schema shop\n"));
}

TEST_F(FromPostgresql, ASchemaThatIsNotThereIsToldWithThoseThatAre) {
    EXPECT_EQ(failure(address("postgres?schema=shopp")),
              shown() + ": there is no schema \"shopp\"; there are Odd One, public, secret, shop");
}

TEST_F(FromPostgresql, ThePasswordComesFromAPasswordFileToo) {
    const std::string file = server.folder() + ".pgpass";
    std::ofstream(file) << "127.0.0.1:*:*:reader:a secret\\: of reader\\\\s\n";
    std::filesystem::permissions(file,
                                 std::filesystem::perms::owner_read | std::filesystem::perms::owner_write);
    const Variable none("PGPASSWORD", nullptr);
    const Variable given("PGPASSFILE", file.c_str());
    EXPECT_EQ(import(address("postgres?schema=shop"), "postgresql").exitStatus, 0);
    std::filesystem::remove(file);
}

TEST_F(FromPostgresql, AServiceOfTheClientsFileIsFound) {
    const std::string file = server.folder() + ".service";
    std::ofstream(file) << "[warehouse]\nhost=127.0.0.1\nport=" << server.port()
                        << "\nuser=reader\ndbname=postgres\n";
    const Variable given("PGSERVICEFILE", file.c_str());
    EXPECT_EQ(import("postgresql:///?service=warehouse&schema=shop", "postgresql").exitStatus, 0);
    std::filesystem::remove(file);
}

TEST_F(FromPostgresql, AWrongPasswordIsOneLine) {
    const Variable wrong("PGPASSWORD", "guessed");
    EXPECT_THAT(failure(address("postgres")),
                HasSubstr("password authentication failed for user \"reader\""));
}

TEST_F(FromPostgresql, AMissingPasswordIsToldWithWhereToPutIt) {
    const Variable none("PGPASSWORD", nullptr);
    const Variable nowhere("PGPASSFILE", "/nonexistent");
    const std::string message = failure(address("postgres"));
    EXPECT_TRUE(message.starts_with(shown() + ": ")) << message;
    EXPECT_THAT(message, HasSubstr("no password supplied; it is taken from PGPASSWORD or ~/.pgpass"));
}

TEST_F(FromPostgresql, ADatabaseThatIsNotThereIsOneLine) {
    EXPECT_THAT(failure(address("nowhere")), HasSubstr("database \"nowhere\" does not exist"));
}

TEST_F(FromPostgresql, AServerThatIsNotThereIsOneLine) {
    EXPECT_THAT(failure(address("postgres", std::to_string(freePort()))), HasSubstr("Connection refused"));
}

TEST_F(FromPostgresql, AServerThatDoesNotAnswerIsGivenUp) {
    kill(server.process(), SIGSTOP);
    EXPECT_THAT(failure(address("postgres?connect_timeout=2")), HasSubstr("timeout expired"));
    kill(server.process(), SIGCONT);
}

TEST_F(FromPostgresql, AConnectionThatBreaksGivesOneLineAndNoProject) {
    for (const std::size_t bytes : {1, 100, 400, 1000, 20000}) {
        const BrokenLine line(static_cast<unsigned>(std::stoi(server.port())), bytes, BrokenLine::Break::Cut);
        const std::string message = failure(address("postgres?schema=shop", line.port()));
        EXPECT_THAT(message, HasSubstr("closed the connection unexpectedly")) << bytes;
        if (bytes == 20000) {
            EXPECT_THAT(message, HasSubstr(": while ")) << "what was done then";
        }
    }
}

TEST_F(FromPostgresql, AServerThatFallsSilentIsGivenUp) {
    const BrokenLine line(static_cast<unsigned>(std::stoi(server.port())), 20000, BrokenLine::Break::Silent);
    EXPECT_THAT(failure(address("postgres?schema=shop&statement_timeout=1", line.port())),
                HasSubstr("the server does not answer"));
}

TEST_F(FromPostgresql, AViewThatWaitsForALockIsLeftOutAndTheRestGoesOn) {
    lockCarriers();
    const ProgramResult result = import(address("postgres?schema=shop&statement_timeout=2"), "postgresql");
    unlockCarriers();
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    EXPECT_THAT(splitLines(result.errors),
                ElementsAre("zrsql: " + shown() +
                                ": while view shop.parties was read: canceling statement due to "
                                "lock timeout; it is left out",
                            "zrsql: " + shown() +
                                ": while view shop.shipment_times was read: canceling statement "
                                "due to lock timeout; it is left out"));
    EXPECT_EQ(result.summary, "40 tables and 58 queries done, 2 left out");
}

TEST_F(FromPostgresql, AnInterruptWhileViewsAreReadKeepsThoseThatWereAndTheRestCanBeAdded) {
    const std::string source = address("postgres?schema=shop&statement_timeout=2");
    ASSERT_EQ(import(source, "postgresql").summary, "40 tables and 60 queries done");
    const std::string whole = readFile(project());
    std::filesystem::remove(project());

    lockCarriers();
    StartedProgram program({"project", "import", source, project(), "--progress"});
    std::string line;
    do line = program.readErrorLine();
    while (!line.empty() && !testing::Matches(MatchesRegex(".*: [1-9][0-9]* of 60 views read"))(line));
    program.signal(SIGTERM);
    const auto end = program.wait();
    unlockCarriers();
    EXPECT_EQ(end.exitStatus, 130) << end.errors;
    EXPECT_THAT(
        splitLines(end.errors).back(),
        MatchesRegex("zrsql: interrupted: 40 tables and [1-9][0-9]* quer(y|ies) done, (1 left out, )?[1-9]"
                     "[0-9]* views? not read, 0:0[0-9]; .*json holds what was read, and the same command "
                     "with --continue goes on"));
    EXPECT_EQ(runZrsql({"lineage", project()}).exitStatus, 0) << "what is kept is a project";

    const ProgramResult rest = runZrsql({"project", "import", source, project(), "--continue"});
    EXPECT_THAT(rest.summary,
                MatchesRegex("0 tables and [1-9][0-9]* quer(y|ies) done, 40 tables and [1-9][0-9]* "
                             "quer(y|ies) there before"));
    EXPECT_EQ(rest.errors, "");
    EXPECT_TRUE(readFile(project()) == whole);
}

TEST_F(FromPostgresql, AnInterruptLeavesAProjectThatWasToBeReplacedAsItWas) {
    std::ofstream(project()) << "a project";
    lockCarriers();
    StartedProgram program(
        {"project", "import", address("postgres?schema=shop"), project(), "--force", "--progress"});
    std::string line;
    do line = program.readErrorLine();
    while (!line.empty() && line.find("of 60 views read") == std::string::npos);
    program.signal(SIGINT);
    const auto end = program.wait();
    unlockCarriers();
    EXPECT_EQ(end.exitStatus, 130);
    EXPECT_EQ(splitLines(end.errors).back(),
              "zrsql: interrupted while the catalogue was read; " + project() + " is as it was");
    EXPECT_EQ(readFile(project()), "a project");
}

TEST_F(FromPostgresql, AnInterruptBeforeViewsAreReadLeavesNothing) {
    const BrokenLine line(static_cast<unsigned>(std::stoi(server.port())), 3000, BrokenLine::Break::Silent);
    StartedProgram program(
        {"project", "import", address("postgres?schema=shop", line.port()), project(), "--progress"});
    EXPECT_THAT(program.readErrorLine(), HasSubstr("0 tables read"));
    program.signal(SIGINT);
    const auto end = program.wait();
    EXPECT_EQ(end.exitStatus, 130);
    EXPECT_EQ(end.errors,
              "zrsql: interrupted while the catalogue was read; " + project() + " was not made\n");
    EXPECT_FALSE(std::filesystem::exists(project()));
}

TEST_F(FromPostgresql, NothingOfTheServerIsChanged) {
    const std::string state =
        "SELECT xact_commit > 0, tup_inserted, tup_updated, tup_deleted FROM pg_stat_database "
        "WHERE datname = 'postgres'";
    sql("SELECT pg_stat_force_next_flush()");
    const std::string before = sql(state);
    ASSERT_EQ(import(address("postgres?schema=shop"), "postgresql").exitStatus, 0);
    EXPECT_EQ(sql(state), before);
}

TEST_F(FromPostgresql, AParameterThatTheClientDoesNotKnowIsOneLine) {
    EXPECT_THAT(failure(address("postgres?colour=red")),
                HasSubstr("invalid URI query parameter: \"colour\""));
}

}  // namespace
}  // namespace zr::test
