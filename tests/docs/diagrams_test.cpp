// The pictures of the rules.

#include <gtest/gtest.h>

#include <algorithm>
#include <set>

#include "grammars.h"
#include "program.h"

namespace zr::test {
namespace {

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

        const std::vector<std::string> ids = allBetween(svg, "<g id=\"", "\"");
        const std::set<std::string> names(ids.begin(), ids.end());
        EXPECT_EQ(names.size(), ids.size());
        // The header for hosts has one entry a rule.
        const std::string header = readFile(ZR_HEADERS "/" + grammar.name + ".h");
        EXPECT_EQ(ids.size(), allBetween(header, "ZRRuleReturn (*", ")").size());
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

}  // namespace
}  // namespace zr::test
