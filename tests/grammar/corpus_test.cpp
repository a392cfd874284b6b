// Runs every case of the corpus files as a test of its own, `<dialect>_<file>.<title>`. With ZR_BLESS=1 in
// the environment the expectations of the cases that ran are written anew instead; read them before
// committing.

#include <gtest/gtest.h>

#include <cctype>
#include <cstdio>
#include <cstdlib>
#include <set>

#include "tests/grammar/corpus_file.h"
#include "tests/grammar/json_string.h"
#include "tests/grammar/reading.h"

namespace zr::test {
namespace {

std::string tokenLines(const Grammar& grammar, const std::vector<TokenText>& tokens) {
    std::string out;
    for (const TokenText& token : tokens) {
        if (!out.empty()) out += '\n';
        out += std::to_string(token.type) + ' ' + grammar.tokenName(token.type) + ' ' + quoteJson(token.text);
    }
    return out;
}

/// Texts of the tokens from `first` on, a blank between each two.
std::string restOf(const std::vector<TokenText>& tokens, std::size_t first) {
    std::string out;
    for (std::size_t i = first; i < tokens.size(); ++i) {
        if (i > first) out += ' ';
        for (const char16_t unit : tokens[i].text) {
            const std::string quoted = quoteJson({&unit, 1});
            const bool plain = unit >= 0x20 && unit < 0x80;
            out += plain ? std::string(1, static_cast<char>(unit)) : quoted.substr(1, quoted.size() - 2);
        }
    }
    return out;
}

class CorpusTest : public testing::Test {
 public:
    CorpusTest(const Grammar& grammar, CorpusFile& file, CorpusCase& one, bool bless)
        : grammar_(grammar), file_(file), case_(one), bless_(bless) {}

    void TestBody() override {
        SCOPED_TRACE(file_.path.string() + ": " + case_.title);
        if (case_.find("tokens") != nullptr) checkTokens();
        if (case_.find("tree") != nullptr) checkTree();
    }

 private:
    void checkTokens() {
        const std::string found = tokenLines(grammar_, grammar_.lex(case_.text()));
        if (bless_)
            case_.set("tokens", found);
        else
            EXPECT_EQ(found, *case_.find("tokens"));
    }

    void checkTree() {
        const Reading reading = grammar_.read(case_.text());
        EXPECT_TRUE(reading.wellFormed);
        // Behind an error node there is no end of a statement's reading to speak of.
        const std::string rest = reading.hasErrorNode ? "" : restOf(reading.tokens, reading.taken);
        if (bless_) {
            case_.set("tree", reading.tree.pretty());
            case_.drop("rest");
            if (!rest.empty()) case_.set("rest", rest);
            return;
        }
        const std::string& told = *case_.find("tree");
        EXPECT_EQ(reading.tree.pretty(), told.empty() ? told : SyntaxDump::parse(told).pretty());
        const std::string* toldRest = case_.find("rest");
        EXPECT_EQ(rest, toldRest == nullptr ? "" : *toldRest);
    }

    const Grammar& grammar_;
    CorpusFile& file_;
    CorpusCase& case_;
    const bool bless_;
};

std::string testName(const std::string& title) {
    std::string name;
    for (const char c : title) {
        const bool plain = std::isalnum(static_cast<unsigned char>(c)) != 0;
        if (plain)
            name += c;
        else if (!name.empty() && name.back() != '_')
            name += '_';
    }
    return name;
}

void registerCases(const Grammar& grammar, std::vector<CorpusFile>& files, bool bless) {
    for (CorpusFile& file : files) {
        const std::string suite = std::string(grammar.corpus) + '_' + file.path.stem().string();
        std::set<std::string> names;
        for (CorpusCase& one : file.cases) {
            std::string name = testName(one.title);
            while (!names.insert(name).second) name += '_';  // titles that differ in signs alone
            testing::RegisterTest(suite.c_str(), name.c_str(), nullptr, nullptr, file.path.c_str(), 1,
                                  [&grammar, &file, &one, bless]() -> testing::Test* {
                                      return new CorpusTest(grammar, file, one, bless);
                                  });
        }
    }
}

}  // namespace
}  // namespace zr::test

int main(int argc, char** argv) {
    testing::InitGoogleTest(&argc, argv);
    const bool bless = std::getenv("ZR_BLESS") != nullptr;
    std::vector<std::vector<zr::test::CorpusFile>> corpora;
    corpora.reserve(zr::test::kGrammarCount);
    try {
        for (std::size_t i = 0; i < zr::test::kGrammarCount; ++i) {
            const zr::test::Grammar& grammar = zr::test::kGrammars[i];
            corpora.push_back(zr::test::readCorpus(std::filesystem::path(ZR_CORPUS_DIR) / grammar.corpus));
            zr::test::registerCases(grammar, corpora.back(), bless);
        }
        int status = RUN_ALL_TESTS();
        // A filter that finds nothing must not pass for a success.
        if (testing::UnitTest::GetInstance()->test_to_run_count() == 0) status = 2;
        if (bless)
            for (const auto& files : corpora)
                for (const auto& file : files) file.write();
        return status;
    } catch (const std::exception& error) {
        std::fprintf(stderr, "%s\n", error.what());
        return 2;
    }
}
