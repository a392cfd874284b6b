#include <gtest/gtest.h>

#include "tests/platform/print_string.h"
#include "zrparsersql/wide_string.h"

namespace {

CString fromBytes(std::string_view bytes) {
    return CString::fromUtf8(bytes);
}

TEST(Utf8, GoesBothWays) {
    const std::string bytes = "a\xC3\xBC\xE2\x82\xAC\xF0\x90\x90\x80";
    EXPECT_EQ(fromBytes(bytes), u"aü€\U00010400");
    EXPECT_EQ(fromBytes(bytes).toUtf8(), bytes);
}

TEST(Utf8, KeepsEveryUnitThereAndBack) {
    std::u16string units;
    for (unsigned unit = 0; unit < 0x10000; ++unit) {
        // Reversed pairs and lone halves, beside everything else.
        units += static_cast<char16_t>(0xFFFF - unit);
    }
    EXPECT_EQ(CString::fromUtf8(CString(units).toUtf8()).View(), units);
}

TEST(Utf8, WritesUnpairedSurrogatesAsThreeBytes) {
    EXPECT_EQ(CString(u"\xD800x").toUtf8(), "\xED\xA0\x80x");
    EXPECT_EQ(CString(u"\xDFFF").toUtf8(), "\xED\xBF\xBF");
    EXPECT_EQ(fromBytes("\xED\xA0\x80").View(), std::u16string_view(u"\xD800"));
}

TEST(Utf8, ReplacesEachIllFormedPiece) {
    EXPECT_EQ(fromBytes("\x80"), u"\uFFFD");
    EXPECT_EQ(fromBytes("a\xC3"), u"a\uFFFD");
    EXPECT_EQ(fromBytes("\xE2\x82z"), u"\uFFFDz");
    EXPECT_EQ(fromBytes("\xC0\xAF"), u"\uFFFD\uFFFD");
    EXPECT_EQ(fromBytes("\xE0\x80\xAF"), u"\uFFFD\uFFFD\uFFFD");
    EXPECT_EQ(fromBytes("\xF0\x80\x80\xAF"), u"\uFFFD\uFFFD\uFFFD\uFFFD");
    EXPECT_EQ(fromBytes("\xF4\x90\x80\x80"), u"\uFFFD\uFFFD\uFFFD\uFFFD");
    EXPECT_EQ(fromBytes("\xF0\x90\x90"), u"\uFFFD");
    EXPECT_EQ(fromBytes("\xFF\xFE"), u"\uFFFD\uFFFD");
}

TEST(Utf8, KeepsZeros) {
    EXPECT_EQ(fromBytes(std::string_view("a\0b", 3)).GetLength(), 3);
    EXPECT_EQ(CString(u"a\0b", 3).toUtf8(), std::string("a\0b", 3));
}

}  // namespace
