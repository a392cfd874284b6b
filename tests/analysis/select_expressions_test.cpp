// Expressions, functions and literals, on real SQL Server text.
#include <gtest/gtest.h>

#include "tests/analysis/analysed.h"
#include "tests/analysis/descriptor_text.h"

namespace {

// With a FROM behind the list: without one a closing parenthesis might end the query, and what stands in it
// be read as items.
std::string selectOf(std::u16string_view list) {
    return listText(Analysed(u"SELECT " + std::u16string(list) + u" FROM t").query.m_selectItems);
}
std::string whereOf(std::u16string_view condition) {
    const Analysed a(u"SELECT s FROM t WHERE " + std::u16string(condition));
    return a.query.m_whereItem ? listText(a.query.m_whereItem->m_items) : "no condition";
}

TEST(Operators, HoldTheirOperands) {
    EXPECT_EQ(selectOf(u"a + b * 2"),
              "(4 name=+ op type=252 (5 field=a) (4 name=* op type=251 (5 field=b) (1 text=2)))");
    EXPECT_EQ(
        whereOf(u"a = 1 AND b <> 2 OR c >= 3"),
        "(4 name=OR op type=127 (4 name=AND op type=125 (4 name== op type=254 (5 field=a) (1 text=1)) "
        "(4 name=<> op type=257 (5 field=b) (1 text=2))) (4 name=>= op type=259 (5 field=c) (1 text=3)))");
}

TEST(Operators, ModuloIsNone) {
    EXPECT_EQ(selectOf(u"a % b"), "(5 field=a)");
}

TEST(Operators, WhatStandsBehindAParenthesisTokenIsDropped) {
    // The old outer join leaves its tokens among the operands.
    EXPECT_EQ(whereOf(u"a (+) = b"), "(4 name== op type=254 (5 field=a) (4 name=+ op type=252))");
    EXPECT_EQ(whereOf(u"a = b (+)"), "(4 name== op type=254 (5 field=a) (5 field=b) (4 name=+ op type=252))");
}

TEST(Operators, ConditionsOfEveryForm) {
    EXPECT_EQ(whereOf(u"a BETWEEN 1 AND 2"),
              "(4 name=BETWEEN op type=129 (5 field=a) (1 text=1) (1 text=2))");
    EXPECT_EQ(whereOf(u"a LIKE 'x%'"), "(4 name=LIKE op type=131 (5 field=a) (2 text=x%))");
    EXPECT_EQ(whereOf(u"a IS NULL"), "(4 name=IS op type=132 (5 field=a) (1 text=NULL))");
    EXPECT_EQ(whereOf(u"a IN (1)"), "(4 name=IN op type=134 (5 field=a) (1 text=1))");
}

TEST(Operators, NamesAreAsWritten) {
    EXPECT_EQ(whereOf(u"a Like 'x'"), "(4 name=Like op type=131 (5 field=a) (2 text=x))");
}

TEST(Functions, HaveNameNumberAndParameters) {
    EXPECT_EQ(selectOf(u"LEFT(a, 3)"), "(4 name=LEFT type=95 (5 field=a) (1 text=3))");
    EXPECT_EQ(selectOf(u"count(*)"), "(4 name=count type=180 (4 name=* op type=251))");
    EXPECT_EQ(selectOf(u"GETDATE()"), "(4 name=GETDATE type=159)");
    EXPECT_EQ(selectOf(u"@@VERSION"), "(4 name=@@VERSION type=286)");
}

TEST(Functions, NestInEachOther) {
    EXPECT_EQ(selectOf(u"LEN(LTRIM(a))"), "(4 name=LEN type=219 (4 name=LTRIM type=221 (5 field=a)))");
}

TEST(Functions, WordsOfCaseAreFunctions) {
    EXPECT_EQ(selectOf(u"CASE WHEN a = 1 THEN 'x' ELSE b END"),
              "(4 name=CASE type=139 (4 name=WHEN type=135 (4 name== op type=254 (5 field=a) (1 text=1))) "
              "(4 name=THEN type=136 (2 text=x)) (4 name=ELSE type=137 (5 field=b)))");
}

TEST(Functions, ACastIsAnOperatorOverValueAndType) {
    EXPECT_EQ(selectOf(u"CAST(a AS VARCHAR(10))"),
              "(4 name=CAST type=176 (4 name=AS op type=87 (5 field=a) (9 text=VARCHAR (1 text=10))))");
}

TEST(Functions, AConversionHasTypeValueAndStyle) {
    EXPECT_EQ(selectOf(u"CONVERT(DECIMAL(10, 2), x, 1)"),
              "(4 name=CONVERT type=175 (9 text=DECIMAL (1 text=10) (1 text=2)) (5 field=x) (0 text=1))");
}

TEST(Functions, DatePartsAreValues) {
    EXPECT_EQ(selectOf(u"DATEADD(dd, 1, x)"), "(4 name=DATEADD type=163 (0 text=dd) (1 text=1) (5 field=x))");
}

TEST(Functions, UserFunctionsAreNotedWithTheirCountOfParameters) {
    const Analysed a(u"SELECT dbo.f(1, x), dbo.g() FROM t");
    EXPECT_EQ(listText(a.query.m_selectItems),
              "(7 name=f type=249 (1 text=1) (5 field=x)) (7 name=g type=249)");
    ASSERT_NE(a.database.UserFunctions.Find(u"f"), nullptr);
    EXPECT_EQ(*a.database.UserFunctions.Find(u"f"), u"2");
    EXPECT_EQ(*a.database.UserFunctions.Find(u"g"), u"0");
}

TEST(Functions, OfTwoCallsTheInnerOneIsNotedLast) {
    const Analysed a(u"SELECT dbo.f(dbo.f(1, 2)) FROM t");
    EXPECT_EQ(*a.database.UserFunctions.Find(u"f"), u"2");
}

TEST(Functions, AnEscapeGivesItsFunctionAheadOfItself) {
    EXPECT_EQ(selectOf(u"{fn UCASE(a)}"),
              "(4 name=UCASE type=268 (5 field=a)) (4 name=fn type=302 (4 name=UCASE type=268 (5 field=a)))");
    EXPECT_EQ(selectOf(u"{fn NOW()}"), "(4 name=NOW type=270) (4 name=fn type=302 (4 name=NOW type=270))");
}

TEST(Functions, AUserFunctionOfThatNameIsTakenForAnEscape) {
    // It has no function inside: an item without a name stands ahead, and the parameters are lost.
    EXPECT_EQ(selectOf(u"dbo.FN(a)"), "(4) (7 name=FN type=249)");
}

TEST(Functions, AColumnInTheFunctionsPlaceComesOutByItselfFirst) {
    // The condition of the join is a bare column.
    const Analysed a(u"SELECT s FROM t JOIN u ON (x)");
    EXPECT_EQ(listText(a.query.m_fromItems),
              "(4 name=JOIN op type=94 (0 name=  op (5 table=t)) (5 table=u) "
              "(4 name=ON op type=107 (5 field=x) (4 name=COLUMN_SPECIFICATION type=11 (0 text=x))))");
}

TEST(Functions, EscapesWithinEscapesEndAtALimit) {
    // Each level doubles what is in it: without a limit this would be a million million items.
    std::u16string sql = u"a";
    for (int i = 0; i < 40; ++i) sql = u"{fn UCASE(" + sql + u")}";
    const Analysed a(u"SELECT b, " + sql + u", c FROM t");
    ASSERT_FALSE(a.query.m_selectItems.IsEmpty());
    EXPECT_EQ(itemText(*a.query.m_selectItems.GetHead()), "(5 field=b)");
    EXPECT_TRUE(a.query.m_fromItems.IsEmpty());
}

TEST(Literals, NumbersAreJoined) {
    EXPECT_EQ(selectOf(u"1.5, .5, 1e 5"), "(1 text=1.5) (1 text=.5) (1 text=1e5)");
}

TEST(Literals, ASignIsAnOperator) {
    EXPECT_EQ(selectOf(u"-2"), "(4 name=- op type=253 (1 text=2))");
    EXPECT_EQ(selectOf(u"3 * -2"), "(4 name=* op type=251 (1 text=3) (1 text=-2))");
}

TEST(Literals, NotNullIsWrittenWithABlank) {
    EXPECT_EQ(whereOf(u"a IS NOT NULL"), "(4 name=IS op type=132 (5 field=a) (1 text=NOT NULL))");
    EXPECT_EQ(whereOf(u"a is not null"), "(4 name=is op type=132 (5 field=a) (1 text=NOT NULL))");
}

TEST(Literals, StringsAreWhatTheirQuotesEnclose) {
    EXPECT_EQ(selectOf(u"'a b'"), "(2 text=a b)");
    EXPECT_EQ(selectOf(u"' a;  b '"), "(2 text= a;  b )");
    EXPECT_EQ(selectOf(u"N'x'"), "(2 text=x)");
    EXPECT_EQ(selectOf(u"'\u65e5\u672c'"), "(2 text=\u65e5\u672c)");
}

TEST(Literals, AnEmptyStringIsABlank) {
    EXPECT_EQ(selectOf(u"''"), "(2 text= )");
}

TEST(Literals, DatesKeepTheirQuotesAndLoseTheirBlanks) {
    EXPECT_EQ(selectOf(u"'1/2/2000', 'Jan 1, 2000'"), "(3 text='1/2/2000') (3 text='Jan1,2000')");
}

}  // namespace
