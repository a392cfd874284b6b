#include <algorithm>
#include <filesystem>

#include "tests/fuzz/samples.h"
#include "tests/fuzz/scratch_folder.h"

namespace zr::fuzz {

// The cases of the compiler's own tests: each replaces files of the good one.
std::vector<std::string> grammarSamples() {
    namespace fs = std::filesystem;
    const fs::path cases = ZR_COMPILER_CASES;
    std::vector<fs::path> folders;
    for (const auto& entry : fs::directory_iterator(cases)) folders.push_back(entry.path());
    std::sort(folders.begin(), folders.end());
    std::vector<std::string> samples;
    for (const fs::path& folder : folders) {
        std::string sample;
        for (const char* file : {"toy.tokens", "toy.lexer", "toy.grammar"}) {
            if (!sample.empty()) sample += kNextFile;
            sample += bytesOf((fs::exists(folder / file) ? folder / file : cases / "good" / file).string());
        }
        samples.push_back(std::move(sample));
    }
    return samples;
}

}  // namespace zr::fuzz
