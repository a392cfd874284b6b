#pragma once

#include <filesystem>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace zr::test {

/// One case of a corpus file: a title and its sections in order. tests/corpus/README.md tells what each
/// section holds.
struct CorpusCase {
    std::string title;
    std::vector<std::pair<std::string, std::string>> sections;

    const std::string* find(std::string_view section) const;
    /// Replaces a section, or adds it behind the others.
    void set(const std::string& section, std::string text);
    void drop(std::string_view section);

    /// The text to be read, from the section `sql` or `json`.
    std::u16string text() const;
};

struct CorpusFile {
    std::filesystem::path path;
    std::string preamble;  ///< what stands in front of the first case
    std::vector<CorpusCase> cases;

    /// Throws std::runtime_error with path and title when the file is out of shape.
    static CorpusFile read(const std::filesystem::path& path);
    void write() const;
};

/// The corpus files of a dialect, sorted by name.
std::vector<CorpusFile> readCorpus(const std::filesystem::path& folder);

}  // namespace zr::test
