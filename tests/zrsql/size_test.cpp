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

// Runs with a machine stack of 256 KB.
ProgramResult runOnSmallStack(const std::string& arguments) {
    const TemporaryFile file(manyTerms());
    return runShell("ulimit -s 256; build/release/bin/zrsql " + arguments + " -f " + file.path());
}

TEST(LongChain, HasAllItsNodesInEveryFormOfTheTree) {
    for (const char* format : {"sexpr", "json", "dot", "pretty"}) {
        const auto result = runOnSmallStack(std::string("tree -d mssql --format ") + format);
        EXPECT_EQ(result.exitStatus, 0) << format << result.errors;
        int count = 0;
        for (std::size_t at = 0; (at = result.output.find("SEARCH_CONDITION", at)) != std::string::npos; ++at)
            ++count;
        EXPECT_EQ(count, format == std::string("json") ? 2 * kTerms : kTerms) << format;
    }
}

TEST(LongChain, StaysSmallInThePrettyForm) {
    EXPECT_LT(runOnSmallStack("tree -d mssql --format pretty").output.size(), 20u * 1000 * 1000);
}

TEST(LongChain, IsAnalysedWhole) {
    for (const char* format : {"json", "pretty"}) {
        const auto result = runOnSmallStack(std::string("analyze -d mssql --format ") + format);
        EXPECT_EQ(result.exitStatus, 0) << format << result.errors;
        int count = 0;
        for (std::size_t at = 0; (at = result.output.find("AND", at)) != std::string::npos; ++at) ++count;
        EXPECT_GE(count, kTerms - 1) << format;
    }
}

}  // namespace
}  // namespace zr::test
