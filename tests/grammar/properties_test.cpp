// Properties that every text of the corpus has to have, and every text that is made from it by cutting.

#include <gtest/gtest.h>

#include <cstdio>

#include "tests/grammar/corpus_file.h"
#include "tests/grammar/json_string.h"
#include "tests/grammar/reading.h"

namespace zr::test {
namespace {

/// Where a token stands in its text.
struct Span {
    std::size_t from, to;
};

/// Tokens stand in the text in their order, and what lies between them is in none.
std::vector<Span> spansOf(std::u16string_view text, const std::vector<TokenText>& tokens) {
    std::vector<Span> spans;
    std::size_t at = 0;
    for (const TokenText& token : tokens) {
        const std::size_t from = text.find(token.text, at);
        if (from == std::u16string_view::npos) {
            ADD_FAILURE() << "token " << quoteJson(token.text) << " doesn't stand in its text";
            return {};
        }
        at = from + token.text.size();
        spans.push_back({from, at});
    }
    return spans;
}

/// Calls `visit` with every text of the dialect's corpus, the title as trace.
template <typename Visit>
void forEachText(const Grammar& grammar, Visit visit) {
    for (const CorpusFile& file : readCorpus(std::filesystem::path(ZR_CORPUS_DIR) / grammar.corpus))
        for (const CorpusCase& one : file.cases) {
            SCOPED_TRACE(file.path.string() + ": " + one.title);
            visit(one.text());
            if (testing::Test::HasFatalFailure()) return;
        }
}

/// A tree is one statement or one error node, and hangs together.
void expectSoundReading(const Grammar& grammar, const std::u16string& text) {
    const Reading reading = grammar.read(text);
    EXPECT_TRUE(reading.wellFormed) << quoteJson(text);
    EXPECT_FALSE(reading.tree.empty()) << quoteJson(text);
    EXPECT_LE(reading.taken, reading.tokens.size()) << quoteJson(text);
    if (reading.tree.flat().starts_with("(0 ")) {
        EXPECT_EQ(reading.tree.flat(), "(0 \"Tree Error Node\")") << quoteJson(text);
    }
}

class GrammarProperties : public testing::TestWithParam<std::size_t> {
 protected:
    const Grammar& grammar() const { return kGrammars[GetParam()]; }
};

TEST_P(GrammarProperties, ReadingTwiceGivesTheSameAsReadingFresh) {
    forEachText(grammar(), [this](const std::u16string& text) {
        const Reading first = grammar().read(text);
        const Reading fresh = grammar().read(text);
        const Reading again = grammar().readAgain(text);
        EXPECT_EQ(fresh.tree.flat(), first.tree.flat());
        EXPECT_EQ(again.tree.flat(), first.tree.flat());
        EXPECT_EQ(again.tokens, first.tokens);
        EXPECT_EQ(again.taken, first.taken);
    });
}

TEST_P(GrammarProperties, EveryPrefixIsReadToASoundTree) {
    forEachText(grammar(), [this](const std::u16string& text) {
        for (const Span& span : spansOf(text, grammar().lex(text)))
            expectSoundReading(grammar(), text.substr(0, span.to));
    });
}

TEST_P(GrammarProperties, EveryTextWithoutOneTokenIsReadToASoundTree) {
    forEachText(grammar(), [this](const std::u16string& text) {
        for (const Span& span : spansOf(text, grammar().lex(text)))
            expectSoundReading(grammar(), text.substr(0, span.from) + u' ' + text.substr(span.to));
    });
}

TEST_P(GrammarProperties, EverySuffixIsReadToASoundTree) {
    forEachText(grammar(), [this](const std::u16string& text) {
        for (const Span& span : spansOf(text, grammar().lex(text)))
            expectSoundReading(grammar(), text.substr(span.from));
    });
}

TEST_P(GrammarProperties, WhatWasReadReadsTheSameByItself) {
    forEachText(grammar(), [this](const std::u16string& text) {
        const Reading whole = grammar().read(text);
        const std::vector<Span> spans = spansOf(text, whole.tokens);
        if (whole.hasErrorNode || whole.taken == 0 || whole.taken > spans.size()) return;
        const Reading part = grammar().read(text.substr(0, spans[whole.taken - 1].to));
        EXPECT_EQ(part.tree.flat(), whole.tree.flat());
        EXPECT_EQ(part.taken, whole.taken);
    });
}

TEST_P(GrammarProperties, BlanksBetweenTokensDontMatter) {
    forEachText(grammar(), [this](const std::u16string& text) {
        const Reading reading = grammar().read(text);
        std::u16string spaced;
        for (const TokenText& token : reading.tokens) spaced += u" \t\r\n" + token.text + u'\n';
        EXPECT_EQ(grammar().read(spaced).tree.flat(), reading.tree.flat());
    });
}

INSTANTIATE_TEST_SUITE_P(Grammars, GrammarProperties, testing::Range(std::size_t{0}, kGrammarCount),
                         [](const auto& grammar) { return std::string(kGrammars[grammar.param].corpus); });

}  // namespace
}  // namespace zr::test
