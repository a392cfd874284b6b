// Runs the cases of golden/*.txt. A case is
//
//     === title
//     --- run: arguments of zrsql
//     the SQL text, given on standard input
//     --- output
//     what the program writes
//
// and ends before the next title or with the file. ZR_BLESS=1 in the environment writes what the program does
// write into the files; the difference is then to be read before it is committed.

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>

#include "program.h"

namespace zr::test {
namespace {

struct GoldenCase {
    std::string title;
    std::string arguments;
    std::string text;
    std::string output;
};

constexpr std::string_view kTitle = "=== ", kRun = "--- run: ", kOutput = "--- output";

std::vector<GoldenCase> readCases(const std::string& path) {
    std::vector<GoldenCase> cases;
    bool inOutput = false;
    for (const std::string& line : splitLines(readFile(path))) {
        if (line.starts_with(kTitle)) {
            cases.push_back({line.substr(kTitle.size()), {}, {}, {}});
            inOutput = false;
        } else if (line.starts_with(kRun)) {
            cases.back().arguments = line.substr(kRun.size());
        } else if (line == kOutput) {
            inOutput = true;
        } else {
            (inOutput ? cases.back().output : cases.back().text) += line + "\n";
        }
    }
    return cases;
}

void writeCases(const std::string& path, const std::vector<GoldenCase>& cases) {
    std::ofstream file(path, std::ios::binary);
    for (const GoldenCase& each : cases)
        file << kTitle << each.title << '\n'
             << kRun << each.arguments << '\n'
             << each.text << kOutput << '\n'
             << each.output;
}

ProgramResult run(const GoldenCase& each) {
    std::istringstream words(each.arguments);
    const std::vector<std::string> arguments{std::istream_iterator<std::string>(words), {}};
    // The line end behind the text's last line belongs to the file, not to the text.
    return runZrsql(arguments, each.text.substr(0, each.text.size() - 1));
}

class Golden : public testing::TestWithParam<std::string> {};

TEST_P(Golden, OutputIsAsWritten) {
    const std::string path = ZR_GOLDEN_DIR "/" + GetParam() + ".txt";
    std::vector<GoldenCase> cases = readCases(path);
    ASSERT_FALSE(cases.empty()) << path;
    for (GoldenCase& each : cases) {
        const ProgramResult result = run(each);
        EXPECT_EQ(result.exitStatus, 0) << each.title << ": " << result.errors;
        if (std::getenv("ZR_BLESS"))
            each.output = result.output;
        else
            EXPECT_EQ(result.output, each.output) << path << ": " << each.title;
    }
    if (std::getenv("ZR_BLESS")) writeCases(path, cases);
}

std::vector<std::string> goldenFiles() {
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(ZR_GOLDEN_DIR))
        names.push_back(entry.path().stem().string());
    std::sort(names.begin(), names.end());
    return names;
}

INSTANTIATE_TEST_SUITE_P(Files, Golden, testing::ValuesIn(goldenFiles()),
                         [](const testing::TestParamInfo<std::string>& file) { return file.param; });

}  // namespace
}  // namespace zr::test
