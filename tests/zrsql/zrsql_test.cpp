// The program as its users meet it: exit status, inputs, lines of JSON, wrong use.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <nlohmann/json.hpp>

#include "program.h"

namespace zr::test {
namespace {

using nlohmann::json;
using testing::HasSubstr;

const std::string kSimple = "SELECT a FROM t";

TEST(ZrsqlUse, WithoutACommandIsWrong) {
    const auto result = runZrsql({});
    EXPECT_EQ(result.exitStatus, 2);
    EXPECT_EQ(result.output, "");
    EXPECT_NE(result.errors, "");
}

class WrongUse : public testing::TestWithParam<std::vector<std::string>> {};

TEST_P(WrongUse, EndsWithStatus2AndSaysWhy) {
    const auto result = runZrsql(GetParam(), kSimple);
    EXPECT_EQ(result.exitStatus, 2);
    EXPECT_EQ(result.output, "");
    EXPECT_THAT(result.errors, testing::StartsWith("zrsql: "));
}

INSTANTIATE_TEST_SUITE_P(
    Arguments, WrongUse,
    testing::Values(std::vector<std::string>{"nosuch", "-d", "mssql"}, std::vector<std::string>{"tokens"},
                    std::vector<std::string>{"tokens", "-d"},
                    std::vector<std::string>{"tree", "-d", "cobol", "x"},
                    std::vector<std::string>{"tree", "-d", "mssql", "--format", "xml"},
                    std::vector<std::string>{"tokens", "-d", "mssql", "--format", "json"},
                    std::vector<std::string>{"analyze", "-d", "mssql", "--format", "sexpr"},
                    std::vector<std::string>{"analyze", "-d", "mssqlfrom", "x"},
                    std::vector<std::string>{"tree", "-d", "mssql", "--catalog", "x"},
                    std::vector<std::string>{"tree", "-d", "mssql", "-f", "a", "x"},
                    std::vector<std::string>{"tree", "-d", "mssql", "--jsonl", "a", "x"},
                    std::vector<std::string>{"tree", "-d", "mssql", "--jsonl", "a", "-f", "b"},
                    std::vector<std::string>{"tree", "-d", "mssql", "--jobs", "2", "x"},
                    std::vector<std::string>{"tree", "-d", "mssql", "--jsonl", "-", "--jobs", "-1"},
                    std::vector<std::string>{"tree", "-d", "mssql", "--jsonl", "-", "--jobs", "257"},
                    std::vector<std::string>{"tree", "-d", "mssql", "--jsonl", "-", "--jobs", "many"}));

TEST(ZrsqlUse, HelpAndVersionAreNoFailure) {
    const auto help = runZrsql({"--help"});
    EXPECT_EQ(help.exitStatus, 0);
    EXPECT_THAT(help.output, HasSubstr("analyze"));
    EXPECT_EQ(runZrsql({"tree", "--help"}).exitStatus, 0);
    const auto version = runZrsql({"--version"});
    EXPECT_EQ(version.exitStatus, 0);
    EXPECT_THAT(version.output, testing::StartsWith("zrsql "));
    EXPECT_THAT(version.output, HasSubstr("\nimports from: SQLite, CSV, JSON"));
}

TEST(ZrsqlInput, IsTheSameFromArgumentFileAndStandardInput) {
    const auto fromArgument = runZrsql({"tree", "-d", "mssql", kSimple});
    EXPECT_EQ(fromArgument.exitStatus, 0);
    EXPECT_THAT(fromArgument.output, HasSubstr("SELECT_LIST"));
    const TemporaryFile file(kSimple);
    EXPECT_EQ(runZrsql({"tree", "-d", "mssql", "-f", file.path()}).output, fromArgument.output);
    EXPECT_EQ(runZrsql({"tree", "-d", "mssql", "-f", "-"}, kSimple).output, fromArgument.output);
    EXPECT_EQ(runZrsql({"tree", "-d", "mssql", "-"}, kSimple).output, fromArgument.output);
    EXPECT_EQ(runZrsql({"tree", "-d", "mssql"}, kSimple).output, fromArgument.output);
}

TEST(ZrsqlInput, MayBeginWithAByteOrderMark) {
    EXPECT_EQ(runZrsql({"tokens", "-d", "mssql"}, "\xEF\xBB\xBF" + kSimple).output,
              runZrsql({"tokens", "-d", "mssql"}, kSimple).output);
}

TEST(ZrsqlInput, AnEmptyArgumentIsAnEmptyText) {
    const auto result = runZrsql({"tokens", "-d", "mssql", ""}, kSimple);
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.output, "");
}

TEST(ZrsqlInput, ThatIsNotThereEndsWithStatus1) {
    for (const char* option : {"-f", "--jsonl"}) {
        const auto result = runZrsql({"tree", "-d", "mssql", option, "/nowhere/at/all"});
        EXPECT_EQ(result.exitStatus, 1) << option;
        EXPECT_THAT(result.errors, HasSubstr("/nowhere/at/all")) << option;
    }
}

TEST(ZrsqlInput, ThatIsAFolderEndsWithStatus1) {
    for (const char* option : {"-f", "--jsonl"})
        EXPECT_EQ(runZrsql({"tree", "-d", "mssql", option, "/tmp"}).exitStatus, 1) << option;
}

TEST(ZrsqlInput, WrongSqlIsNoFailure) {
    for (const char* text : {"", "garbage", "SELECT", "SELECT FROM", "(((", "'", "\x01\xFF\xFE"})
        for (const char* command : {"tokens", "tree", "analyze"})
            EXPECT_EQ(runZrsql({command, "-d", "mssql"}, text).exitStatus, 0) << command << " " << text;
}

TEST(ZrsqlLines, KeepTheirOrderAndIds) {
    const auto result =
        runZrsql({"tokens", "-d", "mssql", "--jsonl", "-"},
                 "{\"id\":\"one\",\"sql\":\"a\"}\n{\"sql\":\"b\",\"id\":[2]}\n{\"sql\":\"c\"}\n");
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.output,
              "{\"id\":\"one\",\"tokens\":[[249,\"IDENTIFICATOR\",\"a\"]]}\n"
              "{\"id\":[2],\"tokens\":[[249,\"IDENTIFICATOR\",\"b\"]]}\n"
              "{\"id\":null,\"tokens\":[[249,\"IDENTIFICATOR\",\"c\"]]}\n");
    EXPECT_EQ(result.errors, "");
}

TEST(ZrsqlLines, ABadLineIsAnsweredAndTheRunGoesOn) {
    const auto result =
        runZrsql({"tree", "-d", "mssql", "--jsonl", "-"},
                 "no json\n\n{\"id\":5}\n{\"id\":6,\"sql\":\"SELECT a FROM t\"}\n{\"id\":7,\"sql\":null}");
    EXPECT_EQ(result.exitStatus, 0);
    const auto lines = splitLines(result.output);
    ASSERT_EQ(lines.size(), 5u);
    for (const std::size_t at : {0u, 1u}) {
        EXPECT_TRUE(json::parse(lines[at])["id"].is_null()) << at;
        EXPECT_TRUE(json::parse(lines[at])["error"].is_string()) << at;
    }
    EXPECT_EQ(json::parse(lines[2])["id"], 5);
    EXPECT_TRUE(json::parse(lines[2]).contains("error"));
    EXPECT_EQ(json::parse(lines[3])["id"], 6);
    EXPECT_TRUE(json::parse(lines[3]).contains("tree"));
    EXPECT_EQ(json::parse(lines[4])["id"], 7);
    EXPECT_TRUE(json::parse(lines[4]).contains("error"));
}

TEST(ZrsqlLines, HoldTheSameTreeAsASingleRun) {
    const std::string line = json{{"id", 1}, {"sql", kSimple}}.dump() + "\n";
    for (const char* format : {"sexpr", "dot", "pretty"}) {
        const auto single = runZrsql({"tree", "-d", "mssql", "--format", format, kSimple}).output;
        const auto answer =
            json::parse(runZrsql({"tree", "-d", "mssql", "--format", format, "--jsonl", "-"}, line).output);
        const auto tree = answer["tree"].get<std::string>();
        EXPECT_EQ(format == std::string("sexpr") ? tree + "\n" : tree, single) << format;
    }
    const auto answer =
        json::parse(runZrsql({"tree", "-d", "mssql", "--format", "json", "--jsonl", "-"}, line).output);
    EXPECT_EQ(answer["tree"],
              json::parse(runZrsql({"tree", "-d", "mssql", "--format", "json", kSimple}).output));
}

TEST(ZrsqlLines, HoldTheSameAnalysisAsASingleRun) {
    const std::string text = "SELECT a, dbo.f(b) FROM t WHERE x = 1 !";
    const std::string line = json{{"id", 1}, {"sql", text}}.dump() + "\n";
    auto answer = json::parse(runZrsql({"analyze", "-d", "mssql", "--jsonl", "-"}, line).output);
    EXPECT_EQ(answer["id"], 1);
    answer.erase("id");
    EXPECT_EQ(answer, json::parse(runZrsql({"analyze", "-d", "mssql", text}).output));
    const auto picture =
        json::parse(runZrsql({"analyze", "-d", "mssql", "--format", "pretty", "--jsonl", "-"}, line).output);
    EXPECT_EQ(picture["query"], runZrsql({"analyze", "-d", "mssql", "--format", "pretty", text}).output);
}

TEST(ZrsqlLines, KeepUserFunctionsOfOneLineOutOfTheNext) {
    const auto lines =
        splitLines(runZrsql({"analyze", "-d", "mssql", "--jsonl", "-"},
                            "{\"sql\":\"SELECT dbo.f(b) FROM t\"}\n{\"sql\":\"SELECT b FROM t\"}\n")
                       .output);
    ASSERT_EQ(lines.size(), 2u);
    EXPECT_EQ(json::parse(lines[1])["UserFunctions"], json::object());
}

TEST(ZrsqlLines, AreTheSameWithManyThreads) {
    std::string input;
    for (int line = 0; line < 500; ++line)
        input += json{{"id", line}, {"sql", "SELECT c" + std::to_string(line) + " FROM t, u WHERE x = 'y'"}}
                     .dump() +
                 "\n";
    const TemporaryFile catalog(R"([{"table": "t", "columns": ["c1"]}])");
    for (const char* command : {"tokens", "tree", "analyze"}) {
        std::vector<std::string> words = {command, "-d", "mssql", "--jsonl", "-"};
        if (command == std::string("analyze")) words.insert(words.end(), {"--catalog", catalog.path()});
        const auto alone = runZrsql(words, input);
        words.insert(words.end(), {"--jobs", "4"});
        const auto together = runZrsql(words, input);
        EXPECT_EQ(splitLines(alone.output).size(), 500u);
        EXPECT_EQ(together.output, alone.output) << command;
    }
}

TEST(ZrsqlLines, TakeTextsWithUnpairedSurrogates) {
    const auto result =
        runZrsql({"tree", "-d", "mssql", "--jsonl", "-"}, R"({"id":1,"sql":"SELECT '\ud800x'"})");
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_THAT(result.output, HasSubstr("SQL_STRING"));
}

TEST(ZrsqlCatalog, PutsTheIdsOfItsTablesIn) {
    const TemporaryFile catalog(R"([{"table": "Orders", "columns": ["id"]}, {"table": "u", "id": "{42}"}])");
    const auto result = json::parse(
        runZrsql({"analyze", "-d", "mssql", "--catalog", catalog.path(), "SELECT a FROM orders, u, v"})
            .output);
    EXPECT_EQ(result["query"]["m_sourceTables"], json({{"orders", "{Orders}"}, {"u", "{42}"}, {"v", "v"}}));
}

TEST(ZrsqlCatalog, ThatCannotBeReadEndsWithStatus1) {
    const TemporaryFile broken("[{]");
    for (const std::string& path : {std::string("/nowhere/at/all"), broken.path()}) {
        const auto result = runZrsql({"analyze", "-d", "mssql", "--catalog", path, kSimple});
        EXPECT_EQ(result.exitStatus, 1) << path;
        EXPECT_THAT(result.errors, HasSubstr(path));
    }
}

}  // namespace
}  // namespace zr::test
