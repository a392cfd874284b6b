// docs/dialects.md: what is made from the grammars or measured with the program. ZR_BLESS=1 writes it anew.

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>

#include "grammars.h"
#include "program.h"

namespace zr::test {
namespace {

const std::string kDocument = ZR_SOURCE_DIR "/docs/dialects.md";

// Compares the part of the document behind a mark with what it should be.
void checkPart(const std::string& mark, const std::string& expected) {
    const std::string document = readFile(kDocument);
    const std::string opening = "<!-- " + mark + " -->\n";
    const std::size_t place = document.find(opening);
    ASSERT_NE(place, std::string::npos) << mark;
    const std::size_t from = place + opening.size();
    const std::size_t end = document.find("<!-- end -->", from);
    ASSERT_NE(end, std::string::npos) << mark;
    if (std::getenv("ZR_BLESS")) {
        std::string fresh = document;
        fresh.replace(from, end - from, expected);
        std::ofstream(kDocument, std::ios::binary) << fresh;
        return;
    }
    EXPECT_EQ(document.substr(from, end - from), expected) << mark;
}

TEST(DialectsDocument, ListsTheWordsOfTheGrammars) {
    for (const Grammar& grammar : allGrammars())
        checkPart("words of " + grammar.name, made("words", grammar));
}

struct Analysed {
    std::string query;  // the descriptor and the functions found
    bool toItsEnd = false;
};

Analysed analysed(const std::string& dialect, const std::string& text) {
    const std::string output = runZrsql({"analyze", "-d", dialect, "--", text}).output;
    const std::size_t read = output.find("\"read\"");
    EXPECT_NE(read, std::string::npos) << output;
    return {output.substr(0, read), output.find("\"stop\":null", read) != std::string::npos};
}

// The part in braces against the same query without it.
std::string verdict(const std::string& dialect, const std::string& form) {
    const std::size_t open = form.find('{');
    const std::size_t close = form.find('}');
    const std::string before = form.substr(0, open);
    const std::string behind = form.substr(close + 1);
    const Analysed with = analysed(dialect, before + form.substr(open + 1, close - open - 1) + behind);
    const Analysed without = analysed(dialect, before + behind);
    EXPECT_TRUE(without.toItsEnd) << dialect << ": " << before + behind;
    if (!with.toItsEnd) return "stops";
    return with.query == without.query ? "ignored" : "kept";
}

TEST(DialectsDocument, TellsWhatBecomesOfEachForm) {
    const std::vector<std::string> dialects = {"mssql", "mysql", "oracle", "postgresql", "msaccess"};
    std::string table = "| form |";
    for (const std::string& dialect : dialects) table += " " + dialect + " |";
    table += "\n|---|---|---|---|---|---|\n";
    int forms = 0;
    for (const std::string& form : splitLines(readFile(ZR_SOURCE_DIR "/tests/docs/forms.txt"))) {
        ++forms;
        std::string shown = form;
        for (std::size_t at = 0; (at = shown.find('|', at)) != std::string::npos; at += 2)
            shown.insert(at, "\\");
        table += "| `" + shown + "` |";
        for (const std::string& dialect : dialects) table += " " + verdict(dialect, form) + " |";
        table += "\n";
    }
    EXPECT_GT(forms, 0);
    checkPart("forms", table);
}

}  // namespace
}  // namespace zr::test
