// docs/oddities.md has one line for each comment that says "intended", as docs/architecture.md asks of such
// places.

#include <gtest/gtest.h>

#include <filesystem>
#include <map>

#include "program.h"

namespace zr::test {
namespace {

TEST(OdditiesDocument, HasALineForEachPlace) {
    std::map<std::string, int> inCode;
    for (const char* folder : {"analysis", "grammar", "host", "model", "parser", "platform"})
        for (const auto& entry :
             std::filesystem::recursive_directory_iterator(std::string(ZR_SOURCE_DIR "/") + folder)) {
            if (!entry.is_regular_file()) continue;
            const std::string path = std::filesystem::relative(entry.path(), ZR_SOURCE_DIR);
            for (const std::string& line : splitLines(readFile(entry.path())))
                if (line.find("ntended") != std::string::npos) ++inCode[path];
        }
    std::map<std::string, int> inDocument;
    for (const std::string& line : splitLines(readFile(ZR_SOURCE_DIR "/docs/oddities.md")))
        if (line.starts_with("| [")) ++inDocument[line.substr(3, line.find(']') - 3)];
    EXPECT_FALSE(inCode.empty());
    EXPECT_EQ(inDocument, inCode);
}

}  // namespace
}  // namespace zr::test
