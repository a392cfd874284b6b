// The man page and the completion name what the program has: they are held against its own help texts.

#include <gtest/gtest.h>

#include <iterator>
#include <map>
#include <set>
#include <sstream>
#include <utility>

#include "program.h"

namespace zr::test {
namespace {

using Words = std::set<std::string>;

struct Use {
    Words commands;
    Words options;
    std::vector<Words> groups;  // the names of one option each
};

std::vector<std::string> splitPath(const std::string& path) {
    std::istringstream stream(path);
    return {std::istream_iterator<std::string>(stream), {}};
}

// "  -f,--file FILE Excludes: ..." or "  convert, save     Write ...": the names in front of the first blank
// that follows no comma.
Words namesOf(const std::string& line) {
    Words names;
    std::string name;
    for (std::size_t at = line.find_first_not_of(' '); at < line.size(); ++at) {
        if (line[at] == ',' || line[at] == ' ') {
            if (!name.empty()) names.insert(std::exchange(name, {}));
            if (line[at] == ' ' && line[at - 1] != ',') break;
        } else {
            name += line[at];
        }
    }
    if (!name.empty()) names.insert(name);
    return names;
}

Use useOf(const std::string& path) {
    std::vector<std::string> arguments = splitPath(path);
    arguments.emplace_back("--help");
    const ProgramResult result = runZrsql(arguments);
    EXPECT_EQ(result.exitStatus, 0) << path;
    Use use;
    enum { None, Options, Commands } part = None;
    for (const std::string& line : splitLines(result.output)) {
        const bool isEntry = line.starts_with("  ") && line.size() > 2 && line[2] != ' ';
        if (line == "Options:") {
            part = Options;
        } else if (line == "Subcommands:") {
            part = Commands;
        } else if (isEntry && part == Commands) {
            use.commands.merge(namesOf(line));
        } else if (isEntry && part == Options) {
            use.groups.push_back(namesOf(line));
            use.options.insert(use.groups.back().begin(), use.groups.back().end());
        } else if (!line.starts_with("   ")) {
            part = None;
        }
    }
    return use;
}

// Every command by its path ("", "tokens", "project new", ...).
const std::map<std::string, Use>& allUses() {
    static const std::map<std::string, Use> uses = [] {
        std::map<std::string, Use> all;
        std::vector<std::string> open = {""};
        while (!open.empty()) {
            const std::string path = open.back();
            open.pop_back();
            const Use use = useOf(path);
            for (const std::string& command : use.commands)
                open.push_back(path.empty() ? command : path + " " + command);
            all.emplace(path, use);
        }
        return all;
    }();
    return uses;
}

TEST(Words, AreReadFromTheHelpTexts) {
    EXPECT_TRUE(allUses().at("").commands.contains("tokens"));
    EXPECT_TRUE(allUses().at("project").commands.contains("save")) << "another name of convert";
    EXPECT_EQ(allUses().at("project convert").options, (Words{"-h", "--help", "--form", "--force"}));
    EXPECT_TRUE(allUses().at("analyze").options.contains("-f"));
}

TEST(ManPage, TellsOfEveryCommandAndOption) {
    // By the heading of a sub-section or section: its text, without the signs of the page's form.
    std::map<std::string, std::string> sections;
    std::string heading;
    for (std::string line : splitLines(readFile(ZR_SOURCE_DIR "/docs/man/zrsql.1"))) {
        std::string plain;
        for (std::size_t at = 0; at < line.size(); ++at) {
            if (line.compare(at, 2, "\\f") == 0)
                at += 2;
            else if (line[at] != '\\')
                plain += line[at] == '[' || line[at] == ']' || line[at] == ',' ? ' ' : line[at];
        }
        if (plain.starts_with(".S"))
            heading = plain.substr(4);
        else
            sections[heading] += plain + ' ';
    }
    const auto wordsOf = [&sections](const std::string& name) {
        const std::vector<std::string> words = splitPath(sections[name]);
        return Words(words.begin(), words.end());
    };
    const Words explained = wordsOf("OPTIONS");
    for (const auto& [path, use] : allUses()) {
        ASSERT_TRUE(path.empty() || sections.contains(path)) << path;
        const Words shown = wordsOf(path.empty() ? "SYNOPSIS" : path);
        for (const Words& names : use.groups) {
            int shownNames = 0;
            for (const std::string& name : names) {
                shownNames += shown.contains(name);
                EXPECT_TRUE(shown.contains(name) || explained.contains(name)) << path << " " << name;
            }
            // Every command has a --help; it is not told again.
            EXPECT_TRUE(shownNames > 0 || names.contains("--help")) << path << " " << *names.rbegin();
        }
    }
}

Words completed(const std::string& words) {
    const ProgramResult result = runShell("bash -c '. docs/completion/zrsql; COMP_WORDS=(zrsql " + words +
                                          "); COMP_CWORD=$((${#COMP_WORDS[@]} - 1)); _zrsql; "
                                          "printf \"%s\\n\" \"${COMPREPLY[@]}\"'");
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    Words found;
    for (const std::string& line : splitLines(result.output))
        if (!line.empty()) found.insert(line);
    return found;
}

TEST(Completion, OffersEveryCommandAndNoOther) {
    for (const auto& [path, use] : allUses()) {
        if (use.commands.empty()) continue;
        EXPECT_EQ(completed(path + " \"\""), use.commands) << path;
    }
}

TEST(Completion, OffersEveryOptionAndNoOther) {
    for (const auto& [path, use] : allUses()) EXPECT_EQ(completed(path + " -"), use.options) << path;
}

TEST(Completion, OffersTheValuesOfOptions) {
    EXPECT_EQ(completed("tree --format \"\""), (Words{"sexpr", "json", "dot", "pretty"}));
    EXPECT_EQ(completed("analyze --format p"), Words{"pretty"});
    EXPECT_EQ(completed("project new x.json -d my"), Words{"mysql"});
    EXPECT_TRUE(completed("tokens -d \"\"").contains("mssqlfrom"));
    EXPECT_FALSE(completed("analyze -d \"\"").contains("mssqlfrom"));
    EXPECT_TRUE(completed("analyze -f REA").contains("README.md"));
}

}  // namespace
}  // namespace zr::test
