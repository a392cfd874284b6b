// The engine against the reference, for every grammar: same reach, same tree, on the corpus, on sentences
// made from the tables and on spoilt ones, and on a file of real queries where there is one.

#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <tuple>
#include <utility>

#include "tests/engine/reference_recogniser.h"
#include "tests/engine/sentence_source.h"
#include "tests/grammar/corpus_file.h"
#include "tests/grammar/json_string.h"
#include "tests/grammar/reading.h"

namespace zr::test {
namespace {

constexpr std::size_t kMaxItems = 4000000;

/// What was compared, so that a test can tell that it compared anything.
struct Counts {
    int compared = 0, whole = 0, recovered = 0, failed = 0, tooMuch = 0;
};

void compare(const Grammar& grammar, const std::u16string& text, Counts& counts,
             std::size_t maxTokens = 100000) {
    const std::vector<TokenText> tokens = grammar.lex(text);
    if (tokens.size() > maxTokens) return;
    ReferenceRecogniser reference(grammar.tables(), tokens, kMaxItems);
    ReferenceRecogniser::Reading expected;
    try {
        expected = reference.read();
    } catch (const TooMuchWork&) {
        ++counts.tooMuch;
        return;
    }
    const Reading found = grammar.read(text);
    ++counts.compared;
    if (!expected.found)
        ++counts.failed;
    else if (expected.recovered)
        ++counts.recovered;
    else if (expected.taken == tokens.size())
        ++counts.whole;
    // The full search alone; a quick one that remembers all, that remembers nothing, that soon gives up.
    for (const auto& [quickSteps, rememberingSteps] : {std::pair{0, 0}, {1, 1000}, {16, 0}, {1, 1}})
        EXPECT_EQ(grammar.readBounded(text, quickSteps, rememberingSteps).flat(), expected.tree.flat())
            << quickSteps << " " << rememberingSteps << " " << quoteJson(text);
    EXPECT_EQ(found.statement.flat(), expected.tree.flat()) << quoteJson(text);
    if (expected.found && !expected.recovered) {
        EXPECT_EQ(found.taken, expected.taken) << quoteJson(text);
    }
}

std::string nameOf(std::size_t grammar) {
    return std::string(kGrammars[grammar].corpus);
}

class EngineEqualsReference : public testing::TestWithParam<std::size_t> {
 protected:
    const Grammar& grammar() const { return kGrammars[GetParam()]; }
};

TEST_P(EngineEqualsReference, OnTheCorpus) {
    Counts counts;
    for (const CorpusFile& file : readCorpus(std::filesystem::path(ZR_CORPUS_DIR) / grammar().corpus))
        for (const CorpusCase& one : file.cases) {
            SCOPED_TRACE(file.path.string() + ": " + one.title);
            compare(grammar(), one.text(), counts);
        }
    EXPECT_GT(counts.compared, 100);
    EXPECT_GT(counts.whole, 50);
    EXPECT_GT(counts.failed, 0);
    if (grammar().tables().parser->recoverRule != engine::kNone16) {
        EXPECT_GT(counts.recovered, 0);
    }
    EXPECT_EQ(counts.tooMuch, 0);
}

TEST_P(EngineEqualsReference, OnRealQueries) {
    const auto path = std::filesystem::path(ZR_REAL_QUERIES) / (nameOf(GetParam()) + ".jsonl");
    std::ifstream in(path);
    if (!in) GTEST_SKIP() << path << " is not here";
    constexpr std::size_t kMaxTokens = 150;
    Counts counts;
    for (std::string line; std::getline(in, line) && !HasFailure();) {
        const std::size_t at = line.find("\"sql\": ");
        ASSERT_NE(at, std::string::npos) << line;
        std::string_view rest = std::string_view(line).substr(at + 7);
        SCOPED_TRACE(line.substr(0, at));
        compare(grammar(), readJsonString(rest), counts, kMaxTokens);
    }
    EXPECT_GT(counts.compared, 300);
    EXPECT_GT(counts.whole, 50);
    RecordProperty("too_much", counts.tooMuch);
}

INSTANTIATE_TEST_SUITE_P(Grammars, EngineEqualsReference, testing::Range(std::size_t{0}, kGrammarCount),
                         [](const auto& grammar) { return nameOf(grammar.param); });

struct SentenceCounts {
    Counts derived, spoilt;
};

/// Compares on sentences that the tables derive, and on each of them once it is spoilt.
void compareSentences(const Grammar& grammar, std::uint32_t seed, int sentences, SentenceCounts& counts) {
    const engine::GrammarTable& tables = grammar.tables();
    SentenceSource source(tables, seed);
    int unspellable = 0;
    for (int i = 0; i < sentences; ++i) {
        std::vector<std::uint16_t> tokens;
        std::u16string text;
        // Some sentences have no text: two quotes with tokens between are one token to a lexer that has
        // strings.
        for (bool isSpelt = false; !isSpelt && unspellable < sentences;) {
            tokens = source.sentence(tables.parser->statementRule, 4 + source.number(36));
            text = source.text(tokens);
            std::vector<std::uint16_t> types;
            for (const TokenText& token : grammar.lex(text))
                types.push_back(static_cast<std::uint16_t>(token.type));
            isSpelt = types == tokens;
            if (!isSpelt) ++unspellable;
        }
        ASSERT_LT(unspellable, sentences) << quoteJson(text);
        compare(grammar, text, counts.derived);
        source.spoil(tokens);
        compare(grammar, source.text(tokens), counts.spoilt);
        if (testing::Test::HasFailure()) return;
    }
}

/// Whether that many sentences were compared, and came out as what they are.
void expectSentences(const SentenceCounts& counts, int sentences) {
    EXPECT_EQ(counts.derived.whole, counts.derived.compared) << "what the tables derive is read to its end";
    EXPECT_GT(counts.derived.compared, sentences / 10 * 9);
    EXPECT_GT(counts.spoilt.compared, sentences / 10 * 9);
    EXPECT_LT(counts.spoilt.whole, counts.spoilt.compared);
}

constexpr int kSentencesOfASeed = 100;

class EngineEqualsReferenceOnSentences
    : public testing::TestWithParam<std::tuple<std::size_t, std::uint32_t>> {};

TEST_P(EngineEqualsReferenceOnSentences, DerivedAndSpoilt) {
    const auto [grammar, seed] = GetParam();
    SentenceCounts counts;
    compareSentences(kGrammars[grammar], seed, kSentencesOfASeed, counts);
    expectSentences(counts, kSentencesOfASeed);
}

INSTANTIATE_TEST_SUITE_P(Seeds, EngineEqualsReferenceOnSentences,
                         testing::Combine(testing::Range(std::size_t{0}, kGrammarCount),
                                          testing::Range(1u, 21u)),
                         [](const auto& where) {
                             return nameOf(std::get<0>(where.param)) + "_seed_" +
                                    std::to_string(std::get<1>(where.param));
                         });

/// As many sentences as ZR_SENTENCES tells, from other seeds than above: hours of work. `./dev nightly` runs
/// it.
TEST_P(EngineEqualsReference, OnANightOfSentences) {
    const char* const wanted = std::getenv("ZR_SENTENCES");
    if (wanted == nullptr) GTEST_SKIP() << "ZR_SENTENCES is not set";
    const int sentences = std::stoi(wanted);
    const char* const first = std::getenv("ZR_FIRST_SEED");
    auto seed = static_cast<std::uint32_t>(first ? std::stoul(first) : 1000);
    SentenceCounts counts;
    int done = 0;
    for (; done < sentences && !HasFailure(); done += kSentencesOfASeed, ++seed) {
        SCOPED_TRACE("seed " + std::to_string(seed));
        compareSentences(grammar(), seed, kSentencesOfASeed, counts);
        if ((done + kSentencesOfASeed) % 1000 == 0)
            std::fprintf(stderr, "%s: %d sentences compared, %d and %d of them too much for the reference\n",
                         nameOf(GetParam()).c_str(), done + kSentencesOfASeed, counts.derived.tooMuch,
                         counts.spoilt.tooMuch);
    }
    expectSentences(counts, done);
}

/// One text of one dialect that once came out differently.
void expectEqual(std::string_view corpus, const std::u16string& text, int Counts::*outcome) {
    for (std::size_t i = 0; i < kGrammarCount; ++i) {
        if (kGrammars[i].corpus != corpus) continue;
        Counts counts;
        compare(kGrammars[i], text, counts);
        EXPECT_EQ(counts.*outcome, 1);
        return;
    }
    ADD_FAILURE() << "no grammar " << corpus;
}

TEST(EngineEqualsReferenceOnce, WhereTheSelectListIsMissingBehindTwoClosingParentheses) {
    expectEqual("mssql", u"SELECT TOP (1)) a (", &Counts::recovered);
}

TEST(EngineEqualsReferenceOnce, WhereAnOuterCallTakesTheParenthesisThatAnInnerOneLeaves) {
    expectEqual("mssql", u"SELECT MAX f.g(( & 0", &Counts::whole);
}

}  // namespace
}  // namespace zr::test
