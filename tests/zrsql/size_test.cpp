// Large inputs: nothing the program writes may need more machine stack for deeper input.

#include <gtest/gtest.h>

#include <algorithm>

#include "program.h"

namespace zr::test {
namespace {

constexpr int kTerms = 10000;

// The operators make a chain of that many nodes, each the first child of the next.
std::string manyTerms() {
    std::string text = "SELECT a FROM t WHERE x = 1";
    for (int term = 1; term < kTerms; ++term) text += " AND x = 1";
    return text;
}

std::string nestedQueries(int depth) {
    std::string text, end;
    for (int level = 0; level < depth; ++level) {
        text += "SELECT a FROM t WHERE x IN (";
        end += ')';
    }
    return text + "1" + end;
}

int countOf(const std::string& wanted, const std::string& text) {
    int count = 0;
    for (std::size_t at = 0; (at = text.find(wanted, at)) != std::string::npos; ++at) ++count;
    return count;
}

// Runs with a machine stack of 256 KB.
ProgramResult runOnSmallStack(const std::string& arguments, const std::string& text = manyTerms()) {
    const TemporaryFile file(text);
    return runShell("ulimit -s 256; build/release/bin/zrsql " + arguments + " -f " + file.path());
}

TEST(LongChain, HasAllItsNodesInEveryFormOfTheTree) {
    for (const char* format : {"sexpr", "json", "dot", "pretty"}) {
        const auto result = runOnSmallStack(std::string("tree -d mssql --format ") + format);
        EXPECT_EQ(result.exitStatus, 0) << format << result.errors;
        EXPECT_EQ(countOf("SEARCH_CONDITION", result.output),
                  format == std::string("json") ? 2 * kTerms : kTerms)
            << format;
    }
}

TEST(LongChain, StaysSmallInThePrettyForm) {
    EXPECT_LT(runOnSmallStack("tree -d mssql --format pretty").output.size(), 20u * 1000 * 1000);
}

TEST(LongChain, IsAnalysedWhole) {
    for (const char* format : {"json", "pretty"}) {
        const auto result = runOnSmallStack(std::string("analyze -d mssql --format ") + format);
        EXPECT_EQ(result.exitStatus, 0) << format << result.errors;
        EXPECT_GE(countOf("AND", result.output), kTerms - 1) << format;
    }
}

TEST(DeepNesting, IsAnalysedWhole) {
    const std::string text = nestedQueries(10000);
    EXPECT_EQ(countOf("\"m_query\"", runOnSmallStack("analyze -d mssql", text).output), 9999);
    EXPECT_EQ(countOf("\nQuery ", runOnSmallStack("analyze -d mssql --format pretty", text).output), 9999);
}

TEST(DeepNesting, BeyondTheLimitIsARecognitionError) {
    const auto result = runOnSmallStack("tree -d mssql", nestedQueries(100000));
    EXPECT_EQ(result.exitStatus, 0);
    EXPECT_EQ(result.output, "(0 \"Tree Error Node\")\n");
}

}  // namespace
}  // namespace zr::test
