// Long work that is interrupted at any moment: what it leaves is whole, and going on gives what an
// uninterrupted run gives.

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sqlite3.h>

#include <chrono>
#include <csignal>
#include <filesystem>
#include <fstream>
#include <thread>

#include "program.h"
#include "started_program.h"

namespace zr::test {
namespace {

using testing::HasSubstr;
using testing::MatchesRegex;
using testing::StartsWith;

// A line in seven holds no text, so that the numbers of lines are told as well.
std::string manyLines() {
    std::string lines;
    for (int number = 0; number < 3000; ++number) {
        const std::string name = std::to_string(number);
        lines += number % 7 == 3
                     ? "{\"id\":" + name + "}\n"
                     : "{\"id\":" + name + ",\"sql\":\"SELECT a.c" + name +
                           ", b.d AS x FROM t a JOIN u b ON a.i = b.i WHERE a.c IN (SELECT c FROM v)\"}\n";
    }
    return lines;
}

// What stands behind a word, up to a blank.
std::string behind(const std::string& text, const std::string& word) {
    const std::size_t at = text.find(word);
    if (at == std::string::npos) return {};
    const std::size_t start = at + word.size();
    return text.substr(start, text.find(' ', start) - start);
}

TEST(InterruptedLines, AreGoneOnWithFromWhereTheyStopped) {
    const TemporaryFile lines(manyLines());
    const std::string whole = runZrsql({"analyze", "-d", "mysql", "--jsonl", lines.path()}).output;
    int interrupted = 0;
    for (const int linesRead : {0, 1, 40, 701, 1500}) {
        for (const char* jobs : {"1", "3"}) {
            StartedProgram program({"analyze", "-d", "mysql", "--jsonl", lines.path(), "--jobs", jobs});
            std::string answers;
            for (int line = 0; line < linesRead; ++line) answers += program.readLine() + '\n';
            program.signal(linesRead % 2 ? SIGTERM : SIGINT);
            answers += program.readRest();
            const auto end = program.wait();
            if (end.exitStatus == 0) continue;  // it was quicker
            if (end.exitStatus == -1) {         // before it has begun to watch for interrupts
                EXPECT_EQ(linesRead, 0);
                continue;
            }
            ++interrupted;
            EXPECT_EQ(end.exitStatus, 130);
            const std::string skip = behind(end.errors, "--skip ");
            EXPECT_EQ(skip, std::to_string(splitLines(answers).size())) << end.errors;
            const ProgramResult rest =
                runZrsql({"analyze", "-d", "mysql", "--jsonl", lines.path(), "--skip", skip});
            EXPECT_EQ(rest.exitStatus, 0);
            EXPECT_TRUE(answers + rest.output == whole) << linesRead << " " << jobs;
        }
    }
    EXPECT_GT(interrupted, 0);
}

TEST(SkippedLines, CountInTheNumbersAndMayBeMoreThanThereAre) {
    const std::string input = "{\"id\":1,\"sql\":\"a\"}\nno\n{\"id\":3,\"sql\":\"b\"}";
    const auto skipped = [&](const char* count) {
        return runZrsql({"tokens", "-d", "mssql", "--jsonl", "-", "--skip", count, "--progress"}, input);
    };
    EXPECT_THAT(skipped("1").output, HasSubstr("\"line\":2}\n{\"id\":3,"));
    EXPECT_THAT(skipped("2").output, StartsWith("{\"id\":3,"));
    EXPECT_EQ(skipped("3").output, "");
    EXPECT_EQ(skipped("99").output, "");
    EXPECT_THAT(skipped("99").errors, HasSubstr("0 done, 0 failed"));
    EXPECT_EQ(skipped("-1").exitStatus, 2);
    EXPECT_EQ(runZrsql({"tokens", "-d", "mssql", "--skip", "1", "a"}).exitStatus, 2);
}

class InterruptedProject : public testing::Test {
 protected:
    InterruptedProject() : folder_(testing::TempDir() + "interrupted_XXXXXX") {
        EXPECT_NE(mkdtemp(folder_.data()), nullptr);
    }
    ~InterruptedProject() override { std::filesystem::remove_all(folder_); }

    std::string file(const std::string& name) const { return folder_ + "/" + name; }

    // An SQLite database whose views take some time.
    std::string base(int tables, int views) const {
        std::string sql = "BEGIN;";
        for (int number = 0; number < tables; ++number)
            sql += "CREATE TABLE t" + std::to_string(number) + " (id INTEGER PRIMARY KEY, a TEXT, b TEXT);";
        for (int number = 0; number < views; ++number) {
            const std::string table = "t" + std::to_string(number % tables);
            sql += "CREATE VIEW v" + std::to_string(number) + " AS SELECT x.id, x.a || 'y' AS a";
            for (int column = 0; column < 30; ++column)
                sql += ", CASE WHEN x.b = '" + std::to_string(column) + "' THEN x.a ELSE x.b END AS c" +
                       std::to_string(column);
            sql += " FROM " + table + " x";
            if (number % 5) sql += " JOIN v" + std::to_string(number - 1) + " w ON w.id = x.id";
            sql += ";";
        }
        sql += "COMMIT;";
        sqlite3* handle = nullptr;
        EXPECT_EQ(sqlite3_open(file("base.db").c_str(), &handle), SQLITE_OK);
        EXPECT_EQ(sqlite3_exec(handle, sql.c_str(), nullptr, nullptr, nullptr), SQLITE_OK);
        sqlite3_close(handle);
        return file("base.db");
    }
    std::string project(int tables, int views) const {
        const ProgramResult made =
            runZrsql({"project", "import", base(tables, views), file("p.json"), "-d", "postgresql"});
        EXPECT_EQ(made.exitStatus, 0) << made.errors;
        EXPECT_EQ(made.summary,
                  std::to_string(tables) + " tables and " + std::to_string(views) + " queries done");
        return file("p.json");
    }

 private:
    std::string folder_;
};

TEST_F(InterruptedProject, WritesNothingAndBeginsAnew) {
    const std::string shop = project(20, 250);
    const std::vector<std::vector<std::string>> commands = {
        {"lineage", shop, "--format", "csv"},
        {"project", "analyze", shop, "--format", "json"},
        {"impact", shop, "t3.a", "--format", "json"},
        {"report", shop, "-o", file("page.html")},
    };
    for (std::vector<std::string> words : commands) {
        SCOPED_TRACE(words.front());
        std::ofstream(file("page.html")) << "the page before";
        words.emplace_back("--progress");
        std::vector<std::string> endings;
        for (const int wait : {0, 3, 20, 60, 100}) {
            StartedProgram program(words);
            EXPECT_THAT(program.readErrorLine(),
                        MatchesRegex("zrsql: .*p\\.json: 0 of 250 queries analysed"));
            std::this_thread::sleep_for(std::chrono::milliseconds(wait));
            program.signal(wait % 2 ? SIGTERM : SIGINT);
            const std::string out = program.readRest();
            const auto end = program.wait();
            if (end.exitStatus == 0) continue;  // it was quicker
            EXPECT_EQ(end.exitStatus, 130);
            EXPECT_EQ(out, "");
            EXPECT_THAT(
                splitLines(end.errors).back(),
                MatchesRegex("zrsql: interrupted: [0-9]+ quer(y|ies) (analysed|followed|written), [0-9]+ "
                             "not, 0:[0-9]+; nothing was written, and the same command begins anew"));
            EXPECT_EQ(readFile(file("page.html")), "the page before");
            endings.push_back(end.errors);
        }
        EXPECT_FALSE(endings.empty());
        EXPECT_EQ(
            std::distance(std::filesystem::directory_iterator(std::filesystem::path(shop).parent_path()), {}),
            3)
            << "nothing is left beside";
        words.pop_back();
        const ProgramResult again = runZrsql(words);
        EXPECT_EQ(again.exitStatus, 0) << again.errors;
        EXPECT_EQ(again.summary, "250 queries done");
    }
}

TEST_F(InterruptedProject, OfAnImportIsAsItWasUntilTheTablesAreRead) {
    const std::string from = base(1500, 10);
    for (const bool isThere : {false, true}) {
        const std::string to = file("p.db");
        if (isThere) std::ofstream(to) << "what was there";
        StartedProgram program(
            {"project", "import", from, to, "-d", "postgresql", "--form", "json", "--force", "--progress"});
        EXPECT_EQ(program.readErrorLine(), "zrsql: reading " + from + ": 0 tables read");
        program.signal(SIGINT);
        const auto end = program.wait();
        EXPECT_EQ(end.exitStatus, 130) << end.errors;
        EXPECT_EQ(end.errors, "zrsql: interrupted while the catalogue was read; " + to +
                                  (isThere ? " is as it was\n" : " was not made\n"));
        EXPECT_EQ(std::filesystem::exists(to), isThere);
        if (isThere) {
            EXPECT_EQ(readFile(to), "what was there");
        }
    }
    std::filesystem::remove(file("p.db"));
    for (const char* summary : {"1500 tables and 10 queries done",
                                "0 tables and 0 queries done, 1500 tables and 10 queries there before"}) {
        const ProgramResult again =
            runZrsql({"project", "import", from, file("p.db"), "-d", "postgresql", "--continue"});
        EXPECT_EQ(again.exitStatus, 0) << again.errors;
        EXPECT_EQ(again.summary, summary);
    }
}

TEST_F(InterruptedProject, IsGoneOnWithByWhatItLacks) {
    const std::string from = base(7, 12);
    const auto import = [&](const std::string& to, std::vector<std::string> more) {
        std::vector<std::string> words = {"project", "import", from, to, "-d", "mysql"};
        words.insert(words.end(), more.begin(), more.end());
        return runZrsql(words);
    };
    const auto run = [](const std::vector<std::string>& words) {
        const ProgramResult result = runZrsql(words);
        EXPECT_EQ(result.exitStatus, 0) << result.errors;
    };
    const std::string to = file("p.json");
    run({"project", "new", to, "-d", "mysql"});
    run({"project", "add-table", to, "t1", "mine"});
    run({"project", "add-query", to, "V2", "SELECT mine FROM t1"});
    const ProgramResult result = import(to, {"--continue"});
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    EXPECT_EQ(result.summary, "6 tables and 11 queries done, 1 table and 1 query there before");
    EXPECT_THAT(runZrsql({"project", "show", to, "t1"}).output, HasSubstr("mine")) << "what is there stays";
    EXPECT_THAT(runZrsql({"project", "show", to, "v2"}).output, HasSubstr("SELECT mine FROM t1"));

    EXPECT_THAT(runZrsql({"project", "import", from, to, "-d", "oracle", "--continue"}).errors,
                HasSubstr("is a project of another dialect, mysql"));
    EXPECT_EQ(import(to, {"--continue", "--force"}).exitStatus, 2);
    EXPECT_THAT(import(to, {}).errors, HasSubstr("is there already"));
    std::ofstream(to) << "no project";
    EXPECT_EQ(import(to, {"--continue"}).exitStatus, 1);
    EXPECT_EQ(readFile(to), "no project");
}

TEST_F(InterruptedProject, TellsWhatWasDoneAndWhatNot) {
    const std::string shop = file("p.json");
    const auto run = [](const std::vector<std::string>& words) {
        const ProgramResult result = runZrsql(words);
        EXPECT_EQ(result.exitStatus, 0) << result.errors;
        EXPECT_EQ(result.errors, "");
        return result.summary;
    };
    run({"project", "new", shop, "-d", "mssql"});
    run({"project", "add-table", shop, "t", "a"});
    run({"project", "add-query", shop, "whole", "SELECT a FROM t"});
    run({"project", "add-query", shop, "open", "SELECT b FROM u"});
    run({"project", "add-query", shop, "part", "SELECT a FROM t LIMIT 5"});
    const std::string expected = "1 query done, 1 not read to the end, 1 with unknown sources";
    EXPECT_EQ(run({"lineage", shop}), expected);
    EXPECT_EQ(run({"impact", shop, "t.a"}), expected);
    EXPECT_EQ(run({"report", shop}), expected);
    EXPECT_EQ(run({"project", "analyze", shop}), expected);
    EXPECT_EQ(run({"lineage", shop, "--query", "whole"}), "1 query done");
    EXPECT_EQ(run({"project", "analyze", shop, "part"}), "0 queries done, 1 not read to the end");
    run({"project", "add-query", shop, "cycle", "SELECT a FROM cycle"});
    EXPECT_EQ(run({"lineage", shop}), expected + ", 1 in rings");
}

}  // namespace
}  // namespace zr::test
