// Operators, functions and literals as the select state of MS Access reads them.
#include <gtest/gtest.h>
#include <zrparsersql/recognizers/MSAccessSQL_v3_tokens.h>

#include <set>

#include "analysis/msaccess_state.h"
#include "tests/analysis/hand_made_tree.h"
#include "tests/analysis/msaccess_analysed.h"

namespace {

std::string where(std::u16string_view condition) {
    return AccessAnalysed(u"SELECT a FROM t WHERE " + std::u16string(condition)).whereItems();
}
std::string item(std::u16string_view expression) {
    return AccessAnalysed(u"SELECT " + std::u16string(expression) + u" FROM t").selectItems();
}

TEST(AccessState, KnowsItsOperators) {
    const std::set<unsigned int> operators{MSAccessSQL_v3_ALIAS,
                                           MSAccessSQL_v3_AND,
                                           MSAccessSQL_v3_LITERAL_AS,
                                           MSAccessSQL_v3_JOIN_KEYWORD,
                                           MSAccessSQL_v3_ON_KEYWORD,
                                           MSAccessSQL_v3_UNION_KEYWORD,
                                           MSAccessSQL_v3_AND_KEYWORD,
                                           MSAccessSQL_v3_AND_KEYWORD2,
                                           MSAccessSQL_v3_OR_KEYWORD,
                                           MSAccessSQL_v3_OR_KEYWORD2,
                                           MSAccessSQL_v3_LIKE_KEYWORD,
                                           MSAccessSQL_v3_IS_KEYWORD,
                                           MSAccessSQL_v3_BETWEEN_KEYWORD,
                                           MSAccessSQL_v3_IN_KEYWORD,
                                           MSAccessSQL_v3_COMMA,
                                           MSAccessSQL_v3_ASTERISK,
                                           MSAccessSQL_v3_PLUS,
                                           MSAccessSQL_v3_MINUS,
                                           MSAccessSQL_v3_EQ,
                                           MSAccessSQL_v3_L_T,
                                           MSAccessSQL_v3_GT,
                                           MSAccessSQL_v3_NOT_EQ,
                                           MSAccessSQL_v3_LE,
                                           MSAccessSQL_v3_GE,
                                           MSAccessSQL_v3_LOJ,
                                           MSAccessSQL_v3_GOJ,
                                           MSAccessSQL_v3_DIVIDE,
                                           MSAccessSQL_v3_AMPERSAND};
    ASSERT_EQ(operators.size(), 28u);
    HandMadeTree root(MSAccessSQL_v3_SELECT_QUERY, u"");
    const MSAccessSQL_v3StateSelectQuery state(&root);
    for (unsigned int type = 0; type < 1000; ++type) {
        HandMadeTree node(type, u"");
        EXPECT_EQ(state.IsOperator(&node), operators.contains(type)) << type;
    }
}

// ------------------------------------------------------------------------------------------------- operators

TEST(AccessOperators, HoldTheirOperands) {
    EXPECT_EQ(item(u"a + b * c"),
              "(4 name=+ op type=255 (5 field=a) (4 name=* op type=19 (5 field=b) (5 field=c)))");
    EXPECT_EQ(item(u"a & ' ' & b"),
              "(4 name=& op type=9 (4 name=& op type=9 (5 field=a) (2 text= )) (5 field=b))");
}

TEST(AccessOperators, TheRemaindersAreNone) {
    // Only the first operand of each comes through.
    EXPECT_EQ(item(u"a MOD b"), "(5 field=a)");
    EXPECT_EQ(item(u"a ^ b"), "(5 field=a)");
    EXPECT_EQ(item(u"a % b"), "(5 field=a)");
}

TEST(AccessOperators, ASignStandsOverItsOperand) {
    EXPECT_EQ(item(u"- a"), "(4 name=- op type=207 (5 field=a))");
}

TEST(AccessOperators, ParenthesesAreNotKept) {
    EXPECT_EQ(item(u"(a + b) * c"),
              "(4 name=* op type=19 (4 name=+ op type=255 (5 field=a) (5 field=b)) (5 field=c))");
    EXPECT_EQ(item(u"((a))"), "(5 field=a)");
}

TEST(AccessOperators, AClosingParenthesisEndsTheOperands) {
    // A list stands flat among the operands, from its parenthesis to its parenthesis.
    EXPECT_EQ(where(u"a IN (1, 2)"), "(4 name=IN op type=155 (5 field=a) (1 text=1) (1 text=2))");
    EXPECT_EQ(where(u"(a, b) = (1, 2)"), "(4 name== op type=101 (5 field=a) (5 field=b))");
}

TEST(AccessOperators, Between) {
    EXPECT_EQ(where(u"a BETWEEN 1 AND 2"),
              "(4 name=BETWEEN op type=25 (5 field=a) (4 name=AND op type=11 (1 text=1) (1 text=2)))");
}

TEST(AccessOperators, AJoinWithoutAPrefixGetsABlankInItsPlace) {
    TestDatabase database;
    CZRQueryInfo query;
    query.SetDatabase(&database);
    const auto tree = HandMadeTree::read("(168 \"join\" (169 \"JOIN_POSTFIX\"))");
    MSAccessSQL_v3StateSelectQuery state(tree.get());
    state.m_query = &query;
    state.ProcessExpression(tree.get(), &query.m_fromItems, nullptr);
    state.finish();
    EXPECT_EQ(listText(query.m_fromItems), "(4 name=join op type=168 (0 text= ))");
    EXPECT_EQ(state.m_lastOperator, -1);
}

// ------------------------------------------------------------------------------------------------ conditions

TEST(AccessConditions, AComparisonIsNoOperatorOfItsOwn) {
    EXPECT_EQ(where(u"a = 1"), "(4 name== op type=101 (5 field=a) (1 text=1))");
    EXPECT_EQ(where(u"a LIKE 'x*'"), "(4 name=LIKE op type=187 (5 field=a) (2 text=x*))");
    EXPECT_EQ(where(u"a IS NULL"), "(4 name=IS op type=164 (5 field=a) (1 text=NULL))");
}

TEST(AccessConditions, NotIsLost) {
    EXPECT_EQ(where(u"a IS NOT NULL"), "(4 name=IS op type=164 (5 field=a) (1 text=NULL))");
    EXPECT_EQ(where(u"NOT a = 1"), "(4 name== op type=101 (5 field=a) (1 text=1))");
    EXPECT_EQ(where(u"a NOT LIKE 'x'"), "(4 name=LIKE op type=187 (5 field=a) (2 text=x))");
}

TEST(AccessConditions, AComparisonInParenthesesIsNamedAfterThem) {
    EXPECT_EQ(where(u"(a = 1)"), "(4 name=( type=184 (4 name== op type=101 (5 field=a) (1 text=1)))");
}

TEST(AccessConditions, AndAndOr) {
    EXPECT_EQ(
        where(u"a = 1 AND b = 2 OR c = 3"),
        "(4 name=OR op type=246 (4 name=AND op type=11 (4 name== op type=101 (5 field=a) (1 text=1)) (4 "
        "name== op type=101 (5 field=b) (1 text=2))) (4 name== op type=101 (5 field=c) (1 text=3)))");
}

TEST(AccessConditions, AParameterIsItsName) {
    EXPECT_EQ(where(u"a = @p"), "(4 name== op type=101 (5 field=a) (0 text=p))");
}

// ------------------------------------------------------------------------------------------------- functions

TEST(AccessFunctions, TheirArgumentsHangBelowTheParenthesis) {
    EXPECT_EQ(item(u"Left(a, 2)"), "(4 name=Left type=182 (5 field=a) (1 text=2))");
    EXPECT_EQ(item(u"LEFT$(a, 2)"), "(4 name=LEFT$ type=183 (5 field=a) (1 text=2))");
    EXPECT_EQ(item(u"Count(*)"), "(4 name=Count type=64 (5 field=*))");
}

TEST(AccessFunctions, WithoutArguments) {
    EXPECT_EQ(item(u"Now()"), "(4 name=Now type=229)");
    EXPECT_EQ(item(u"MyFunc()"), "(7 name=MyFunc type=145)");
}

TEST(AccessFunctions, TheEscapeLeavesNoTrace) {
    EXPECT_EQ(item(u"{fn NOW()"), "(4 name=NOW type=229)");
}

TEST(AccessFunctions, IifKeepsItsCommas) {
    EXPECT_EQ(
        item(u"IIf(a = 1, 2, 3)"),
        "(4 name=IIf type=147 (4 name== op type=101 (5 field=a) (1 text=1)) (4 name=, op type=56) (1 text=2) "
        "(4 name=, op type=56) (1 text=3))");
}

TEST(AccessFunctions, OfIifWithAParenthesisInFrontThatAloneIsTaken) {
    EXPECT_EQ(item(u"IIf((a), 2, 3)"), "(4 name=IIf type=147 (5 field=a))");
}

TEST(AccessFunctions, CastKeepsNoType) {
    EXPECT_EQ(item(u"CAST(a AS INT)"), "(4 name=CAST type=33 (5 field=a))");
}

TEST(AccessFunctions, ConvertHasATypeAndAStyle) {
    EXPECT_EQ(item(u"CONVERT(INT, a, 101)"),
              "(4 name=CONVERT type=375 (1 text=INT) (5 field=a) (0 text=101))");
    // The length's node gives its name, not its digits.
    EXPECT_EQ(item(u"CONVERT(VARCHAR(10), a)"),
              "(4 name=CONVERT type=375 (1 text=VARCHARNUMBER_LITERAL) (5 field=a))");
}

TEST(AccessFunctions, AUserFunctionIsNotedWithTheNumberOfItsArguments) {
    const AccessAnalysed a(u"SELECT MyFunc(1, b, 'c'), Other(), 2nd(a) FROM t");
    EXPECT_EQ(a.selectItems(),
              "(7 name=MyFunc type=145 (1 text=1) (5 field=b) (2 text=c)) (7 name=Other type=145) (7 name=2 "
              "type=93)");
    EXPECT_EQ(keysOf(a.database.UserFunctions), "2|MyFunc|Other");
    EXPECT_EQ(a.database.UserFunctions.Find(u"MyFunc")->toUtf8(), "3");
    EXPECT_EQ(a.database.UserFunctions.Find(u"Other")->toUtf8(), "0");
}

TEST(AccessFunctions, ABuiltInOneIsNotNoted) {
    EXPECT_TRUE(AccessAnalysed(u"SELECT Trim(a) FROM t").database.UserFunctions.IsEmpty());
}

TEST(AccessFunctions, AUserFunctionNamedFnIsOneAsAnyOther) {
    EXPECT_EQ(item(u"FN(a)"), "(7 name=FN type=145 (5 field=a))");
}

// -------------------------------------------------------------------------------------------------- literals

TEST(AccessLiterals, ANumberIsItsFirstTwoParts) {
    EXPECT_EQ(item(u"12"), "(1 text=12)");
    EXPECT_EQ(item(u".5"), "(1 text=.5)");
    EXPECT_EQ(item(u"1.5"), "(1 text=1.)") << "and no more";
    EXPECT_EQ(item(u"1E+5"), "(1 text=1E)");
    EXPECT_EQ(item(u"True"), "(1 text=True)");
}

TEST(AccessLiterals, Strings) {
    EXPECT_EQ(item(u"'a b'"), "(2 text=a b)");
    EXPECT_EQ(item(u"\"a b\""), "(2 text=a b)");
    EXPECT_EQ(item(u"''"), "(2)");
}

TEST(AccessLiterals, DatesLoseTheirBlanks) {
    EXPECT_EQ(item(u"#1/2/2003#"), "(3 text=#1/2/2003#)");
    EXPECT_EQ(item(u"#1/2/2003 10:20#"), "(3 text=#1/2/200310:20#)");
    EXPECT_EQ(item(u"#Jan 2, 2003#"), "(3 text=#Jan2,2003#)");
}

TEST(AccessLiterals, OfNoChildrenABlank) {
    TestDatabase database;
    const auto literal = [&](std::string_view text) {
        CZRQueryInfo query;
        const auto tree = HandMadeTree::read(text);
        MSAccessSQL_v3StateSelectQuery state(tree.get());
        state.m_query = &query;
        state.ProcessLiteral(tree.get(), &query.m_selectItems);
        state.finish();
        return listText(query.m_selectItems);
    };
    EXPECT_EQ(literal("(306 \"SQL_STRING\")"), "(2 text= )");
    EXPECT_EQ(literal("(75 \"DATE\")"), "(3 text= )");
    EXPECT_EQ(literal("(305 \"SQL_LITERAL\" (233 \"NULL\"))"), "(0 text=NULL)");
    EXPECT_EQ(literal("(145 \"`x`\")"), "(0 text=x)");
}

}  // namespace
