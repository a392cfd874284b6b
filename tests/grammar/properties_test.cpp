// Properties that every text of the corpus has to have, and every text that is made from it by cutting.

#include <gtest/gtest.h>

#include <cstdio>

#include "tests/grammar/corpus_file.h"
#include "tests/grammar/json_string.h"
#include "tests/grammar/reading.h"

namespace zr::test {
namespace {

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

/// A tree is one statement, a list of one and the tail, or one error node, and hangs together.
void expectSoundReading(const Grammar& grammar, const std::u16string& text) {
    const Reading reading = grammar.read(text);
    EXPECT_TRUE(reading.wellFormed) << quoteJson(text);
    EXPECT_FALSE(reading.tree.empty()) << quoteJson(text);
    EXPECT_LE(reading.taken, reading.tokens.size()) << quoteJson(text);
    const std::string tree = reading.tree.flat();
    if (reading.rootIsList) {
        EXPECT_TRUE(tree.starts_with("(0 \"nil\" (") && tree.ends_with(" (-1 \"<EOF>\"))"))
            << quoteJson(text);
        EXPECT_FALSE(reading.statement.flat().starts_with("(0 ")) << quoteJson(text);
    } else if (tree.starts_with("(0 ")) {
        EXPECT_EQ(tree, "(0 \"Tree Error Node\")") << quoteJson(text);
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
        for (const TokenText& token : grammar().lex(text))
            expectSoundReading(grammar(), text.substr(0, token.to));
    });
}

TEST_P(GrammarProperties, EveryTextWithoutOneTokenIsReadToASoundTree) {
    forEachText(grammar(), [this](const std::u16string& text) {
        for (const TokenText& token : grammar().lex(text))
            expectSoundReading(grammar(), text.substr(0, token.from) + u' ' + text.substr(token.to));
    });
}

TEST_P(GrammarProperties, EverySuffixIsReadToASoundTree) {
    forEachText(grammar(), [this](const std::u16string& text) {
        for (const TokenText& token : grammar().lex(text))
            expectSoundReading(grammar(), text.substr(token.from));
    });
}

TEST_P(GrammarProperties, WhatWasReadReadsTheSameByItself) {
    forEachText(grammar(), [this](const std::u16string& text) {
        const Reading whole = grammar().read(text);
        if (whole.hasErrorNode || whole.taken == 0 || whole.taken > whole.tokens.size()) return;
        const Reading part = grammar().read(text.substr(0, whole.tokens[whole.taken - 1].to));
        EXPECT_EQ(part.statement.flat(), whole.statement.flat());
        EXPECT_EQ(part.taken, whole.taken);
    });
}

TEST_P(GrammarProperties, BlanksBetweenTokensDontMatter) {
    forEachText(grammar(), [this](const std::u16string& text) {
        const Reading reading = grammar().read(text);
        std::u16string blanks;  // line ends are tokens of some grammars
        for (const char16_t unit : {u' ', u'\t', u'\r', u'\n'})
            if (grammar().lex({&unit, 1}).empty()) blanks += unit;
        ASSERT_GE(blanks.size(), 2U);
        std::u16string spaced;
        for (const TokenText& token : reading.tokens)
            spaced += blanks + text.substr(token.from, token.to - token.from) + blanks.back();
        EXPECT_EQ(grammar().read(spaced).tree.flat(), reading.tree.flat());
    });
}

// Each of them was once a reason to go over all of the rest of the text.
TEST_P(GrammarProperties, QuotesThatNothingClosesDontHoldTheLexerUp) {
    constexpr std::size_t kTimes = 200'000;
    for (const std::u16string_view quote : {u"[", u"'[", u"\"[", u"'\"["}) {
        const std::u16string few = std::u16string(quote) + u"a [a [a [a ";
        const std::size_t inFront = grammar().lex(few).size();
        std::u16string many = few;
        for (std::size_t i = 0; i < kTimes; ++i) many += u"[a ";
        const std::size_t each = grammar().lex(few + u"[a ").size() - inFront;
        EXPECT_EQ(grammar().lex(many).size(), inFront + kTimes * each);
    }
}

INSTANTIATE_TEST_SUITE_P(Grammars, GrammarProperties, testing::Range(std::size_t{0}, kGrammarCount),
                         [](const auto& grammar) { return std::string(kGrammars[grammar.param].corpus); });

}  // namespace
}  // namespace zr::test
