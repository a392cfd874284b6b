// The engine against the reference: same reach, same tree, on the corpus, on sentences made from the tables
// and on spoilt ones, and on a folder of real queries where one is given.

#include <gtest/gtest.h>

#include <fstream>

#include "tests/engine/mssql_tables.h"
#include "tests/engine/reference_recogniser.h"
#include "tests/engine/sentence_source.h"
#include "tests/grammar/corpus_file.h"
#include "tests/grammar/json_string.h"
#include "tests/grammar/reading.h"

namespace zr::test {
namespace {

constexpr std::size_t kMaxItems = 4000000;
const Grammar& kMssql = kGrammars[0];

/// What was compared, so that a test can tell that it compared anything.
struct Counts {
    int compared = 0, whole = 0, recovered = 0, failed = 0, tooMuch = 0;
};

void compare(const std::u16string& text, Counts& counts, std::size_t maxTokens = 100000) {
    const std::vector<TokenText> tokens = kMssql.lex(text);
    if (tokens.size() > maxTokens) return;
    ReferenceRecogniser reference(mssqlTables(), tokens, kMaxItems);
    ReferenceRecogniser::Reading expected;
    try {
        expected = reference.read();
    } catch (const TooMuchWork&) {
        ++counts.tooMuch;
        return;
    }
    const Reading found = kMssql.read(text);
    ++counts.compared;
    if (!expected.found)
        ++counts.failed;
    else if (expected.recovered)
        ++counts.recovered;
    else if (expected.taken == tokens.size())
        ++counts.whole;
    EXPECT_EQ(found.tree.flat(), expected.tree.flat()) << quoteJson(text);
    if (expected.found && !expected.recovered) {
        EXPECT_EQ(found.taken, expected.taken) << quoteJson(text);
    }
}

TEST(EngineEqualsReference, OnTheCorpus) {
    Counts counts;
    for (const CorpusFile& file : readCorpus(std::filesystem::path(ZR_CORPUS_DIR) / kMssql.corpus))
        for (const CorpusCase& one : file.cases) {
            SCOPED_TRACE(file.path.string() + ": " + one.title);
            compare(one.text(), counts);
        }
    EXPECT_GT(counts.compared, 300);
    EXPECT_GT(counts.whole, 100);
    EXPECT_GT(counts.recovered, 0);
    EXPECT_GT(counts.failed, 0);
    EXPECT_EQ(counts.tooMuch, 0);
}

TEST(EngineEqualsReference, WhereTheSelectListIsMissingBehindTwoClosingParentheses) {
    Counts counts;
    compare(u"SELECT TOP (1)) a (", counts);
    EXPECT_EQ(counts.recovered, 1);
}

TEST(EngineEqualsReference, WhereAnOuterCallTakesTheParenthesisThatAnInnerOneLeaves) {
    Counts counts;
    compare(u"SELECT MAX f.g(( & 0", counts);
    EXPECT_EQ(counts.whole, 1);
}

class EngineEqualsReferenceOnSentences : public testing::TestWithParam<std::uint32_t> {};

TEST_P(EngineEqualsReferenceOnSentences, DerivedAndSpoilt) {
    const std::uint32_t seed = GetParam();
    SCOPED_TRACE("seed " + std::to_string(seed));
    SentenceSource source(mssqlTables(), seed);
    Counts derived, spoilt;
    for (int i = 0; i < 100; ++i) {
        std::vector<std::uint16_t> tokens =
            source.sentence(mssqlTables().parser->statementRule, 4 + source.number(36));
        const std::u16string text = source.text(tokens);
        std::vector<std::uint16_t> types;
        for (const TokenText& token : kMssql.lex(text))
            types.push_back(static_cast<std::uint16_t>(token.type));
        ASSERT_EQ(types, tokens) << quoteJson(text);
        compare(text, derived);
        source.spoil(tokens);
        compare(source.text(tokens), spoilt);
        if (HasFailure()) return;
    }
    EXPECT_EQ(derived.whole, derived.compared) << "what the tables derive is read to its end";
    EXPECT_GT(derived.compared, 90);
    EXPECT_GT(spoilt.compared, 90);
    EXPECT_LT(spoilt.whole, spoilt.compared);
}

INSTANTIATE_TEST_SUITE_P(Seeds, EngineEqualsReferenceOnSentences, testing::Range(1u, 21u));

TEST(EngineEqualsReferenceCorpus, OnRealQueries) {
    std::ifstream in(ZR_REAL_QUERIES);
    if (!in) GTEST_SKIP() << ZR_REAL_QUERIES << " is not here";
    constexpr std::size_t kMaxTokens = 150;
    Counts counts;
    for (std::string line; std::getline(in, line) && !HasFailure();) {
        const std::size_t at = line.find("\"sql\": ");
        ASSERT_NE(at, std::string::npos) << line;
        std::string_view rest = std::string_view(line).substr(at + 7);
        SCOPED_TRACE(line.substr(0, at));
        compare(readJsonString(rest), counts, kMaxTokens);
    }
    EXPECT_GT(counts.compared, 500);
    EXPECT_GT(counts.whole, 50);
    RecordProperty("too_much", counts.tooMuch);
}

}  // namespace
}  // namespace zr::test
