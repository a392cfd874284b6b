#include "program.h"

#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <csignal>
#include <cstdlib>
#include <fstream>
#include <regex>
#include <sstream>
#include <stdexcept>
#include <thread>

namespace zr::test {

namespace {

struct Pipe {
    Pipe() {
        if (pipe(ends.data()) != 0) throw std::runtime_error("no pipe");
    }
    void closeEnd(int end) { close(ends[static_cast<std::size_t>(end)]); }
    std::array<int, 2> ends{};
};

std::string readAll(int descriptor) {
    std::string bytes;
    char block[1 << 16];
    for (ssize_t count; (count = read(descriptor, block, sizeof block)) > 0;)
        bytes.append(block, static_cast<std::size_t>(count));
    close(descriptor);
    return bytes;
}

void writeAll(int descriptor, const std::string& bytes) {
    for (std::size_t done = 0; done < bytes.size();) {
        const ssize_t count = write(descriptor, bytes.data() + done, bytes.size() - done);
        if (count <= 0) break;  // the program may end without reading its input
        done += static_cast<std::size_t>(count);
    }
    close(descriptor);
}

ProgramResult run(const std::vector<std::string>& words, const std::string& input) {
    std::signal(SIGPIPE, SIG_IGN);
    Pipe in, out, err;
    const pid_t child = fork();
    if (child == 0) {
        dup2(in.ends[0], STDIN_FILENO);
        dup2(out.ends[1], STDOUT_FILENO);
        dup2(err.ends[1], STDERR_FILENO);
        for (Pipe* each : {&in, &out, &err}) {
            each->closeEnd(0);
            each->closeEnd(1);
        }
        if (chdir(ZR_SOURCE_DIR) != 0) _exit(126);
        std::vector<char*> arguments;
        for (const std::string& word : words) arguments.push_back(const_cast<char*>(word.c_str()));
        arguments.push_back(nullptr);
        execv(arguments[0], arguments.data());
        _exit(127);
    }
    in.closeEnd(0);
    out.closeEnd(1);
    err.closeEnd(1);
    ProgramResult result;
    std::thread feeder([&] { writeAll(in.ends[1], input); });
    std::thread listener([&] { result.errors = readAll(err.ends[0]); });
    result.output = readAll(out.ends[0]);
    feeder.join();
    listener.join();
    int status = 0;
    waitpid(child, &status, 0);
    if (WIFEXITED(status)) result.exitStatus = WEXITSTATUS(status);
    return result;
}

// Long work ends with one line more on standard error.
void takeSummaryOut(ProgramResult& result) {
    static const std::regex form("zrsql: (.*), [0-9:]+[0-9](?: \\([0-9]+/s\\))?((?:; .*)?)\n");
    if (result.errors.empty()) return;
    const std::size_t before = result.errors.rfind('\n', result.errors.size() - 2);
    const std::size_t start = before == std::string::npos ? 0 : before + 1;
    const std::string last = result.errors.substr(start);
    std::smatch parts;
    if (!std::regex_match(last, parts, form)) return;
    result.summary = parts[1].str() + parts[2].str();
    result.errors.resize(start);
}

}  // namespace

ProgramResult runZrsql(const std::vector<std::string>& arguments, const std::string& input) {
    std::vector<std::string> words = {ZR_BIN_DIR "/zrsql"};
    words.insert(words.end(), arguments.begin(), arguments.end());
    ProgramResult result = run(words, input);
    if (words.size() > 1 &&
        (words[1] == "project" || words[1] == "lineage" || words[1] == "impact" || words[1] == "report"))
        takeSummaryOut(result);
    return result;
}

ProgramResult runShell(const std::string& line) {
    static const std::string folder = "build/release/bin/";
    static const std::string underTest = ZR_BIN_DIR "/";
    std::string command = line;
    for (std::size_t at = 0; (at = command.find(folder, at)) != std::string::npos; at += underTest.size())
        command.replace(at, folder.size(), underTest);
    return run({"/bin/sh", "-c", command}, {});
}

std::string readFile(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    EXPECT_TRUE(file) << path;
    std::ostringstream bytes;
    bytes << file.rdbuf();
    return bytes.str();
}

TemporaryFile::TemporaryFile(const std::string& bytes) : path_(testing::TempDir() + "zrsql_test_XXXXXX") {
    const int descriptor = mkstemp(path_.data());
    EXPECT_NE(descriptor, -1);
    writeAll(descriptor, bytes);
}

TemporaryFile::~TemporaryFile() {
    unlink(path_.c_str());
}

std::vector<std::string> splitLines(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream stream(text);
    for (std::string line; std::getline(stream, line);) lines.push_back(line);
    return lines;
}

}  // namespace zr::test
