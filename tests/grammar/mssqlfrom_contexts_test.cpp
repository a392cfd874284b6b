// What a host finds that reads a FROM list through the MSSQLfrom contexts, its only road to that grammar.
// What the contexts of all grammars share is tested on those of SQL Server.

#include <gtest/gtest.h>
#include <zrparsersql/input_stream.h>
#include <zrparsersql/recognizers/MSSQLfrom.h>
#include <zrparsersql/recognizers/MSSQLfrom_tokens.h>

#include <cstddef>
#include <cstring>
#include <iterator>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#include "tests/grammar/contexts.h"

namespace {

// Numbers that the hosts' tree walkers know; the corpus pins the rest of those that a token or a tree can
// have.
static_assert(MSSQLfrom_COLUMN_SPECIFICATION_ == 4 && MSSQLfrom_AND == 18);
static_assert(MSSQLfrom_ON_ == 19 && MSSQLfrom_TEST_ == 20 && MSSQLfrom_TEST_2 == 21);
static_assert(MSSQLfrom_JOIN_KEYWORD_ == 22 && MSSQLfrom_MY_QUOTE == 35 && MSSQLfrom_WITH_KEYWORD_ == 36);
static_assert(MSSQLfrom_WS == 38 && MSSQLfrom_INT_ == 54 && MSSQLfrom_FLOAT_ == 55);
static_assert(MSSQLfrom_AMPERSAND_ == 56 && MSSQLfrom_COMMA_ == 57 && MSSQLfrom_EXPONENT_ == 58);

TEST(MssqlfromVocabulary, HasOneNameForEachOfIts63Numbers) {
    std::set<std::string> names;
    for (int number = 4; number <= 66; ++number) names.insert(MSSQLfrom_token_name(number));
    EXPECT_EQ(names.size(), 63U);
    EXPECT_EQ(names.count("<invalid>"), 0U);
    EXPECT_STREQ(MSSQLfrom_token_name(67), "<invalid>");
}

TEST(MssqlfromVocabulary, NamesLiteralsAsTheyAreWritten) {
    EXPECT_STREQ(MSSQLfrom_token_name(59), "'#'");
    EXPECT_STREQ(MSSQLfrom_token_name(61), "'\\r'");
    EXPECT_STREQ(MSSQLfrom_token_name(62), "'\\n'");
    EXPECT_STREQ(MSSQLfrom_token_name(66), "'REMOTE'");
}

// The rules of a grammar stand in its context in their order, which compiled hosts rely on.
// clang-format has no stable form for this.
// clang-format off
#define ZR_RULES(X) \
    X(start_rule) X(node_from_list) X(from_list) X(from_body) X(node_joined_table) X(joined_table) \
    X(node_join_prefix) X(node_test_prefix) X(join_prefix_items) X(join_type) X(join_hint) \
    X(node_join_postfix) X(join_postfix) X(test) X(node_and_condition) X(and_condition) \
    X(node_old_big_postfix) X(old_big_postfix) X(old_big_postfix_source) X(join_source) \
    X(node_nested_join) X(nestedJoin) X(node_table_specification) X(table_specification) \
    X(node_column_specification) X(column_specification) X(node_column_name) X(column_name) \
    X(node_db_name) X(db_name) X(node_table_name) X(table_name) X(delimited_name) X(node_t_n) X(t_n) \
    X(node_new_name) X(new_name) X(node_search_condition) X(search_condition) X(comparison) \
    X(comparison_operand) X(expression) X(term) X(concat_term) X(primary) X(node_number) X(number)
// clang-format on

TEST(MssqlfromContexts, RulesStandInTheirOrder) {
#define ZR_OFFSET(RULE) offsetof(MSSQLfromParser, RULE),
    constexpr std::size_t kOffsets[] = {ZR_RULES(ZR_OFFSET)};
#undef ZR_OFFSET
    EXPECT_EQ(std::size(kOffsets), 47U);
    for (std::size_t i = 0; i < std::size(kOffsets); ++i)
        EXPECT_EQ(kOffsets[i], sizeof(pANTLR3_PARSER) + i * sizeof(void*)) << i;
    EXPECT_EQ(offsetof(MSSQLfromParser, getGrammarFileName), sizeof(pANTLR3_PARSER) + 47 * sizeof(void*));
}

using Contexts = zr::test::ContextsOf<MSSQLfromLexerNew, MSSQLfromParserNew>;

TEST(MssqlfromContexts, TellTheNameOfTheirGrammar) {
    Contexts c(u"");
    EXPECT_NE(std::string(c.parser->getGrammarFileName()).find("MSSQLfrom"), std::string::npos);
    EXPECT_NE(std::string(c.lexer->getGrammarFileName()).find("MSSQLfrom"), std::string::npos);
}

TEST(MssqlfromContexts, BlanksCountAsLexerErrorsAndLineEndsDoNot) {
    Contexts c(u"a\r\nJOIN b\tx");
    const ZRRuleReturn list = c.parser->start_rule(c.parser);
    EXPECT_EQ(list.tree->getType(list.tree), static_cast<ANTLR3_UINT32>(MSSQLfrom_FROM_DEF_));
    EXPECT_EQ(c.lexerErrors(), 2U) << "the blank and the tab";
    EXPECT_EQ(c.parserErrors(), 0U);
}

TEST(MssqlfromContexts, ATableAloneFails) {
    Contexts c(u"a");
    const ZRRuleReturn list = c.parser->start_rule(c.parser);
    EXPECT_EQ(list.tree->getType(list.tree), 0U);
    EXPECT_EQ(list.tree->getChildCount(list.tree), 0U);
    EXPECT_EQ(c.parserErrors(), 1U);
    EXPECT_EQ(c.lexerErrors(), 0U);
}

TEST(MssqlfromContexts, ABareLineFeedBetweenTwoTablesIsASyntaxError) {
    Contexts c(u"a\nJOIN b");
    const ZRRuleReturn list = c.parser->start_rule(c.parser);
    EXPECT_EQ(list.tree->getType(list.tree), 0U);
    EXPECT_EQ(c.parserErrors(), 1U);
    EXPECT_EQ(c.lexerErrors(), 1U) << "the blank; the line feed is a token";
}

TEST(MssqlfromContexts, ATableSpecificationNeedsItsName) {
    for (const std::u16string_view text : {u"", u"JOIN b", u"dbo.", u"ON"}) {
        Contexts c(text);
        const ZRRuleReturn table = c.parser->node_table_specification(c.parser);
        if (text == u"dbo.") {
            EXPECT_EQ(table.tree->getType(table.tree),
                      static_cast<ANTLR3_UINT32>(MSSQLfrom_TABLE_SPECIFICATION_));
            EXPECT_EQ(c.position(), 1) << "the owner is the table, the dot is left";
            continue;
        }
        EXPECT_EQ(table.tree->getType(table.tree), 0U);
        EXPECT_EQ(c.parserErrors(), 1U);
        EXPECT_EQ(c.position(), 0);
    }
}

TEST(MssqlfromContexts, ARuleThatNoOtherCallsReadsWhatTheOneItNamesReads) {
    Contexts named(u"b x c");
    const ZRRuleReturn node = named.parser->node_old_big_postfix(named.parser);
    Contexts plain(u"b x c");
    const ZRRuleReturn same = plain.parser->old_big_postfix(plain.parser);
    EXPECT_EQ(named.position(), 3);
    EXPECT_EQ(plain.position(), 3);
    ASSERT_EQ(node.tree->getChildCount(node.tree), 2U);
    ASSERT_EQ(same.tree->getChildCount(same.tree), 2U);
    for (ANTLR3_UINT32 i = 0; i < 2; ++i) {
        auto* one = static_cast<pANTLR3_BASE_TREE>(node.tree->getChild(node.tree, i));
        auto* other = static_cast<pANTLR3_BASE_TREE>(same.tree->getChild(same.tree, i));
        EXPECT_EQ(one->getType(one), other->getType(other));
    }
}

TEST(MssqlfromContexts, EveryParserEntryCanBeCalledOnAnyText) {
    using Entry = ZRRuleReturn (*)(pMSSQLfromParser);
    constexpr std::size_t kFirst = offsetof(MSSQLfromParser, start_rule);
    constexpr std::size_t kEnd = offsetof(MSSQLfromParser, getGrammarFileName);
    for (const std::u16string_view text : {u"a JOIN b ON x = 1", u"a", u"\r\n", u") x", u""}) {
        for (std::size_t at = kFirst; at < kEnd; at += sizeof(Entry)) {
            Contexts c(text);
            Entry entry = nullptr;
            std::memcpy(&entry, reinterpret_cast<const char*>(c.parser) + at, sizeof entry);
            ASSERT_NE(entry, nullptr) << at;
            EXPECT_NE(entry(c.parser).tree, nullptr) << at;
        }
    }
}

TEST(MssqlfromContexts, EveryLexerEntryCanBeCalledOnAnyText) {
    using Entry = void (*)(pMSSQLfromLexer);
    constexpr std::size_t kFirst = offsetof(MSSQLfromLexer, pLexer) + sizeof(pANTLR3_LEXER);
    constexpr std::size_t kEnd = offsetof(MSSQLfromLexer, getGrammarFileName);
    for (const std::u16string_view text : {u"JOIN", u"1.5e3", u"\r", u" ", u""}) {
        for (std::size_t at = kFirst; at < kEnd; at += sizeof(Entry)) {
            Contexts c(text);
            Entry entry = nullptr;
            std::memcpy(&entry, reinterpret_cast<const char*>(c.lexer) + at, sizeof entry);
            ASSERT_NE(entry, nullptr) << at;
            entry(c.lexer);
        }
    }
}

// ------------------------------------------------------------------------------------------------ long lists

/// Reads the whole text and tells how many tokens the list takes of how many.
void expectWholeRead(const std::u16string& text) {
    Contexts c(text);
    const ZRRuleReturn list = c.parser->node_from_list(c.parser);
    ASSERT_EQ(list.tree->getType(list.tree), static_cast<ANTLR3_UINT32>(MSSQLfrom_FROM_DEF_));
    EXPECT_EQ(c.tokens->tstream->istream->_LA(c.tokens->tstream->istream, 1),
              static_cast<ANTLR3_UINT32>(ANTLR3_TOKEN_EOF));
    EXPECT_EQ(c.parserErrors(), 0U);
}

TEST(MssqlfromLongLists, AThousandJoinsInARow) {
    std::u16string text = u"t0 JOIN t1 ON t0.x = t1.x";
    for (int i = 0; i < 1000; ++i) text += u" LEFT OUTER JOIN\r\ndbo.t AS a ON a.x = b.x AND a.y = b.y";
    expectWholeRead(text);
}

TEST(MssqlfromLongLists, AThousandConditions) {
    std::u16string text = u"a JOIN b ON a.x = b.x";
    for (int i = 0; i < 1000; ++i) text += u" AND a.x + 1 * 2 = b.x || 3";
    expectWholeRead(text);
}

TEST(MssqlfromLongLists, AThousandTablesInFrontOfTheWord) {
    std::u16string text;
    for (int i = 0; i < 1000; ++i) text += u"a x ";
    expectWholeRead(text + u"JOIN b");
}

TEST(MssqlfromLongLists, JoinsInParenthesesBehindTheWord) {
    std::u16string text, end;
    for (int i = 0; i < 40; ++i) {
        text += u"a JOIN (";
        end += u") ON a.x = b.x";
    }
    expectWholeRead(text + u"b JOIN c ON b.x = c.x" + end);
}

TEST(MssqlfromLongLists, JoinsInParenthesesInFrontOfTheWord) {
    std::u16string text, end;
    for (int i = 0; i < 40; ++i) {
        text += u"(";
        end += u") LEFT JOIN d ON c.x = d.x";
    }
    expectWholeRead(text + u"b JOIN c ON b.x = c.x" + end);
}

TEST(MssqlfromLongLists, JoinsInsideEachOtherWithoutParentheses) {
    std::u16string text = u"a", end;
    for (int i = 0; i < 40; ++i) {
        text += u" INNER JOIN b";
        end += u" ON a.x = b.x";
    }
    expectWholeRead(text + end);
}

}  // namespace
