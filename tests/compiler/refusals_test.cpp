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
    const fs::path& path() const { return path_; }

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

/// The good grammar with another body of its rule "tail".
Outcome runWithTail(const std::string& body) {
    OutputFolder out("tail");
    std::string grammar = contentOf(kCases / "good" / "toy.grammar");
    const std::string old = "tail : STAR ;";
    const std::size_t at = grammar.find(old);
    EXPECT_NE(at, std::string::npos);
    grammar.replace(at, old.size(), "tail : " + body + " ;");
    const fs::path file = out.path() / "toy.grammar";
    std::ofstream(file, std::ios::binary) << grammar;
    const fs::path good = kCases / "good";
    return run("--tokens " + quoted(good / "toy.tokens") + "--lexer " + quoted(good / "toy.lexer") +
               quoted(file) + out.arguments());
}

TEST(GrammarCompiler, TakesAHundredGroupsInsideEachOther) {
    const Outcome outcome = runWithTail(std::string(100, '(') + "STAR" + std::string(100, ')'));
    EXPECT_EQ(outcome.status, 0) << outcome.said;
}

TEST(GrammarCompiler, TakesMoreAlternativesThanAChoiceHasBranches) {
    std::string body = "STAR";
    for (int stars = 2; stars <= 100; ++stars) {
        body += " |";
        for (int i = 0; i < stars; ++i) body += " STAR";
    }
    const Outcome outcome = runWithTail(body);
    EXPECT_EQ(outcome.status, 0) << outcome.said;
}

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

/// A grammar of the library: its folder, its name and its parser files, in their order.
struct Real {
    const char* folder;
    const char* name;
    std::vector<const char*> files;
};

const Real kReal[] = {
    {"mssql", "MSSQL", {"MSSQL.query", "MSSQL.functions"}},
    {"mssql", "MSSQLfrom", {"MSSQLfrom"}},
    {"mysql", "MySQLSelect", {"MySQLSelect.query", "MySQLSelect.expression"}},
    {"oracle", "Oracle", {"Oracle.query", "Oracle.expression"}},
    {"postgresql", "PostgreSQL", {"PostgreSQL.query", "PostgreSQL.expression", "PostgreSQL.statements"}},
    {"msaccess", "MSAccessSQL_v3", {"MSAccessSQL_v3.query", "MSAccessSQL_v3.expression"}},
};

std::string inputsOf(const Real& grammar) {
    const fs::path folder = fs::path(ZR_GRAMMARS) / grammar.folder;
    std::string inputs = "--tokens " + quoted(folder / (std::string(grammar.name) + ".tokens")) + "--lexer " +
                         quoted(folder / (std::string(grammar.name) + ".lexer"));
    for (const char* file : grammar.files) inputs += quoted(folder / (std::string(file) + ".grammar"));
    return inputs;
}

class RealGrammar : public testing::TestWithParam<Real> {};

// What the build compiled says nothing of the machine, the folder or the time.
TEST_P(RealGrammar, CompilesToWhatTheBuildHas) {
    OutputFolder out(GetParam().name);
    const std::string source = std::string(GetParam().name) + ".cpp";
    const Outcome outcome = run(inputsOf(GetParam()) + "--headers " + quoted(out.path()) + "--source " +
                                quoted(out.path() / source));
    ASSERT_EQ(outcome.status, 0) << outcome.said;
    EXPECT_EQ(out.names().size(), 3U);
    for (const std::string& name : out.names()) {
        const fs::path built =
            fs::path(ZR_GENERATED) / (name == source ? "" : "zrparsersql/recognizers") / name;
        EXPECT_TRUE(out.content(name) == contentOf(built)) << name;
    }
}

INSTANTIATE_TEST_SUITE_P(Grammars, RealGrammar, testing::ValuesIn(kReal),
                         [](const auto& grammar) { return grammar.param.name; });

TEST(GrammarCompiler, TakesComplementsAndCutsInALexer) {
    OutputFolder out("complement");
    const fs::path lexer = out.path() / "toy.lexer";
    std::string text = contentOf(kCases / "good" / "toy.lexer");
    text.replace(text.find("WS : "), 5, "WS : '[' ~[\\]x]* ']' ~'y' -> cut(1,2) ;\n// ");
    std::ofstream(lexer, std::ios::binary) << text;
    const Outcome outcome = run("--tokens " + quoted(kCases / "good" / "toy.tokens") + "--lexer " +
                                quoted(lexer) + quoted(kCases / "good" / "toy.grammar") + out.arguments());
    EXPECT_EQ(outcome.status, 0) << outcome.said;
    EXPECT_NE(out.content("out.cpp").find(", 0, 1, 2, "), std::string::npos) << "the cut of WS";
}

TEST(GrammarCompiler, RefusesAFileOfAnotherGrammar) {
    const Outcome outcome =
        run(inputsOf("good") + quoted(fs::path(ZR_GRAMMARS) / "mssql" / "MSSQLfrom.grammar"));
    EXPECT_EQ(outcome.status, 1);
    EXPECT_NE(outcome.said.find("MSSQLfrom.grammar:"), std::string::npos) << outcome.said;
    EXPECT_NE(outcome.said.find("this file is of grammar MSSQLfrom, the files before it are of Toy"),
              std::string::npos)
        << outcome.said;
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
