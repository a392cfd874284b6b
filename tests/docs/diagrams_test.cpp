// The pictures of the rules, and the words that docs/dialects.md lists.

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <set>

#include "program.h"

namespace zr::test {
namespace {

struct Grammar {
    std::string name;
    std::string files;  // vocabulary, lexer, rules, as arguments
};

std::vector<Grammar> grammarsIn(const std::string& folder) {
    std::vector<Grammar> found;
    for (const auto& entry : std::filesystem::directory_iterator(folder)) {
        if (entry.path().extension() != ".tokens") continue;
        const std::string name = entry.path().stem();
        const std::string base = folder + "/" + name;
        std::vector<std::string> rules;
        for (const auto& other : std::filesystem::directory_iterator(folder)) {
            const std::string file = other.path().filename();
            if (file.starts_with(name + ".") && file.ends_with(".grammar")) rules.push_back(other.path());
        }
        std::sort(rules.begin(), rules.end());
        std::string files = base + ".tokens " + base + ".lexer";
        for (const std::string& rule : rules) files += " " + rule;
        found.push_back({name, files});
    }
    return found;
}

std::vector<Grammar> allGrammars() {
    std::vector<Grammar> all;
    for (const auto& entry : std::filesystem::directory_iterator(ZR_SOURCE_DIR "/grammar"))
        if (entry.is_directory())
            for (Grammar& grammar : grammarsIn(entry.path())) all.push_back(std::move(grammar));
    return all;
}

std::string made(const std::string& what, const Grammar& grammar) {
    const ProgramResult result = runShell("build/release/bin/zrdiagrams " + what + " " + grammar.files);
    EXPECT_EQ(result.exitStatus, 0) << result.errors;
    return result.output;
}

// What stands between `before` and the next `behind`, at every place.
std::vector<std::string> allBetween(const std::string& text, const std::string& before,
                                    const std::string& behind) {
    std::vector<std::string> found;
    for (std::size_t at = 0; (at = text.find(before, at)) != std::string::npos;) {
        at += before.size();
        found.push_back(text.substr(at, text.find(behind, at) - at));
    }
    return found;
}

// Empty, or what is wrong with the elements of the picture.
std::string complaintAbout(const std::string& svg) {
    std::vector<std::string> open;
    for (const std::string& tag : allBetween(svg, "<", ">")) {
        if (tag.find('<') != std::string::npos) return "a sign of the form in a text: " + tag;
        const std::string name = tag.substr(0, tag.find(' '));
        if (name[0] == '/') {
            if (open.empty() || open.back() != name.substr(1)) return "closed without being open: " + tag;
            open.pop_back();
        } else if (!tag.ends_with('/')) {
            open.push_back(name);
        }
    }
    return open.empty() ? std::string() : "not closed: " + open.back();
}

TEST(Diagrams, OfEachGrammarHaveAllRulesAndNoOpenLink) {
    ASSERT_GE(allGrammars().size(), 5U);
    for (const Grammar& grammar : allGrammars()) {
        SCOPED_TRACE(grammar.name);
        const std::string svg = made("svg", grammar);
        EXPECT_EQ(complaintAbout(svg), "");

        std::string files = grammar.files;
        files.insert(0, "--tokens ").insert(files.find(' ', 10) + 1, "--lexer ");
        const std::string told = runShell("build/release/bin/zrgc --verbose " + files).errors;
        const std::vector<std::string> ids = allBetween(svg, "<g id=\"", "\"");
        const std::set<std::string> names(ids.begin(), ids.end());
        EXPECT_EQ(names.size(), ids.size());
        EXPECT_TRUE(told.starts_with(grammar.name + ": " + std::to_string(ids.size()) + " rules,"))
            << ids.size() << " drawn; " << told;
        for (const std::string& link : allBetween(svg, "href=\"#", "\""))
            EXPECT_TRUE(names.contains(link)) << link;
    }
}

TEST(Diagrams, ShowEachElementWithItsMark) {
    const std::vector<Grammar> toy = grammarsIn(ZR_SOURCE_DIR "/tests/docs/toy");
    ASSERT_EQ(toy.size(), 1U);
    const std::string svg = made("svg", toy.front());
    std::vector<std::string> shown;
    for (const std::string& box : allBetween(svg, "<g class=\"", "</text>")) {
        const std::string kind = box.substr(0, box.find('"'));
        shown.push_back(kind + ": " + box.substr(box.rfind('>') + 1));
    }
    const std::vector<std::string> expected = {"rule: list",
                                               "token dropped: any token",
                                               "token dropped: end of text",
                                               "rule: sum",
                                               "token dropped: ,",
                                               "rule: sum",
                                               "rule: value",
                                               "token root: +",
                                               "rule: value",
                                               "token: NAME",
                                               "token: SUM",
                                               "token dropped: &lt;",
                                               "token: any but &lt;",
                                               "token dropped: &lt;"};
    EXPECT_EQ(shown, expected);
    EXPECT_NE(svg.find("a node LIST"), std::string::npos);
}

TEST(Diagrams, ARefusedGrammarMakesNoPicture) {
    const ProgramResult result = runShell(
        "build/release/bin/zrdiagrams svg tests/docs/toy/Toy.tokens tests/docs/toy/Toy.lexer "
        "tests/docs/toy/Toy.tokens");
    EXPECT_EQ(result.exitStatus, 1);
    EXPECT_EQ(result.output, "");
    EXPECT_NE(result.errors.find("error"), std::string::npos);
}

// docs/dialects.md holds the word list of a grammar behind the line "<!-- words of NAME -->", up to
// "<!-- end -->". ZR_BLESS=1 writes them anew.
TEST(DialectsDocument, ListsTheWordsOfTheGrammars) {
    const std::string file = ZR_SOURCE_DIR "/docs/dialects.md";
    const std::string document = readFile(file);
    std::string fresh = document;
    for (const Grammar& grammar : allGrammars()) {
        const std::string mark = "<!-- words of " + grammar.name + " -->\n";
        const std::size_t place = fresh.find(mark);
        ASSERT_NE(place, std::string::npos) << grammar.name;
        const std::size_t from = place + mark.size();
        const std::size_t end = fresh.find("<!-- end -->", from);
        ASSERT_NE(end, std::string::npos) << grammar.name;
        fresh.replace(from, end - from, made("words", grammar));
    }
    if (std::getenv("ZR_BLESS")) std::ofstream(file, std::ios::binary) << fresh;
    EXPECT_EQ(readFile(file), fresh);
}

}  // namespace
}  // namespace zr::test
