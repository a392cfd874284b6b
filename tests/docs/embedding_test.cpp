// docs/embedding.md names each program of examples/embed, and examples/embed builds each one it names.

#include <gtest/gtest.h>

#include <filesystem>
#include <set>

#include "program.h"

namespace zr::test {
namespace {

TEST(EmbeddingDocument, NamesEachProgramThatIsBuilt) {
    const std::string document = readFile(ZR_SOURCE_DIR "/docs/embedding.md");
    const std::string build = readFile(ZR_SOURCE_DIR "/examples/embed/CMakeLists.txt");
    std::set<std::string> programs;
    for (const auto& entry : std::filesystem::directory_iterator(ZR_SOURCE_DIR "/examples/embed")) {
        const std::string file = entry.path().filename();
        if (!file.ends_with(".cpp") && !file.ends_with(".c")) continue;
        programs.insert(file);
        EXPECT_NE(document.find("(../examples/embed/" + file + ")"), std::string::npos) << file;
        EXPECT_NE(build.find(" " + file + ")"), std::string::npos) << file;
        EXPECT_TRUE(std::filesystem::exists(ZR_SOURCE_DIR "/examples/embed/expected/" +
                                            entry.path().stem().string() + ".txt"))
            << file;
    }
    EXPECT_FALSE(programs.empty());
}

// Every link of a document to a file of the tree leads somewhere.
TEST(Documents, HaveNoDeadLinks) {
    std::set<std::filesystem::path> documents = {ZR_SOURCE_DIR "/README.md"};
    for (const auto& entry : std::filesystem::directory_iterator(ZR_SOURCE_DIR "/docs"))
        if (entry.path().extension() == ".md") documents.insert(entry.path());
    int links = 0;
    for (const auto& path : documents) {
        const std::string text = readFile(path);
        for (std::size_t at = 0; (at = text.find("](", at)) != std::string::npos;) {
            at += 2;
            std::string target = text.substr(at, text.find(')', at) - at);
            if (target.find("://") != std::string::npos) continue;
            target = target.substr(0, target.find('#'));
            ++links;
            EXPECT_TRUE(target.empty() || std::filesystem::exists(path.parent_path() / target))
                << path << ": " << target;
        }
    }
    EXPECT_GT(links, 0);
}

}  // namespace
}  // namespace zr::test
