// Runs the grammar compiler on the small grammars under cases: a case replaces files of the good grammar, and
// expected_error.txt tells what the compiler has to say.

#include <gtest/gtest.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

namespace {

namespace fs = std::filesystem;

const fs::path kCases = ZR_COMPILER_CASES;

std::string contentOf(const fs::path& path) {
    std::ifstream in(path, std::ios::binary);
    EXPECT_TRUE(in) << path;
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
}

struct Outcome {
    int status;  ///< exit code, or -1 when the compiler died of a signal
    std::string said;
};

Outcome run(const std::string& arguments) {
    FILE* pipe = popen(("'" ZR_COMPILER "' " + arguments + " 2>&1").c_str(), "r");
    if (pipe == nullptr) return {-1, "can't start the compiler"};
    std::string said;
    for (int c; (c = std::fgetc(pipe)) != EOF;) said += static_cast<char>(c);
    const int status = pclose(pipe);
    return {WIFEXITED(status) ? WEXITSTATUS(status) : -1, said};
}

std::string quoted(const fs::path& path) {
    return "'" + path.string() + "' ";
}

/// The files of a case; those that it doesn't have come from the good grammar.
std::string inputsOf(const std::string& name) {
    const auto file = [&](const char* base) {
        const fs::path own = kCases / name / base;
        return quoted(fs::exists(own) ? own : kCases / "good" / base);
    };
    return "--tokens " + file("toy.tokens") + "--lexer " + file("toy.lexer") + file("toy.grammar");
}

std::vector<std::string> refusedCases() {
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(kCases))
        if (entry.path().filename() != "good") names.push_back(entry.path().filename().string());
    std::sort(names.begin(), names.end());
    return names;
}

/// A folder of its own for what a run writes.
class OutputFolder {
 public:
    explicit OutputFolder(const std::string& name)
        : path_(fs::path(testing::TempDir()) / ("zrgc_" + std::to_string(getpid()) + "_" + name)) {
        fs::create_directories(path_);
    }
    OutputFolder(const OutputFolder&) = delete;
    OutputFolder& operator=(const OutputFolder&) = delete;
    ~OutputFolder() { fs::remove_all(path_); }
    std::string arguments() const {
        return "--headers " + quoted(path_) + "--source " + quoted(path_ / "out.cpp");
    }
    std::vector<std::string> names() const {
        std::vector<std::string> found;
        for (const auto& entry : fs::directory_iterator(path_))
            found.push_back(entry.path().filename().string());
        std::sort(found.begin(), found.end());
        return found;
    }
    std::string content(const std::string& name) const { return contentOf(path_ / name); }

 private:
    fs::path path_;
};

class Refusal : public testing::TestWithParam<std::string> {};

TEST_P(Refusal, NamesFileAndLine) {
    std::string expected = contentOf(kCases / GetParam() / "expected_error.txt");
    ASSERT_NE(expected.find(": error: "), std::string::npos);
    OutputFolder out(GetParam());
    const Outcome outcome = run(inputsOf(GetParam()) + out.arguments());
    EXPECT_EQ(outcome.status, 1);
    EXPECT_EQ(outcome.said.substr(outcome.said.find("toy.")), expected) << outcome.said;
    EXPECT_TRUE(out.names().empty()) << "a refused grammar leaves no files";
}

INSTANTIATE_TEST_SUITE_P(Cases, Refusal, testing::ValuesIn(refusedCases()),
                         [](const auto& name) { return name.param; });

TEST(GrammarCompiler, TakesAGoodGrammar) {
    OutputFolder out("good");
    const Outcome outcome = run(inputsOf("good") + out.arguments());
    EXPECT_EQ(outcome.status, 0);
    EXPECT_EQ(outcome.said, "");
    EXPECT_EQ(out.names(), (std::vector<std::string>{"Toy.h", "Toy_tokens.h", "out.cpp"}));
    EXPECT_NE(out.content("Toy_tokens.h").find("Toy_QUERY"), std::string::npos);
}

TEST(GrammarCompiler, KeepsARuleThatOnlyHostsCall) {
    OutputFolder out("entry");
    ASSERT_EQ(run(inputsOf("good") + out.arguments()).status, 0);
    EXPECT_NE(out.content("Toy.h").find("(*alone)(pToyParser ctx);"), std::string::npos)
        << out.content("Toy.h");
}

TEST(GrammarCompiler, WritesTheSameFilesEveryTime) {
    OutputFolder first("first"), second("second");
    for (const std::string& inputs :
         {inputsOf("good"),
          std::string("--tokens " ZR_MSSQL "/MSSQL.tokens --lexer " ZR_MSSQL "/MSSQL.lexer " ZR_MSSQL
                      "/MSSQL.query.grammar " ZR_MSSQL "/MSSQL.functions.grammar ")}) {
        ASSERT_EQ(run(inputs + first.arguments()).status, 0);
        ASSERT_EQ(run(inputs + second.arguments()).status, 0);
        ASSERT_EQ(first.names(), second.names());
        for (const std::string& name : first.names())
            EXPECT_TRUE(first.content(name) == second.content(name)) << name;
    }
    EXPECT_EQ(first.names().size(), 5U);
}

TEST(GrammarCompiler, RefusesAFileThatIsNotThere) {
    const Outcome outcome = run("--tokens nowhere.tokens --lexer nowhere.lexer nowhere.grammar");
    EXPECT_EQ(outcome.status, 1);
    EXPECT_EQ(outcome.said, "nowhere.tokens:0: error: can't read the file\n");
}

TEST(GrammarCompiler, TellsItsUsage) {
    const Outcome outcome = run("--tokens " + quoted(kCases / "good" / "toy.tokens"));
    EXPECT_EQ(outcome.status, 2);
    EXPECT_EQ(outcome.said.rfind("usage: zrgc ", 0), 0U) << outcome.said;
}

}  // namespace
