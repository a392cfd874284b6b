#include "batch.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cstdio>
#include <memory>
#include <sstream>
#include <thread>

namespace zr::tool {
namespace {

std::string runOver(const std::string& input, unsigned jobs, const std::function<LineWorker()>& newWorker) {
    std::istringstream lines(input);
    const std::unique_ptr<std::FILE, int (*)(std::FILE*)> output(std::tmpfile(), std::fclose);
    runBatch(lines, output.get(), jobs, newWorker);
    std::rewind(output.get());
    std::string result;
    for (int character; (character = std::fgetc(output.get())) != EOF;)
        result += static_cast<char>(character);
    return result;
}

LineWorker bracketing() {
    return [](std::string_view line) { return "<" + std::string(line) + ">"; };
}

TEST(Batch, AnswersEachLine) {
    EXPECT_EQ(runOver("a\n\nb", 1, bracketing), "<a>\n<>\n<b>\n");
    EXPECT_EQ(runOver("a\n\nb\n", 3, bracketing), "<a>\n<>\n<b>\n");
}

TEST(Batch, OfNoLinesMakesNone) {
    EXPECT_EQ(runOver("", 1, bracketing), "");
    EXPECT_EQ(runOver("", 2, bracketing), "");
}

TEST(Batch, KeepsTheOrderWhenLaterLinesAreDoneEarlier) {
    std::string input, expected;
    for (int line = 0; line < 1000; ++line) {
        input += std::to_string(line) + "\n";
        expected += "<" + std::to_string(line) + ">\n";
    }
    const auto slowOnSome = [] {
        return LineWorker([](std::string_view line) {
            if (line.back() == '0') std::this_thread::sleep_for(std::chrono::microseconds(300));
            return "<" + std::string(line) + ">";
        });
    };
    EXPECT_EQ(runOver(input, 4, slowOnSome), expected);
}

TEST(Batch, GivesEachThreadAWorkerOfItsOwn) {
    int made = 0;
    runOver("a\n", 3, [&made] {
        ++made;
        return bracketing();
    });
    EXPECT_EQ(made, 3);
}

}  // namespace
}  // namespace zr::tool
