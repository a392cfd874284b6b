#include "batch.h"

#include <fcntl.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <memory>
#include <stdexcept>
#include <thread>
#include <vector>

#include "line_chunks.h"

namespace zr::tool {
namespace {

using File = std::unique_ptr<std::FILE, int (*)(std::FILE*)>;

File fileOf(const std::string& bytes) {
    File file(std::tmpfile(), std::fclose);
    std::fwrite(bytes.data(), 1, bytes.size(), file.get());
    std::rewind(file.get());
    return file;
}

std::string bytesOf(std::FILE* file) {
    std::rewind(file);
    std::string result;
    for (int character; (character = std::fgetc(file)) != EOF;) result += static_cast<char>(character);
    return result;
}

struct Ran {
    std::string output;
    BatchState state;
};

Ran runOver(const std::string& input, unsigned jobs, const std::function<LineWorker()>& newWorker) {
    const File lines = fileOf(input), output = fileOf({});
    Batch batch;
    batch.input = fileno(lines.get());
    batch.output = output.get();
    batch.jobs = jobs;
    batch.newWorker = newWorker;
    const BatchState state = runBatch(batch);
    return {bytesOf(output.get()), state};
}

// A line that is empty has failed.
LineWorker bracketing() {
    return [](std::string_view line, std::uint64_t, std::string& answer) {
        answer += "<" + std::string(line) + ">";
        return !line.empty();
    };
}

std::string numbers(int count, const std::string& before = {}, const std::string& behind = {}) {
    std::string lines;
    for (int line = 1; line <= count; ++line) lines += before + std::to_string(line) + behind + "\n";
    return lines;
}

TEST(Batch, AnswersEachLine) {
    EXPECT_EQ(runOver("a\n\nb", 1, bracketing).output, "<a>\n<>\n<b>\n");
    EXPECT_EQ(runOver("a\n\nb\n", 3, bracketing).output, "<a>\n<>\n<b>\n");
    EXPECT_EQ(runOver("\n", 1, bracketing).output, "<>\n");
}

TEST(Batch, OfNoLinesMakesNone) {
    EXPECT_EQ(runOver("", 1, bracketing).output, "");
    EXPECT_EQ(runOver("", 2, bracketing).output, "");
}

TEST(Batch, CountsWhatIsDoneAndWhatFailed) {
    const BatchState state = runOver("a\n\nb\n\n\n", 2, bracketing).state;
    EXPECT_EQ(state.done, 2u);
    EXPECT_EQ(state.failed, 3u);
    EXPECT_EQ(state.bytes, 7u);
    EXPECT_EQ(state.allBytes, 7u);
    EXPECT_FALSE(state.interrupted);
}

TEST(Batch, KeepsTheOrderWhenLaterLinesAreDoneEarlier) {
    const auto slowOnSome = [] {
        return LineWorker([](std::string_view line, std::uint64_t number, std::string& answer) {
            if (number % 100 == 1) std::this_thread::sleep_for(std::chrono::milliseconds(3));
            answer += "<" + std::string(line) + ">";
            return true;
        });
    };
    EXPECT_EQ(runOver(numbers(3000), 4, slowOnSome).output, numbers(3000, "<", ">"));
}

TEST(Batch, TellsTheWorkersTheNumberOfTheLine) {
    const auto numbering = [] {
        return LineWorker([](std::string_view, std::uint64_t number, std::string& answer) {
            answer += std::to_string(number);
            return true;
        });
    };
    EXPECT_EQ(runOver(std::string(1000, '\n'), 3, numbering).output, numbers(1000));
}

TEST(Batch, GivesEachThreadAWorkerOfItsOwn) {
    int made = 0;
    runOver("a\n", 3, [&made] {
        ++made;
        return bracketing();
    });
    EXPECT_EQ(made, 3);
}

TEST(Batch, TakesLinesOfAnyLength) {
    const std::string longLine(5 * LineChunks::kMostBytes + 1, 'x');
    EXPECT_EQ(runOver("a\n" + longLine + "\nb\n" + longLine, 2, bracketing).output,
              "<a>\n<" + longLine + ">\n<b>\n<" + longLine + ">\n");
}

TEST(Batch, ThatAWorkerGivesUpWritesWholeAnswersWithoutAGap) {
    const File lines = fileOf(numbers(5000)), output = fileOf({});
    Batch batch;
    batch.input = fileno(lines.get());
    batch.output = output.get();
    batch.jobs = 3;
    batch.newWorker = [] {
        return LineWorker([](std::string_view line, std::uint64_t number, std::string& answer) -> bool {
            answer += "<";
            if (number == 700) throw std::runtime_error("no more");
            answer += std::string(line) + ">";
            return true;
        });
    };
    EXPECT_THROW(runBatch(batch), std::runtime_error);
    const std::string written = bytesOf(output.get());
    EXPECT_TRUE(numbers(699, "<", ">").starts_with(written)) << written;
}

TEST(Batch, OfWhatCanNotBeReadThrows) {
    Batch batch;
    const File output = fileOf({});
    batch.input = open("/", O_RDONLY);  // a folder
    batch.output = output.get();
    batch.newWorker = bracketing;
    EXPECT_THROW(runBatch(batch), ReadError);
    close(batch.input);
}

TEST(LineChunks, HoldNoMoreThanTheirBounds) {
    const File lines = fileOf(numbers(100) + std::string(LineChunks::kMostBytes, 'x') + "\na\n");
    LineChunks chunks(fileno(lines.get()), -1);
    std::vector<std::uint64_t> firsts;
    while (const auto chunk = chunks.next()) {
        firsts.push_back(chunk->firstLine);
        EXPECT_LE(std::count(chunk->lines.begin(), chunk->lines.end(), '\n'),
                  static_cast<std::ptrdiff_t>(LineChunks::kMostLines));
    }
    EXPECT_EQ(firsts, (std::vector<std::uint64_t>{1, 33, 65, 97, 101, 102}))
        << "line 101 is not whole when the others are";
}

TEST(LineChunks, GiveWhatIsThereWithoutWaitingForMore) {
    int ends[2];
    ASSERT_EQ(pipe(ends), 0);
    LineChunks chunks(ends[0], -1);
    ASSERT_EQ(write(ends[1], "a\nb\nc", 5), 5);
    EXPECT_EQ(chunks.next()->lines, "a\nb\n");
    ASSERT_EQ(write(ends[1], "d\n", 2), 2);
    const auto second = chunks.next();
    EXPECT_EQ(second->lines, "cd\n");
    EXPECT_EQ(second->firstLine, 3u);
    close(ends[1]);
    EXPECT_FALSE(chunks.next());
    close(ends[0]);
}

TEST(LineChunks, EndWithAnInterrupt) {
    int input[2], interrupt[2];
    ASSERT_EQ(pipe(input), 0);
    ASSERT_EQ(pipe(interrupt), 0);
    ASSERT_EQ(write(input[1], "a\nb", 3), 3);
    LineChunks chunks(input[0], interrupt[0]);
    EXPECT_EQ(chunks.next()->lines, "a\n");
    ASSERT_EQ(write(interrupt[1], "", 1), 1);
    EXPECT_FALSE(chunks.next());
    for (const int each : {input[0], input[1], interrupt[0], interrupt[1]}) close(each);
}

BatchState stateOf(std::uint64_t done, std::uint64_t failed, int milliseconds) {
    BatchState state;
    state.done = done;
    state.failed = failed;
    state.elapsed = std::chrono::milliseconds(milliseconds);
    return state;
}

TEST(ProgressText, TellsQueriesRateAndTimeLeft) {
    BatchState state = stateOf(1498, 2, 5000);
    EXPECT_EQ(progressText(state), "1500 queries, 300/s");
    state.allBytes = 6000;
    state.bytes = 1000;
    EXPECT_EQ(progressText(state), "1500 queries, 300/s, 0:25 left");
    state.allBytes = 1000 * 1000;
    EXPECT_EQ(progressText(state), "1500 queries, 300/s, 1:23:15 left");
    state.bytes = 2000 * 1000;
    EXPECT_EQ(progressText(state), "1500 queries, 300/s, 0:00 left") << "a file may grow";
}

TEST(ProgressText, OfTheSummaryTellsDoneAndFailed) {
    BatchState state = stateOf(1498, 2, 30000);
    EXPECT_EQ(summaryText(state), "1498 done, 2 failed, 0:30 (50/s)");
    state.interrupted = true;
    EXPECT_EQ(summaryText(state),
              "interrupted: 1498 done, 2 failed, 0:30 (50/s); --skip 1500 goes on from there");
    state.skipped = 700;
    EXPECT_THAT(summaryText(state), testing::EndsWith("; --skip 2200 goes on from there"));
    EXPECT_EQ(summaryText(stateOf(0, 0, 0)), "0 done, 0 failed, 0:00 (0/s)");
}

void show(Progress& progress, const BatchState& state) {
    progress.show(state.elapsed, progressText(state));
}

TEST(Progress, IsTakenAwayFromATerminal) {
    const File screen = fileOf({});
    Progress progress(screen.get(), true);
    progress.clear();
    show(progress, stateOf(1, 0, 1000));
    progress.clear();
    EXPECT_EQ(bytesOf(screen.get()), "\r1 queries, 1/s\r              \r");
}

TEST(Progress, StaysInOneLineOfATerminalAndCoversWhatStoodThere) {
    const File screen = fileOf({});
    Progress progress(screen.get(), true);
    show(progress, stateOf(1000000, 0, 1000));
    show(progress, stateOf(1000001, 0, 1001));  // too soon
    progress.end(summaryText(stateOf(1, 0, 2000)));
    progress.clear();
    EXPECT_EQ(bytesOf(screen.get()), "\r1000000 queries, 1000000/s\r1 done, 0 failed, 0:02 (1/s)\n");
}

TEST(Progress, CoversALongerTextOnATerminal) {
    const File screen = fileOf({});
    Progress progress(screen.get(), true);
    show(progress, stateOf(1000000, 0, 1000));
    show(progress, stateOf(1, 0, 2000));
    EXPECT_EQ(bytesOf(screen.get()), "\r1000000 queries, 1000000/s\r1 queries, 1/s            ");
}

TEST(Progress, OfAFileIsALineASecond) {
    const File log = fileOf({});
    Progress progress(log.get(), false);
    for (int elapsed = 100; elapsed < 2500; elapsed += 100) show(progress, stateOf(10, 0, elapsed));
    progress.end(summaryText(stateOf(10, 0, 5000)));
    EXPECT_EQ(bytesOf(log.get()),
              "10 queries, 100/s\n10 queries, 9/s\n10 queries, 5/s\n10 done, 0 failed, 0:05 (2/s)\n");
}

}  // namespace
}  // namespace zr::tool
