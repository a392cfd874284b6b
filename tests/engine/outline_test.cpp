// What the outlines of the grammars tell of texts.

#include "grammar/engine/outline.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "grammar/engine/recogniser.h"
#include "tests/engine/sentence_source.h"
#include "tests/grammar/json_string.h"
#include "tests/grammar/reading.h"

namespace zr::test {
namespace {

constexpr int kSentences = 2'000;

class GrammarOutline : public testing::TestWithParam<std::size_t> {
 protected:
    const engine::GrammarTable& tables() const { return kGrammars[GetParam()].tables(); }
    const engine::ParserTable& parser() const { return *tables().parser; }

    std::uint32_t endOf(const std::vector<std::uint16_t>& tokens) const {
        return engine::furthestEndByOutline(parser(), engine::TextIndex(parser(), tokens));
    }
};

TEST_P(GrammarOutline, IsThere) {
    EXPECT_GT(parser().outlineColumns, 0U);
}

TEST_P(GrammarOutline, TakesAllThatTheStatementReads) {
    SentenceSource source(tables(), 7);
    for (int i = 0; i < kSentences; ++i) {
        const std::vector<std::uint16_t> tokens =
            source.sentence(parser().statementRule, 4 + source.number(60));
        ASSERT_EQ(endOf(tokens), tokens.size()) << quoteJson(source.text(tokens));
    }
}

TEST_P(GrammarOutline, NeverEndsAheadOfAReading) {
    SentenceSource source(tables(), 8);
    const engine::Options options;
    int apart = 0, same = 0;
    for (int i = 0; i < kSentences; ++i) {
        std::vector<std::uint16_t> tokens = source.sentence(parser().statementRule, 4 + source.number(60));
        source.spoil(tokens);
        const std::uint32_t end = endOf(tokens);
        engine::Recogniser recogniser(parser(), tokens, options);
        const engine::Recogniser::Result result = recogniser.run(parser().statementRule, 0);
        if (!result.found) {
            same += end == engine::TextIndex::kNone;
            continue;
        }
        ASSERT_NE(end, engine::TextIndex::kNone) << quoteJson(source.text(tokens));
        ASSERT_GE(end, result.high) << quoteJson(source.text(tokens));
        ++(end == result.high ? same : apart);
    }
    EXPECT_GT(same, kSentences / 4) << "it tells something; more of " << apart;
}

INSTANTIATE_TEST_SUITE_P(Grammars, GrammarOutline, testing::Range(std::size_t{0}, kGrammarCount),
                         [](const auto& grammar) { return std::string(kGrammars[grammar.param].corpus); });

}  // namespace
}  // namespace zr::test
