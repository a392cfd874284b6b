// What the quick search reads by itself, and in how many steps.

#include "grammar/engine/quick_search.h"

#include <gtest/gtest.h>

#include <string>
#include <string_view>
#include <tuple>
#include <utility>
#include <vector>

#include "grammar/engine/lexed_text.h"
#include "tests/grammar/reading.h"

namespace zr::test {
namespace {

using engine::SearchOutcome;

/// A text read by the quick search alone.
struct QuickReading {
    SearchOutcome outcome;
    std::uint32_t end, tokens;
    double stepsPerToken;
    engine::Derivation derivation;
};

QuickReading readQuickly(std::string_view corpus, const std::u16string& text,
                         const engine::Options& options = {}) {
    const Grammar* grammar = kGrammars;
    while (grammar->corpus != corpus) ++grammar;
    const engine::GrammarTable& tables = grammar->tables();
    const engine::ParserTable& parser = *tables.parser;
    const engine::LexedText lexed(*tables.lexer, text);
    engine::TextIndex index(parser, lexed.types());
    engine::Derivation derivation;
    engine::QuickSearch::Work work;
    engine::QuickSearch search(parser, index, options, derivation, work);
    const SearchOutcome outcome = search.run(parser.statementRule, 0);
    return {outcome, search.end(), index.fullCount(),
            static_cast<double>(search.steps()) / static_cast<double>(index.fullCount()), derivation};
}

/// No step without remembering.
engine::Options rememberingAtOnce(std::uint32_t steps) {
    engine::Options options;
    options.quickSteps = 1;
    options.rememberingSteps = steps;
    return options;
}

std::u16string repeated(std::u16string_view text, std::size_t times) {
    std::u16string out;
    for (std::size_t i = 0; i < times; ++i) out += text;
    return out;
}

std::u16string accessCondition(std::size_t depth, std::size_t terms) {
    const std::u16string term = u"((t.a)=[x])";
    std::u16string all = term;
    for (std::size_t i = 1; i < terms; ++i) all += u" AND " + term;
    return u"SELECT t.a, t.b FROM t WHERE " + repeated(u"(", depth) + all + repeated(u")", depth);
}

TEST(QuickSearch, ReadsConditionsFullOfParentheses) {
    for (const std::size_t depth : {0, 1, 2})
        for (const std::size_t terms : {1, 2, 3}) {
            const QuickReading reading = readQuickly("msaccess", accessCondition(depth, terms));
            EXPECT_EQ(reading.outcome, SearchOutcome::Found) << depth << " " << terms;
            EXPECT_EQ(reading.end, reading.tokens) << depth << " " << terms;
            EXPECT_LT(reading.stepsPerToken, 48) << depth << " " << terms;
        }
}

TEST(QuickSearch, TakesStepsInProportionToTheText) {
    const auto text = [](std::size_t items) {
        return u"SELECT a" + repeated(u", t.b x, ABS(c) y", items) + u" FROM t WHERE a = 1 x";
    };
    EXPECT_EQ(readQuickly("mssql", text(50), rememberingAtOnce(0)).outcome, SearchOutcome::OverBudget)
        << "nothing to remember";
    const QuickReading few = readQuickly("mssql", text(50), rememberingAtOnce(1000));
    const QuickReading many = readQuickly("mssql", text(5000), rememberingAtOnce(1000));
    EXPECT_EQ(few.outcome, SearchOutcome::Found);
    EXPECT_EQ(many.outcome, SearchOutcome::Found);
    EXPECT_LT(many.stepsPerToken, few.stepsPerToken * 1.1);
}

TEST(QuickSearch, WithoutMemoryGivesUpConditionsFullOfParentheses) {
    engine::Options options;
    options.rememberingSteps = 0;
    EXPECT_EQ(readQuickly("msaccess", accessCondition(3, 3), options).outcome, SearchOutcome::OverBudget);
}

TEST(QuickSearch, FindsTheFurthestEndOfTextThatCantBeReadWhole) {
    const std::u16string readable = accessCondition(1, 3);
    const std::uint32_t end = readQuickly("msaccess", readable).tokens;
    for (const std::u16string_view tail : {u" ; SELECT", u" OVER ( x )"}) {
        const QuickReading reading = readQuickly("msaccess", readable + std::u16string(tail));
        EXPECT_EQ(reading.outcome, SearchOutcome::Found);
        EXPECT_EQ(reading.end, end);
        EXPECT_GT(reading.tokens, end);
    }
}

TEST(QuickSearch, LooksForNothingBehindTextThatCantGoOn) {
    const std::u16string plain = u"SELECT a, b AS c, t.total FROM t WHERE a = 1 AND t.name = 2 AND c > t.id";
    for (const char* grammar : {"mssql", "mysql", "oracle", "postgresql", "msaccess"})
        for (const std::u16string_view tail : {u" WHERE", u" ORDER x"}) {
            const QuickReading whole = readQuickly(grammar, plain);
            const QuickReading reading = readQuickly(grammar, plain + std::u16string(tail));
            EXPECT_EQ(reading.end, whole.tokens) << grammar;
            EXPECT_LT(reading.end, reading.tokens) << grammar;
            EXPECT_LT(reading.stepsPerToken, whole.stepsPerToken * 1.5) << grammar;
        }
}

TEST(QuickSearch, TellsThatNothingCanBeRead) {
    EXPECT_EQ(readQuickly("mysql", u"SELECT FROM").outcome, SearchOutcome::NotFound);
    EXPECT_EQ(readQuickly("mysql", u"SELECT FROM", rememberingAtOnce(1000)).outcome, SearchOutcome::NotFound);
}

TEST(QuickSearch, GivesUpWhereCallsHaveManyEndsEach) {
    for (const std::size_t depth : {24, 300}) {
        const std::u16string text =
            u"SELECT " + repeated(u"ABS(", depth) + u"a" + repeated(u")", depth) + u" FROM t";
        const QuickReading reading = readQuickly("mssql", text, rememberingAtOnce(1000000));
        EXPECT_EQ(reading.outcome, SearchOutcome::OverBudget) << depth;
        EXPECT_LT(reading.stepsPerToken, 100) << "not for want of steps";
    }
}

TEST(QuickSearch, GivesUpWhereItMayRememberNothing) {
    engine::Options options = rememberingAtOnce(1000);
    options.maxMemo = 1;
    EXPECT_EQ(readQuickly("msaccess", accessCondition(2, 3), options).outcome, SearchOutcome::OverBudget);
}

void expectSame(const engine::Derivation& one, const engine::Derivation& other, const std::string& about) {
    EXPECT_EQ(one.choices, other.choices) << about;
    ASSERT_EQ(one.parts.size(), other.parts.size()) << about;
    for (std::size_t i = 0; i < one.parts.size(); ++i) {
        const engine::Derivation::Part &a = one.parts[i], &b = other.parts[i];
        EXPECT_EQ(std::tie(a.outer, a.position, a.low, a.high, a.choices, a.parts, a.node),
                  std::tie(b.outer, b.position, b.low, b.high, b.choices, b.parts, b.node))
            << about << ", part " << i;
    }
}

TEST(QuickSearch, ComesToTheSameWhereverTheOneThatRemembersTakesOver) {
    const std::vector<std::pair<const char*, std::u16string>> texts{
        {"msaccess", accessCondition(2, 2)},
        {"msaccess", accessCondition(1, 2) + u" OVER ( x )"},
        {"mssql", u"SELECT a, b FROM t WHERE a IN (SELECT MAX(b) FROM u GROUP BY c x) AND b = 1"},
        {"mssql", u"SELECT MAX(a), MIN(b) c FROM t x JOIN u y ON x.a = y.b"},
        {"oracle", u"SELECT a, (SELECT b FROM u WHERE c = 1 OR d) FROM t"},
        {"postgresql", u"SELECT (a + b) * c, CASE WHEN x THEN y END FROM t, (SELECT 1) z"}};
    for (const auto& [grammar, text] : texts) {
        engine::Options options;
        options.rememberingSteps = 1U << 20;
        options.quickSteps = 1U << 20;
        const QuickReading plain = readQuickly(grammar, text, options);
        ASSERT_EQ(plain.outcome, SearchOutcome::Found) << grammar;
        for (options.quickSteps = 1; options.quickSteps < 150; ++options.quickSteps) {
            const QuickReading reading = readQuickly(grammar, text, options);
            const std::string about = std::string(grammar) + " behind " + std::to_string(options.quickSteps);
            ASSERT_EQ(reading.outcome, SearchOutcome::Found) << about;
            EXPECT_EQ(reading.end, plain.end) << about;
            expectSame(reading.derivation, plain.derivation, about);
        }
    }
}

TEST(QuickSearch, NestsAsDeepWhenItRemembersAsWhenItDoesNot) {
    const std::u16string text = accessCondition(2, 1);
    engine::Options plain, remembering = rememberingAtOnce(1000);
    plain.quickSteps = 1U << 20;
    bool found = false;
    for (std::uint32_t depth = 1; depth < 60; ++depth) {
        plain.maxDepth = remembering.maxDepth = depth;
        const SearchOutcome outcome = readQuickly("msaccess", text, remembering).outcome;
        // It may not know how deep it was in a call that it remembers.
        if (outcome != SearchOutcome::OverBudget) {
            EXPECT_EQ(outcome, readQuickly("msaccess", text, plain).outcome) << depth;
        }
        found = found || outcome == SearchOutcome::Found;
    }
    EXPECT_TRUE(found);
}

}  // namespace
}  // namespace zr::test
