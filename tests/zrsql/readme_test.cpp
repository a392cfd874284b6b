// Runs what the documents show. In a block that begins with ```console each line behind "$ " is a command,
// and the lines up to the next one are what it writes.

#include <gtest/gtest.h>

#include <filesystem>

#include "program.h"

namespace zr::test {
namespace {

struct Shown {
    std::string command;
    std::string output;
};

std::vector<Shown> shownIn(const std::string& document) {
    std::vector<Shown> all;
    bool inBlock = false;
    for (const std::string& line : splitLines(document)) {
        if (line.starts_with("```"))
            inBlock = line == "```console";
        else if (inBlock && line.starts_with("$ "))
            all.push_back({line.substr(2), {}});
        else if (inBlock && !all.empty() && all.back().command.ends_with('\\'))
            all.back().command += "\n" + line;
        else if (inBlock && !all.empty())
            all.back().output += line + "\n";
    }
    return all;
}

class Document : public testing::TestWithParam<std::string> {};

std::string replaced(std::string text, const std::string& from, const std::string& to) {
    for (std::size_t at = 0; (at = text.find(from, at)) != std::string::npos; at += to.size())
        text.replace(at, from.size(), to);
    return text;
}

TEST_P(Document, ShowsWhatItsCommandsWrite) {
    const auto all = shownIn(readFile(ZR_SOURCE_DIR "/" + GetParam()));
    EXPECT_FALSE(all.empty());
    // Files that the commands make go where no other run is.
    std::string folder = testing::TempDir() + "zrsql_document_XXXXXX";
    ASSERT_NE(mkdtemp(folder.data()), nullptr);
    for (const Shown& shown : all) {
        const ProgramResult result = runShell(replaced(shown.command, "/tmp/", folder + "/"));
        EXPECT_EQ(replaced(result.output, folder + "/", "/tmp/"), shown.output) << shown.command;
    }
    std::filesystem::remove_all(folder);
}

INSTANTIATE_TEST_SUITE_P(Files, Document,
                         testing::Values("README.md", "docs/zrsql.md", "docs/projects.md", "docs/lineage.md",
                                         "docs/from-tree-to-descriptor.md", "docs/oddities.md"));

TEST(Readme, ShowsTheExampleThatIsBuilt) {
    const std::string readme = readFile(ZR_SOURCE_DIR "/README.md");
    const std::string example = readFile(ZR_SOURCE_DIR "/examples/embed/columns.cpp");
    EXPECT_NE(readme.find("```cpp\n" + example + "```\n"), std::string::npos);
}

TEST(Readme, ShowsTheLinesOfTheProjectThatTakesTheLibraryIn) {
    const std::string readme = readFile(ZR_SOURCE_DIR "/README.md");
    const std::string project = readFile(ZR_SOURCE_DIR "/tests/zrsql/embed_as_folder/CMakeLists.txt");
    EXPECT_NE(readme.find("`add_subdirectory(ZRParserSQL)`"), std::string::npos);
    EXPECT_NE(project.find("target_link_libraries(host PRIVATE ZRParserSQL::zrparsersql)\n"),
              std::string::npos);
}

TEST(Examples, AreAllAnalysed) {
    const auto result = runShell(
        "for file in examples/*/*.sql; do"
        "  build/release/bin/zrsql analyze -d $(basename $(dirname $file)) --format pretty"
        "    --catalog examples/catalog.json -f $file | grep -c '^Columns$' || exit 1;"
        " done");
    EXPECT_EQ(result.exitStatus, 0) << result.output << result.errors;
}

}  // namespace
}  // namespace zr::test
