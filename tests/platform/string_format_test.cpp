#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <limits>

#include "tests/platform/print_string.h"
#include "zrparsersql/wide_string.h"

namespace {

template <class... Arguments>
CString formatted(const char16_t* picture, const Arguments&... arguments) {
    CString text;
    text.Format(picture, arguments...);
    return text;
}

TEST(StringFormat, TakesTextOfBothKinds) {
    EXPECT_EQ(formatted(u"%s(%s)", CString(u"f"), u"x"), u"f(x)");
    EXPECT_EQ(formatted(u"%s", static_cast<const char16_t*>(nullptr)), u"");
    EXPECT_EQ(formatted(u"%5s|%-5s|%.2s", u"ab", u"cd", u"xyz"), u"   ab|cd   |xy");
}

TEST(StringFormat, TakesTheTextItReplaces) {
    CString text(u"a");
    text.Format(u"%s%s", text, text);
    EXPECT_EQ(text, u"aa");
}

TEST(StringFormat, WritesIntegersInTheWidthTheyArePassedWith) {
    EXPECT_EQ(formatted(u"%d %d", 42, -7), u"42 -7");
    EXPECT_EQ(formatted(u"%I64d", std::numeric_limits<std::int64_t>::min()), u"-9223372036854775808");
    EXPECT_EQ(formatted(u"%u", std::uint32_t{4294967295u}), u"4294967295");
    EXPECT_EQ(formatted(u"%ld", std::uint32_t{4294967295u}), u"-1");
    EXPECT_EQ(formatted(u"%u", -1), u"4294967295");
    EXPECT_EQ(formatted(u"%lld %ld", 5LL, 6L), u"5 6");
    EXPECT_EQ(formatted(u"%d", static_cast<std::int8_t>(-128)), u"-128");
}

TEST(StringFormat, CutsShortIntegers) {
    EXPECT_EQ(formatted(u"%hd", 65535), u"-1");
    EXPECT_EQ(formatted(u"%hd", static_cast<std::int16_t>(-300)), u"-300");
    EXPECT_EQ(formatted(u"%hhd", 255), u"-1");
    EXPECT_EQ(formatted(u"%hu", -1), u"65535");
}

TEST(StringFormat, PadsAndSigns) {
    EXPECT_EQ(formatted(u"%05d|%5d|%-5d|%+d|% d", -42, 42, 42, 42, 42), u"-0042|   42|42   |+42| 42");
    EXPECT_EQ(formatted(u"%x %X %04x", 255, 255, 255), u"ff FF 00ff");
}

TEST(StringFormat, WritesFloatingNumbersWithAPoint) {
    EXPECT_EQ(formatted(u"%f", 1.5), u"1.500000");
    EXPECT_EQ(formatted(u"%.2f", -0.005), u"-0.01");
    EXPECT_EQ(formatted(u"%.0f", 2.0), u"2");
    EXPECT_EQ(formatted(u"%8.1f|%08.1f", 1.25, -1.25), u"     1.2|-00001.2");
    EXPECT_EQ(formatted(u"%f", 1e308).GetLength(), 309 + 7);
    EXPECT_EQ(formatted(u"%f", HUGE_VAL), u"inf");
    EXPECT_EQ(formatted(u"%.99999f", 1.0).GetLength(), 2 + 4096);
}

TEST(StringFormat, WritesUnitsAndPercentSigns) {
    EXPECT_EQ(formatted(u"%c%c%%", u'x', u'Ж'), u"xЖ%");
    EXPECT_EQ(formatted(u"100%%"), u"100%");
}

TEST(StringFormat, PrintsNothingForWhatDoesNotFit) {
    EXPECT_EQ(formatted(u"<%d>"), u"<>");
    EXPECT_EQ(formatted(u"<%d>", u"text"), u"<>");
    EXPECT_EQ(formatted(u"<%s>", 5), u"<>");
    EXPECT_EQ(formatted(u"<%f>", 5), u"<>");
    EXPECT_EQ(formatted(u"<%q>", 5), u"<>");
    EXPECT_EQ(formatted(u"<%", 5), u"<");
    EXPECT_EQ(formatted(u"%"), u"");
}

}  // namespace
