// --jsonl over many lines: order, memory, interrupts and what is told on the way.

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <csignal>
#include <nlohmann/json.hpp>
#include <thread>

#include "program.h"
#include "started_program.h"

namespace zr::test {
namespace {

using nlohmann::json;
using testing::HasSubstr;
using testing::MatchesRegex;

std::string query(int number) {
    const std::string name = std::to_string(number);
    return "{\"id\":" + name + ",\"sql\":\"SELECT c" + name + ", dbo.f" + std::to_string(number % 7) +
           "(a) AS x FROM orders o, t" + std::to_string(number % 100) + " WHERE o.id = " + name + "\"}\n";
}

std::string queries(int from, int to) {
    std::string lines;
    for (int number = from; number < to; ++number) lines += query(number);
    return lines;
}

// Good, bad and empty lines, a few of them long.
std::string mixedLines() {
    std::string lines;
    for (int number = 0; number < 3000; ++number) {
        if (number % 50 == 7) lines += "no json\n";
        if (number % 60 == 3) lines += "\n";
        if (number % 70 == 1) lines += "{\"id\":" + std::to_string(number) + "}\n";
        if (number % 900 == 5) {
            lines += R"({"id":"long","sql":"SELECT a FROM t WHERE x = 1)";
            for (int term = 0; term < 2000; ++term) lines += " AND x = 1";
            lines += "\"}\n";
        }
        lines += query(number);
    }
    return lines.substr(0, lines.size() - 1);  // the last line without an end
}

const char* const kCatalog =
    R"([{"table": "orders", "columns": ["id", "city"], "id": "{7}"}, {"table": "t5"}])";

TEST(ManyLines, AreAnsweredAlikeWithAnyNumberOfJobs) {
    const TemporaryFile catalog(kCatalog), lines(mixedLines());
    for (const char* command : {"tokens", "tree", "analyze"}) {
        std::vector<std::string> words = {command, "-d", "mssql", "--jsonl", lines.path(), "--jobs", "1"};
        if (command == std::string("analyze")) words.insert(words.end(), {"--catalog", catalog.path()});
        const std::string alone = runZrsql(words).output;
        EXPECT_EQ(splitLines(alone).size(), 3157u) << command;
        for (const char* jobs : {"2", "8", "0"}) {
            words[6] = jobs;
            const auto together = runZrsql(words);
            EXPECT_EQ(together.exitStatus, 0) << together.errors;
            EXPECT_TRUE(together.output == alone) << command << " " << jobs;
        }
    }
}

TEST(ManyLines, TellTheNumberOfALineWithAnError) {
    std::string input;
    for (int number = 1; number <= 200; ++number) input += number % 40 == 0 ? "no\n" : query(number);
    for (const char* jobs : {"1", "3"}) {
        std::vector<int> told;
        for (const std::string& line :
             splitLines(runZrsql({"analyze", "-d", "mssql", "--jsonl", "-", "--jobs", jobs}, input).output)) {
            const json answer = json::parse(line);
            if (answer.contains("error")) told.push_back(answer["line"]);
        }
        EXPECT_EQ(told, (std::vector<int>{40, 80, 120, 160, 200})) << jobs;
    }
}

TEST(ManyLines, AreAnsweredWithoutWaitingForMore) {
    for (const char* jobs : {"1", "4"}) {
        StartedProgram program({"tokens", "-d", "mssql", "--jsonl", "-", "--jobs", jobs});
        for (int number = 0; number < 3; ++number) {
            program.write("{\"id\":" + std::to_string(number) + ",\"sql\":\"a\"}\n");
            EXPECT_EQ(program.readLine(),
                      "{\"id\":" + std::to_string(number) + ",\"tokens\":[[249,\"IDENTIFICATOR\",\"a\"]]}");
        }
        EXPECT_EQ(program.wait().exitStatus, 0);
    }
}

long peakOver(int count) {
    StartedProgram program({"analyze", "-d", "mssql", "--jsonl", "-", "--jobs", "4"});
    std::size_t answered = 0;
    std::thread reader([&] {
        while (!program.readLine().empty()) ++answered;
    });
    for (int number = 0; number < count; number += 1000) {
        std::string lines;
        for (int line = number; line < number + 1000; ++line)
            lines += "{\"sql\":\"SELECT dbo.f(c" + std::to_string(line) + ") FROM t\"}\n";
        program.write(lines);
    }
    program.closeInput();
    reader.join();
    EXPECT_EQ(answered, static_cast<std::size_t>(count));
    const auto end = program.wait();
    EXPECT_EQ(end.exitStatus, 0) << end.errors;
    return end.peakKilobytes;
}

TEST(ManyLines, NeedNoMoreMemoryThanFew) {
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
    GTEST_SKIP() << "a sanitizer keeps what the program frees";
#endif
    const long few = peakOver(10000);
    EXPECT_GT(few, 0);
    EXPECT_LT(peakOver(200000), few + 16 * 1024);
}

TEST(ManyLines, AreNotReadWhileNobodyTakesTheAnswers) {
    StartedProgram program({"analyze", "-d", "mssql", "--jsonl", "-", "--jobs", "2"});
    std::atomic<int> sent = 0;
    std::thread feeder([&] {
        for (int number = 0; number < 5000; number += 100) {
            program.write(queries(number, number + 100));
            sent = number + 100;
        }
        program.closeInput();
    });
    // The program stops to read once its window is full.
    int before = -1;
    while (sent != before) {
        before = sent;
        std::this_thread::sleep_for(std::chrono::milliseconds(500));
    }
    EXPECT_LT(before, 5000);
    const std::string rest = program.readRest();
    feeder.join();
    EXPECT_EQ(std::count(rest.begin(), rest.end(), '\n'), 5000);
    EXPECT_EQ(program.wait().exitStatus, 0);
}

TEST(Interrupt, EndsTheRunBehindWholeAnswersInOrder) {
    for (const char* jobs : {"1", "4"}) {
        StartedProgram program({"analyze", "-d", "mssql", "--jsonl", "-", "--jobs", jobs, "--progress"});
        std::thread feeder([&program] {
            for (int number = 0; number < 100000; number += 1000)
                program.write(queries(number, number + 1000));
        });
        std::vector<std::string> lines;
        while (lines.size() < 500) lines.push_back(program.readLine());
        program.signal(SIGINT);
        for (std::string line; !(line = program.readLine()).empty();) lines.push_back(line);
        feeder.join();
        const auto end = program.wait();
        EXPECT_EQ(end.exitStatus, 130);
        EXPECT_LT(lines.size(), 100000u);
        for (std::size_t at = 0; at < lines.size(); ++at) ASSERT_EQ(json::parse(lines[at])["id"], at);
        EXPECT_THAT(end.errors,
                    HasSubstr("interrupted: " + std::to_string(lines.size()) + " done, 0 failed"));
    }
}

TEST(Interrupt, EndsARunThatWaitsForInput) {
    StartedProgram program({"tokens", "-d", "mssql", "--jsonl", "-"});
    program.write("{\"id\":1,\"sql\":\"\"}\n{\"id\":2");
    EXPECT_EQ(program.readLine(), "{\"id\":1,\"tokens\":[]}");
    program.signal(SIGINT);
    EXPECT_EQ(program.readRest(), "") << "the line that was begun is no line";
    const auto end = program.wait();
    EXPECT_EQ(end.exitStatus, 130);
    EXPECT_THAT(end.errors,
                MatchesRegex("zrsql: interrupted: 1 done, 0 failed, 0:0[0-9] \\([0-9]+/s\\); --skip 1 "
                             "goes on from there\n"));
}

TEST(Interrupt, GivenTwiceEndsARunWhoseAnswersNobodyReads) {
    StartedProgram program({"analyze", "-d", "mssql", "--jsonl", "-", "--jobs", "2"});
    std::thread feeder([&program] { program.write(queries(0, 5000)); });
    EXPECT_NE(program.readLine(), "");
    std::this_thread::sleep_for(std::chrono::milliseconds(300));  // the pipe fills up meanwhile
    program.signal(SIGINT);
    std::this_thread::sleep_for(std::chrono::milliseconds(300));
    program.signal(SIGINT);
    feeder.join();  // ends once nobody reads the other end
    EXPECT_EQ(program.wait().signal, SIGINT);
}

TEST(ProgressOption, TellsOfAFileHowMuchTimeIsLeft) {
    const TemporaryFile lines(queries(0, 300) + "no\n\n");
    const auto result = runZrsql({"analyze", "-d", "mssql", "--jsonl", lines.path(), "--progress"});
    EXPECT_EQ(result.exitStatus, 0);
    const auto told = splitLines(result.errors);
    ASSERT_GE(told.size(), 2u);
    EXPECT_THAT(told.front(), MatchesRegex("[0-9]+ queries, [0-9]+/s, [0-9]+:[0-9][0-9] left"));
    EXPECT_THAT(told.back(), MatchesRegex("zrsql: 300 done, 2 failed, [0-9]+:[0-9][0-9] \\([0-9]+/s\\)"));
}

TEST(ProgressOption, TellsOfAPipeNoTimeLeft) {
    const auto result = runZrsql({"tree", "-d", "mssql", "--jsonl", "-", "--progress"}, queries(0, 10));
    const auto told = splitLines(result.errors);
    ASSERT_EQ(splitLines(result.output).size(), 10u);
    ASSERT_GE(told.size(), 2u);
    EXPECT_THAT(told.front(), MatchesRegex("[0-9]+ queries, [0-9]+/s"));
    EXPECT_THAT(told.back(), MatchesRegex("zrsql: 10 done, 0 failed, [0-9]+:[0-9][0-9] \\([0-9]+/s\\)"));
}

TEST(ProgressOption, IsOffWhereNobodyAskedAndNoTerminalIsThere) {
    EXPECT_EQ(runZrsql({"tree", "-d", "mssql", "--jsonl", "-"}, queries(0, 10)).errors, "");
}

TEST(ProgressOption, IsForManyLines) {
    EXPECT_EQ(runZrsql({"tree", "-d", "mssql", "--progress", "SELECT a"}).exitStatus, 2);
}

}  // namespace
}  // namespace zr::test
