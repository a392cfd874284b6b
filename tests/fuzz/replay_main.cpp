// Runs a target over its samples, over what mutation makes of them, and over the files that are named: kept
// finds. With --materials it writes what the fuzzer starts from instead, samples into a folder and words into
// a dictionary.

#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <fstream>

#include "tests/fuzz/pieces.h"
#include "tests/fuzz/scratch_folder.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size);

namespace {

namespace fs = std::filesystem;

constexpr std::size_t kMutationsOfASample = 4;
constexpr std::size_t kLongestMutation = 4096;

void run(const std::string& input) {
    LLVMFuzzerTestOneInput(reinterpret_cast<const std::uint8_t*>(input.data()), input.size());
}

std::vector<fs::path> filesIn(const fs::path& place) {
    if (!fs::is_directory(place)) return {place};
    std::vector<fs::path> files;
    for (const auto& entry : fs::recursive_directory_iterator(place))
        if (entry.is_regular_file()) files.push_back(entry.path());
    std::sort(files.begin(), files.end());
    return files;
}

// A line of a dictionary: the bytes in quotes, all but letters and digits as \xHH.
std::string entryOf(const std::string& word) {
    std::string line = "\"";
    for (const char c : word) {
        const auto byte = static_cast<unsigned char>(c);
        if ((c >= '0' && c <= '9') || (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z')) {
            line += c;
            continue;
        }
        char escape[5];
        std::snprintf(escape, sizeof escape, "\\x%02X", byte);
        line += escape;
    }
    return line + "\"\n";
}

int writeMaterials(zr::fuzz::Language& language, const fs::path& folder, const fs::path& dictionary) {
    constexpr std::size_t kLongestEntry = 64;
    fs::remove_all(folder);
    fs::create_directories(folder);
    std::size_t count = 0;
    for (const std::string& sample : language.samples())
        std::ofstream(folder / std::to_string(++count), std::ios::binary) << sample;
    std::ofstream words(dictionary, std::ios::binary);
    for (const std::string& word : language.words())
        if (!word.empty() && word.size() <= kLongestEntry) words << entryOf(word);
    return words.flush() ? 0 : 1;
}

int replay(zr::fuzz::Language& language, const std::vector<std::string>& places) {
    const std::vector<std::string> samples = language.samples();
    std::size_t runs = 0;
    std::uint32_t seed = 0;
    for (const std::string& sample : samples) {
        run(sample);
        for (std::size_t i = 0; i < kMutationsOfASample; ++i)
            run(zr::fuzz::mutated(language, sample, kLongestMutation, ++seed));
        ++seed;
        const std::string& other = samples[seed % samples.size()];
        run(zr::fuzz::crossed(language, sample, other, kLongestMutation, seed));
        runs += kMutationsOfASample + 2;
    }
    for (const std::string& place : places)
        for (const fs::path& file : filesIn(place)) {
            std::printf("%s\n", file.c_str());
            std::fflush(stdout);
            run(zr::fuzz::bytesOf(file.string()));
            ++runs;
        }
    std::printf("%zu inputs\n", runs);
    return runs > 0 ? 0 : 1;
}

}  // namespace

int main(int argc, char** argv) {
    zr::fuzz::Language& language = zr::fuzz::languageOfTarget();
    const std::vector<std::string> arguments(argv + 1, argv + argc);
    if (arguments.size() == 3 && arguments[0] == "--materials")
        return writeMaterials(language, arguments[1], arguments[2]);
    return replay(language, arguments);
}
