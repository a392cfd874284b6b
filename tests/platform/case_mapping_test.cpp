#include "platform/case_mapping.h"

#include <gtest/gtest.h>

#include <string>

namespace {

std::u16string folded(std::u16string text) {
    zr::foldCase(text.data(), text.size());
    return text;
}

TEST(CaseMapping, FoldingAgreesWithComparing) {
    const std::u16string_view texts[] = {
        u"",  u"a", u"A", u"ab",         u"É",          u"é",      u"\u212A",  u"k",       u"ß",  u"ss",
        u"Σ", u"ς", u"σ", u"\U00010400", u"\U00010428", u"\xD801", u"\xD801x", u"\u212Ax", u"kxy"};
    for (std::u16string_view left : texts)
        for (std::u16string_view right : texts)
            EXPECT_EQ(zr::compareNoCase(left, right) == 0,
                      folded(std::u16string(left)) == folded(std::u16string(right)));
}

TEST(CaseMapping, ComparingIsAnOrder) {
    const std::u16string_view texts[] = {u"",  u"A", u"b", u"Z",      u"[",
                                         u"_", u"ä", u"Ö", u"\xD801", u"\U00010400"};
    for (std::u16string_view a : texts)
        for (std::u16string_view b : texts) {
            EXPECT_EQ(zr::compareNoCase(a, b), -zr::compareNoCase(b, a));
            for (std::u16string_view c : texts) {
                if (zr::compareNoCase(a, b) < 0 && zr::compareNoCase(b, c) < 0) {
                    EXPECT_LT(zr::compareNoCase(a, c), 0);
                }
            }
        }
}

TEST(CaseMapping, TellsWhiteSpace) {
    for (char16_t unit :
         {u' ', u'\t', u'\n', u'\v', u'\f', u'\r', u'\u0085', u'\u00A0', u'\u2003', u'\u3000'})
        EXPECT_TRUE(zr::isWhiteSpace(unit)) << static_cast<int>(unit);
    for (char16_t unit : {u'\0', u'x', u'_', u'\u200B', u'\uFEFF', static_cast<char16_t>(0xD800)})
        EXPECT_FALSE(zr::isWhiteSpace(unit)) << static_cast<int>(unit);
}

TEST(CaseMapping, ShortCutHoldsForMappedAsciiOnly) {
    EXPECT_TRUE(zr::isLowerAscii(u"abc_1"));
    EXPECT_FALSE(zr::isLowerAscii(u"abC"));
    EXPECT_FALSE(zr::isLowerAscii(u"abä"));
    EXPECT_TRUE(zr::isUpperAscii(u"ABC_1"));
    EXPECT_FALSE(zr::isUpperAscii(u"aBC"));
}

}  // namespace
