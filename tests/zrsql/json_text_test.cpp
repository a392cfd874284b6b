#include "json_text.h"

#include <gtest/gtest.h>

namespace zr::tool {
namespace {

std::string jsonOf(std::u16string_view text) {
    std::string out;
    appendJsonString(out, text);
    return out;
}

TEST(JsonText, KeepsPlainAscii) {
    EXPECT_EQ(jsonOf(u"SELECT a/b ~"), R"("SELECT a/b ~")");
}

TEST(JsonText, EscapesQuotesAndBackslashes) {
    EXPECT_EQ(jsonOf(u"\"\\"), R"("\"\\")");
}

TEST(JsonText, WritesControlCharactersInTheirShortForm) {
    EXPECT_EQ(jsonOf(u"\b\f\n\r\t"), R"("\b\f\n\r\t")");
    EXPECT_EQ(jsonOf(std::u16string_view(u"\0\x1f", 2)), R"("\u0000\u001f")");
}

TEST(JsonText, WritesEveryOtherUnitAsFourHexadecimalDigits) {
    EXPECT_EQ(jsonOf(u"é"), R"("\u00e9")");
    EXPECT_EQ(jsonOf(u"\x80"), R"("\u0080")");
    EXPECT_EQ(jsonOf(u"\U0001F600"), R"("\ud83d\ude00")");
}

TEST(JsonText, WritesUnpairedSurrogatesAsWhatTheyAre) {
    const char16_t units[] = {u'a', 0xDC00, 0xD800};
    EXPECT_EQ(jsonOf({units, 3}), R"("a\udc00\ud800")");
}

TEST(JsonMembers, PutsCommasBetweenMembers) {
    std::string out = "{";
    JsonMembers members(out);
    members.number("n", -9000000000);
    members.text("t", u"ü");
    members.ascii("a", "x");
    members.text(u"é", u"");
    EXPECT_EQ(out, R"({"n":-9000000000,"t":"\u00fc","a":"x","\u00e9":"")");
}

}  // namespace
}  // namespace zr::tool
