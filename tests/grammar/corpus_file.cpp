#include "tests/grammar/corpus_file.h"

#include <algorithm>
#include <fstream>
#include <set>
#include <stdexcept>

#include "tests/grammar/json_string.h"

namespace zr::test {
namespace {

constexpr std::string_view kTitle = "=== ";
constexpr std::string_view kSection = "--- ";

void trimLineEnds(std::string& text) {
    while (!text.empty() && text.back() == '\n') text.pop_back();
    text.erase(0, text.find_first_not_of('\n'));
}

auto locate(auto& sections, std::string_view name) {
    return std::find_if(sections.begin(), sections.end(), [&](const auto& s) { return s.first == name; });
}

void check(const CorpusCase& one, std::set<std::string>& titles) {
    if (!titles.insert(one.title).second) throw std::runtime_error("a second case of this title");
    if ((one.find("sql") == nullptr) == (one.find("json") == nullptr))
        throw std::runtime_error("wants sql or json, one of them");
    if (one.find("tokens") == nullptr && one.find("tree") == nullptr)
        throw std::runtime_error("wants tokens or tree");
    constexpr std::string_view kKnown[] = {"sql", "json", "tokens", "tree", "rest"};
    for (const auto& [name, text] : one.sections)
        if (std::find(std::begin(kKnown), std::end(kKnown), name) == std::end(kKnown))
            throw std::runtime_error("unknown section " + name);
}

}  // namespace

const std::string* CorpusCase::find(std::string_view section) const {
    const auto found = locate(sections, section);
    return found == sections.end() ? nullptr : &found->second;
}

void CorpusCase::set(const std::string& section, std::string text) {
    const auto found = locate(sections, section);
    if (found == sections.end())
        sections.emplace_back(section, std::move(text));
    else
        found->second = std::move(text);
}

void CorpusCase::drop(std::string_view section) {
    if (const auto found = locate(sections, section); found != sections.end()) sections.erase(found);
}

std::u16string CorpusCase::text() const {
    if (const std::string* sql = find("sql")) return fromUtf8(*sql);
    std::string_view json = *find("json");
    return readJsonString(json);
}

CorpusFile CorpusFile::read(const std::filesystem::path& path) {
    std::ifstream in(path, std::ios::binary);
    if (!in) throw std::runtime_error(path.string() + ": can't be read");
    CorpusFile file{path, "", {}};
    std::string line;
    while (std::getline(in, line)) {
        if (line.starts_with(kTitle)) {
            file.cases.push_back({line.substr(kTitle.size()), {}});
        } else if (file.cases.empty()) {
            file.preamble += line + '\n';
        } else if (auto& sections = file.cases.back().sections; line.starts_with(kSection)) {
            sections.emplace_back(line.substr(kSection.size()), "");
        } else if (!sections.empty()) {
            sections.back().second += line + '\n';
        } else if (!line.empty()) {
            throw std::runtime_error(path.string() + ": " + file.cases.back().title +
                                     ": text before a section");
        }
    }
    std::set<std::string> titles;
    for (CorpusCase& one : file.cases) {
        for (auto& section : one.sections) trimLineEnds(section.second);
        try {
            check(one, titles);
        } catch (const std::runtime_error& error) {
            throw std::runtime_error(path.string() + ": " + one.title + ": " + error.what());
        }
    }
    return file;
}

void CorpusFile::write() const {
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    out << preamble;
    for (const CorpusCase& one : cases) {
        if (&one != &cases.front()) out << '\n';
        out << kTitle << one.title << '\n';
        for (const auto& [name, text] : one.sections) {
            out << kSection << name << '\n';
            if (!text.empty()) out << text << '\n';
        }
    }
    if (!out.flush()) throw std::runtime_error(path.string() + ": can't be written");
}

std::vector<CorpusFile> readCorpus(const std::filesystem::path& folder) {
    std::vector<std::filesystem::path> paths;
    for (const auto& entry : std::filesystem::directory_iterator(folder))
        if (entry.path().extension() == ".txt") paths.push_back(entry.path());
    std::sort(paths.begin(), paths.end());
    std::vector<CorpusFile> files;
    files.reserve(paths.size());
    for (const auto& path : paths) files.push_back(CorpusFile::read(path));
    return files;
}

}  // namespace zr::test
