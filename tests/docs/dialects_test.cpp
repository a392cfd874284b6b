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

Analysed analysed(const std::string& line) {
    const std::size_t from = line.find("\"query\"");
    const std::size_t read = line.find("\"read\"");
    EXPECT_TRUE(from < read && read != std::string::npos) << line;
    return {line.substr(from, read - from), line.find("\"stop\":null", read) != std::string::npos};
}

// What becomes of the part in braces of each form: the query against the same one without it.
std::vector<std::string> verdicts(const std::string& dialect, const std::vector<std::string>& forms) {
    std::string input;
    for (const std::string& form : forms) {
        EXPECT_EQ(form.find_first_of("\"\\"), std::string::npos) << "to be escaped: " << form;
        const std::size_t open = form.find('{');
        const std::size_t close = form.find('}');
        const std::string before = form.substr(0, open);
        const std::string behind = form.substr(close + 1);
        for (const std::string& text :
             {before + form.substr(open + 1, close - open - 1) + behind, before + behind})
            input += "{\"id\": 0, \"sql\": \"" + text + "\"}\n";
    }
    const auto lines = splitLines(runZrsql({"analyze", "-d", dialect, "--jsonl", "-"}, input).output);
    std::vector<std::string> found;
    EXPECT_EQ(lines.size(), 2 * forms.size());
    for (std::size_t i = 0; i + 1 < lines.size(); i += 2) {
        const Analysed with = analysed(lines[i]);
        const Analysed without = analysed(lines[i + 1]);
        EXPECT_TRUE(without.toItsEnd) << dialect << ": " << forms[i / 2] << " without its part";
        found.emplace_back(!with.toItsEnd ? "stops" : with.query == without.query ? "ignored" : "kept");
    }
    return found;
}

TEST(DialectsDocument, TellsWhatBecomesOfEachForm) {
    const std::vector<std::string> dialects = {"mssql", "mysql", "oracle", "postgresql", "msaccess"};
    std::string table = "| form |";
    for (const std::string& dialect : dialects) table += " " + dialect + " |";
    table += "\n|---|---|---|---|---|---|\n";
    const std::vector<std::string> forms = splitLines(readFile(ZR_SOURCE_DIR "/tests/docs/forms.txt"));
    ASSERT_FALSE(forms.empty());
    std::vector<std::vector<std::string>> found;
    for (const std::string& dialect : dialects) found.push_back(verdicts(dialect, forms));
    for (std::size_t i = 0; i < forms.size(); ++i) {
        std::string shown = forms[i];
        for (std::size_t at = 0; (at = shown.find('|', at)) != std::string::npos; at += 2)
            shown.insert(at, "\\");
        table += "| `" + shown + "` |";
        for (const auto& ofDialect : found) table += " " + ofDialect.at(i) + " |";
        table += "\n";
    }
    checkPart("forms", table);
}

}  // namespace
}  // namespace zr::test
