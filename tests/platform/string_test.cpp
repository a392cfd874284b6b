#include <gtest/gtest.h>

#include <thread>
#include <unordered_set>
#include <vector>

#include "tests/platform/print_string.h"
#include "zrparsersql/wide_string.h"

namespace {

TEST(String, IsEmptyWhenMadeFromNothing) {
    EXPECT_TRUE(CString().IsEmpty());
    EXPECT_TRUE(CString(u"").IsEmpty());
    EXPECT_TRUE(CString(static_cast<const char16_t*>(nullptr)).IsEmpty());
    EXPECT_TRUE(CString(static_cast<const char*>(nullptr)).IsEmpty());
    EXPECT_EQ(CString().GetLength(), 0);
    EXPECT_EQ(CString().GetString()[0], u'\0');
}

TEST(String, IsMadeFromUnitsLengthsAndNarrowText) {
    EXPECT_EQ(CString(u"abc").View(), u"abc");
    EXPECT_EQ(CString(u"abcdef", 3).View(), u"abc");
    EXPECT_EQ(CString("gr\xC3\xBC\xC3\x9F").View(), u"grüß");
    EXPECT_EQ(CString(std::u16string(u"abc")).View(), u"abc");
}

TEST(String, KeepsZerosAndUnpairedSurrogates) {
    const CString text(u"a\0b\xD800", 4);
    EXPECT_EQ(text.GetLength(), 4);
    EXPECT_EQ(text.GetAt(1), u'\0');
    EXPECT_EQ(text.GetAt(3), 0xD800);
    EXPECT_EQ(text.GetString()[4], u'\0');
}

TEST(String, AnswersZeroOutsideOfTheText) {
    const CString text(u"ab");
    EXPECT_EQ(text[0], u'a');
    EXPECT_EQ(text[2], u'\0');
    EXPECT_EQ(text[-1], u'\0');
}

TEST(String, CopiesShareABufferUntilOneChanges) {
    CString first(u"a text of some length");
    CString second = first;
    EXPECT_EQ(first.GetString(), second.GetString());
    second += u"!";
    EXPECT_EQ(first.View(), u"a text of some length");
    EXPECT_EQ(second.View(), u"a text of some length!");
    CString third = first;
    third.SetAt(0, u'A');
    third.MakeUpper();
    third.MakeReverse();
    EXPECT_EQ(first.View(), u"a text of some length");
}

TEST(String, KeepsItsPointerWhileOnlyCopiesChange) {
    CString text(u"select");
    const char16_t* pointer = text.GetString();
    {
        CString copy = text;
        copy.MakeUpper();
        EXPECT_NE(copy.GetString(), pointer);
    }
    EXPECT_EQ(text.GetString(), pointer);
    EXPECT_EQ(text.View(), u"select");
}

TEST(String, MovesAndAssignsToItself) {
    CString text(u"x");
    CString& same = text;
    text = same;
    EXPECT_EQ(text.View(), u"x");
    CString moved = std::move(text);
    EXPECT_EQ(moved.View(), u"x");
    text = std::move(moved);
    EXPECT_EQ(text.View(), u"x");
    text = text.View().substr(0, 1);
    EXPECT_EQ(text.View(), u"x");
}

TEST(String, AppendsPartsOfItself) {
    CString text(u"ab");
    for (int round = 0; round < 10; ++round) text += text.View();
    EXPECT_EQ(text.GetLength(), 2048);
    EXPECT_EQ(text.Right(4).View(), u"abab");
    text = u"abc";
    text += u'd';
    text += text.View().substr(1, 2);
    EXPECT_EQ(text.View(), u"abcdbc");
    CString whole(u"xy");
    whole += whole;
    EXPECT_EQ(whole.View(), u"xyxy");
}

TEST(String, Concatenates) {
    const CString text(u"b");
    EXPECT_EQ((u"a" + text + u"c" + text).View(), u"abcb");
    EXPECT_TRUE((CString() + CString()).IsEmpty());
    EXPECT_EQ((CString() + text).View(), u"b");
}

TEST(String, FindsFromAStart) {
    const CString text(u"abcabc");
    EXPECT_EQ(text.Find(u"bc"), 1);
    EXPECT_EQ(text.Find(u"bc", 2), 4);
    EXPECT_EQ(text.Find(u'c', 3), 5);
    EXPECT_EQ(text.Find(u"x"), -1);
    EXPECT_EQ(text.Find(u"bc", 5), -1);
    EXPECT_EQ(text.Find(u"a", -1), -1);
    EXPECT_EQ(text.Find(u"a", 7), -1);
    EXPECT_EQ(text.Find(u"", 6), 6);
    EXPECT_EQ(CString().Find(u"a"), -1);
}

TEST(String, GivesPartsAndBringsCountsIntoRange) {
    const CString text(u"abcdef");
    EXPECT_EQ(text.Left(2).View(), u"ab");
    EXPECT_EQ(text.Left(99).View(), u"abcdef");
    EXPECT_TRUE(text.Left(-1).IsEmpty());
    EXPECT_EQ(text.Right(2).View(), u"ef");
    EXPECT_EQ(text.Right(99).View(), u"abcdef");
    EXPECT_TRUE(text.Right(0).IsEmpty());
    EXPECT_EQ(text.Mid(2).View(), u"cdef");
    EXPECT_EQ(text.Mid(2, 2).View(), u"cd");
    EXPECT_EQ(text.Mid(-3, 2).View(), u"ab");
    EXPECT_TRUE(text.Mid(9, 2).IsEmpty());
}

TEST(String, Deletes) {
    CString text(u"abcdef");
    EXPECT_EQ(text.Delete(1, 2), 4);
    EXPECT_EQ(text.View(), u"adef");
    EXPECT_EQ(text.Delete(0), 3);
    EXPECT_EQ(text.View(), u"def");
    EXPECT_EQ(text.Delete(2, 99), 2);
    EXPECT_EQ(text.View(), u"de");
    EXPECT_EQ(text.Delete(5, 1), 2);
    EXPECT_EQ(text.Delete(0, 2), 0);
    EXPECT_TRUE(text.IsEmpty());
    EXPECT_EQ(text.Delete(0, 1), 0);
}

TEST(String, ReplacesWithoutLookingIntoWhatWasPutIn) {
    CString text(u"a\r\nb\r\nc");
    EXPECT_EQ(text.Replace(u"\r\n", u" "), 2);
    EXPECT_EQ(text.View(), u"a b c");
    EXPECT_EQ(text.Replace(u"", u"x"), 0);
    EXPECT_EQ(text.Replace(u"q", u"x"), 0);
    text = u"aaa";
    EXPECT_EQ(text.Replace(u"a", u"aa"), 3);
    EXPECT_EQ(text.View(), u"aaaaaa");
    EXPECT_EQ(text.Replace(u"aa", u""), 3);
    EXPECT_TRUE(text.IsEmpty());
}

TEST(String, TrimsWhiteSpace) {
    EXPECT_EQ(CString(u" \t\r\n x y \v\f").Trim().View(), u"x y");
    EXPECT_EQ(CString(u"\u00A0\u3000x\u2003").Trim().View(), u"x");
    EXPECT_EQ(CString(u"  x  ").TrimLeft().View(), u"x  ");
    EXPECT_EQ(CString(u"  x  ").TrimRight().View(), u"  x");
    EXPECT_TRUE(CString(u" \n ").Trim().IsEmpty());
    EXPECT_TRUE(CString().Trim().IsEmpty());
}

TEST(String, TrimsGivenUnits) {
    EXPECT_EQ(CString(u"[[a b]]").Trim(u"[]").View(), u"a b");
    EXPECT_EQ(CString(u"[x]").TrimLeft(u"[").View(), u"x]");
    EXPECT_EQ(CString(u"`x`").TrimRight(u"`").View(), u"`x");
    EXPECT_EQ(CString(u" x ").Trim(u"").View(), u" x ");
    EXPECT_TRUE(CString(u"]][").Trim(u"[]").IsEmpty());
}

TEST(String, TrimmingLeavesCopiesAlone) {
    CString text(u"  x  ");
    const CString copy = text;
    text.Trim();
    EXPECT_EQ(text.View(), u"x");
    EXPECT_EQ(copy.View(), u"  x  ");
}

TEST(String, MapsCaseWithoutChangingLengths) {
    EXPECT_EQ(CString(u"Grüße ÄÖ Δ Жж").MakeLower().View(), u"grüße äö δ жж");
    EXPECT_EQ(CString(u"Grüße äö δ жж").MakeUpper().View(), u"GRÜßE ÄÖ Δ ЖЖ");
    EXPECT_EQ(CString(u"\U00010400").MakeLower().View(), u"\U00010428");
    EXPECT_EQ(CString(u"A\xD800Z").MakeLower().View(), std::u16string_view(u"a\xD800z"));
    EXPECT_TRUE(CString().MakeUpper().IsEmpty());
}

TEST(String, Reverses) {
    EXPECT_EQ(CString(u"FROM").MakeReverse().View(), u"MORF");
    EXPECT_TRUE(CString().MakeReverse().IsEmpty());
}

TEST(String, ComparesUnits) {
    EXPECT_LT(CString(u"A").Compare(u"a"), 0);
    EXPECT_EQ(CString(u"a").Compare(u"a"), 0);
    EXPECT_GT(CString(u"ab").Compare(u"a"), 0);
    EXPECT_TRUE(CString(u"A") < CString(u"a"));
    EXPECT_TRUE(CString(u"a") == u"a");
    EXPECT_TRUE(CString(u"a") != CString(u"A"));
    EXPECT_TRUE(CString() == u"");
}

TEST(String, ComparesWithoutRegardToCase) {
    EXPECT_EQ(CString(u"Select").CompareNoCase(u"sELECT"), 0);
    EXPECT_EQ(CString(u"GRÜN").CompareNoCase(u"grün"), 0);
    EXPECT_EQ(CString(u"\u212A").CompareNoCase(u"k"), 0);  // the sign of Kelvin
    EXPECT_NE(CString(u"straße").CompareNoCase(u"STRASSE"), 0);
    EXPECT_LT(CString(u"a").CompareNoCase(u"B"), 0);
    EXPECT_GT(CString(u"ab").CompareNoCase(u"A"), 0);
    EXPECT_TRUE(CString(u"Fn").EqualsNoCase(u"FN"));
    EXPECT_FALSE(CString(u"Fn").EqualsNoCase(u"FNX"));
}

TEST(String, ComparesPairsAsOneCodePoint) {
    EXPECT_EQ(CString(u"x\U00010400").CompareNoCase(u"X\U00010428"), 0);
    EXPECT_NE(CString(u"\U00010400").CompareNoCase(u"\xD801"), 0);
    EXPECT_TRUE(CString(u"ab\U00010400z").EqualsNoCase(u"AB\U00010428Z"));
}

TEST(String, HashesDependOnTheUnitsAlone) {
    const CString text(u"abcdefg");
    CString grown(u"abc");
    grown += u"defg";
    EXPECT_EQ(text.Hash(), grown.Hash());
    std::unordered_set<std::size_t> hashes;
    for (char16_t unit = 0; unit < 1000; ++unit) hashes.insert(CString::hash(std::u16string_view(&unit, 1)));
    EXPECT_EQ(hashes.size(), 1000u);
    EXPECT_NE(CString::hash(u""), CString::hash(std::u16string_view(u"\0", 1)));
}

TEST(String, CopiesOfOneTextServeManyThreads) {
    const CString shared(u"shared by all of them");
    std::vector<std::thread> threads;
    for (int thread = 0; thread < 8; ++thread)
        threads.emplace_back([shared] {
            for (int round = 0; round < 2000; ++round) {
                CString copy = shared;
                CString other = copy;
                other += u"!";
                ASSERT_EQ(other.GetLength(), copy.GetLength() + 1);
            }
        });
    for (std::thread& thread : threads) thread.join();
    EXPECT_EQ(shared.View(), u"shared by all of them");
}

}  // namespace
