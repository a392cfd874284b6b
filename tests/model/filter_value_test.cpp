#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>
#include <string>

#include "model/filter_text.h"
#include "tests/platform/print_string.h"
#include "zrparsersql/filter_info.h"

namespace {

std::string dataOf(const CZRFilterValue& value) {
    return std::string(value.Data, value.DataLength);
}

CString wideOf(CZRFilterValue& value) {
    return CString(value.GetWide());
}

CZRFilterValue wide(const char16_t* text, int type) {
    CZRFilterValue value;
    EXPECT_EQ(value.SetWide(text, type), 1);
    return value;
}

TEST(FilterValue, StartsAsNullOfNoType) {
    CZRFilterValue value;
    EXPECT_TRUE(value.IsNull());
    EXPECT_EQ(value.ValueType, -1);
    EXPECT_EQ(value.Encoding, 2);
    EXPECT_EQ(value.ConvertedEncoding, 2);
    EXPECT_EQ(value.DataLength, 0u);
    EXPECT_EQ(value.BlobLength, 0u);
    EXPECT_EQ(value.GetAs(FE_UTF8), nullptr);
    EXPECT_EQ(value.GetWide(), nullptr);
    EXPECT_EQ(value.GetDouble(), 0);
    zr::DateTime date;
    EXPECT_EQ(value.GetDate(date), 0);
}

TEST(FilterValue, FloatingNumberIsStoredWithSixDecimals) {
    CZRFilterValue value;
    EXPECT_EQ(value.SetDouble(1.5, 3), 1);
    EXPECT_EQ(dataOf(value), "1.500000");
    EXPECT_EQ(value.ValueType, 3);
    EXPECT_EQ(value.Encoding, 7);
}

TEST(FilterValue, IntegersAreStoredAsText) {
    CZRFilterValue value;
    value.SetInt64(std::numeric_limits<std::int64_t>::min(), 2);
    EXPECT_EQ(dataOf(value), "-9223372036854775808");
    value.SetInt32(-5, 2);
    EXPECT_EQ(dataOf(value), "-5");
    value.SetInt16(-300, 2);
    EXPECT_EQ(dataOf(value), "-300");
    value.SetInt8(-128, 2);
    EXPECT_EQ(dataOf(value), "-128");
    EXPECT_EQ(value.Encoding, 7);
}

TEST(FilterValue, UnsignedNumberIsWrittenAsSigned) {
    CZRFilterValue value;
    value.SetUInt32(7, 2);
    EXPECT_EQ(dataOf(value), "7");
    value.SetUInt32(4294967295u, 2);
    EXPECT_EQ(dataOf(value), "-1");
}

TEST(FilterValue, DateIsStoredAsItsText) {
    CZRFilterValue value;
    value.SetDate({45351.75, zr::DateTime::Status::Valid}, 9);
    EXPECT_EQ(wideOf(value), u"2024-02-29 18:00:00");
    value.SetDate({0, zr::DateTime::Status::Invalid}, 9);
    EXPECT_EQ(wideOf(value), u"Invalid DateTime");
    value.SetDate({1e9, zr::DateTime::Status::Valid}, 9);
    EXPECT_EQ(wideOf(value), u"Invalid DateTime");
    value.SetDate({5, zr::DateTime::Status::Null}, 9);
    EXPECT_FALSE(value.IsNull());
    EXPECT_EQ(wideOf(value), u"");
    EXPECT_EQ(value.ValueType, 9);
}

TEST(FilterValue, NullPointerMakesANullValueOfThatType) {
    CZRFilterValue value;
    value.SetInt32(5, 2);
    EXPECT_EQ(value.SetWide(nullptr, 4), 1);
    EXPECT_TRUE(value.IsNull());
    EXPECT_EQ(value.ValueType, 4);
    EXPECT_EQ(value.SetBytes(nullptr, 3, 5), 1);
    EXPECT_TRUE(value.IsNull());
    EXPECT_EQ(value.ValueType, 5);
    EXPECT_EQ(value.SetText(nullptr, FE_UTF8, 6), 1);
    EXPECT_TRUE(value.IsNull());
    EXPECT_EQ(value.ValueType, 6);
}

TEST(FilterValue, BytesEndInTwoZeros) {
    CZRFilterValue value;
    value.SetBytes("abc", 3, 4);
    EXPECT_EQ(value.DataLength, 3u);
    EXPECT_EQ(std::memcmp(value.Data, "abc\0\0", 5), 0);
    EXPECT_EQ(value.Encoding, 7);
}

TEST(FilterValue, GivesItsOwnDataForItsOwnEncoding) {
    CZRFilterValue value;
    value.SetText("abc", FE_UTF8, 4);
    EXPECT_EQ(value.GetAs(FE_UTF8), value.Data);
    EXPECT_EQ(value.Converted, nullptr);
}

TEST(FilterValue, RemembersTheLastConversion) {
    CZRFilterValue value;
    value.SetText("\x80", 9, 4);
    const char16_t* first = value.GetWide();
    EXPECT_EQ(CString(first), u"\u0402") << "the first letter of Windows-1251's upper half";
    EXPECT_EQ(value.GetWide(), first);
    EXPECT_EQ(std::string(value.GetAs(FE_UTF8)), "\xD0\x82");
    EXPECT_EQ(value.ConvertedEncoding, FE_UTF8);
    EXPECT_EQ(std::string(value.GetAs(14)), "?") << "not in that code page";
    EXPECT_EQ(std::string(value.GetAs(9)), "\x80");
}

TEST(FilterValue, ConvertsBetweenSingleByteTables) {
    CZRFilterValue value;
    value.SetText("\xCF\xF0\xE8", 9, 4);  // "При" in Windows-1251
    EXPECT_EQ(wideOf(value), u"При");
    EXPECT_EQ(std::string(value.GetAs(14)), "\x8F\xE0\xA8");
    EXPECT_EQ(std::string(value.GetAs(21)), "\xF0\xD2\xC9");
}

TEST(FilterValue, UnmappedBytesReadAsQuestionMarks) {
    CZRFilterValue value;
    value.SetText("a\x80z", 7, 4);
    EXPECT_EQ(wideOf(value), u"a?z");
    value.SetBytes("a\0z", 3, 4);
    EXPECT_EQ(wideOf(value), u"a?z") << "a zero has no code point either";
}

TEST(FilterText, EncodingUtf8DropsTwoCodePoints) {
    EXPECT_EQ(zr::encodeFilterText(u"a\u007F\u0080b\u0081\u07FF\u0800\u0801", FE_UTF8),
              "a\x7F"
              "b\xC2\x81\xDF\xBF\xE0\xA0\x81");
}

TEST(FilterText, EncodingUtf8WritesEachUnitByItself) {
    EXPECT_EQ(zr::encodeFilterText(u"\U00010400", FE_UTF8), "\xED\xA0\x81\xED\xB0\x80");
    EXPECT_EQ(zr::decodeFilterText("\xED\xA0\x81\xED\xB0\x80", FE_UTF8), u"\U00010400");
}

TEST(FilterText, DecodingUtf8CutsFourByteFormsTo16Bits) {
    EXPECT_EQ(zr::decodeFilterText("\xF0\x90\x90\x81", FE_UTF8), u"\u0401");
}

TEST(FilterText, DecodingUtf8MarksBrokenForms) {
    EXPECT_EQ(zr::decodeFilterText("a\x80z", FE_UTF8), u"a?z");
    EXPECT_EQ(zr::decodeFilterText("\xC3", FE_UTF8), u"?");
    EXPECT_EQ(zr::decodeFilterText("\xE2\x82z", FE_UTF8), u"?z");
    EXPECT_EQ(zr::decodeFilterText("\xFF", FE_UTF8), u"?");
}

TEST(FilterText, EveryCodePointButTheDroppedOnesSurvivesUtf8) {
    std::u16string units;
    for (unsigned unit = 1; unit < 0x10000; ++unit)
        if (unit != 128 && unit != 2048) units += static_cast<char16_t>(unit);
    EXPECT_EQ(zr::decodeFilterText(zr::encodeFilterText(units, FE_UTF8), FE_UTF8), units);
}

TEST(FilterText, MeasuresLongTextFirst) {
    std::u16string units(20'000'001, u'x');
    units.back() = u'ü';
    const std::string bytes = zr::encodeFilterText(units, FE_UTF8);
    EXPECT_EQ(bytes.size(), units.size() + 1);
    EXPECT_LT(bytes.capacity(), units.size() + 64);
}

TEST(FilterText, SystemEncodingHoldsAscii) {
    EXPECT_EQ(zr::encodeFilterText(u"abc", FE_ANSI), "abc");
    EXPECT_EQ(zr::decodeFilterText("abc", FE_ANSI), u"abc");
}

TEST(FilterText, UnknownEncodingsAreLatin1) {
    for (int encoding : {0, 27, 999, -1}) {
        EXPECT_EQ(zr::decodeFilterText("\xE4", encoding), u"ä");
        EXPECT_EQ(zr::encodeFilterText(u"ä€", encoding), "\xE4?");
    }
}

TEST(FilterValue, DoubleReadsACommaAsThePointAndKeepsIt) {
    CZRFilterValue value;
    value.SetText("1,5", 7, 3);
    EXPECT_EQ(value.GetDouble(), 1.5);
    EXPECT_EQ(dataOf(value), "1.5");
    CZRFilterValue wideValue = wide(u"2,25", 3);
    EXPECT_EQ(wideOf(wideValue), u"2,25");
    EXPECT_EQ(wideValue.GetDouble(), 2.25);
    EXPECT_EQ(wideOf(wideValue), u"2.25");
}

TEST(FilterValue, DoubleForgetsAConversionThatHadTheComma) {
    CZRFilterValue value;
    value.SetText("1,5", 7, 3);
    EXPECT_EQ(wideOf(value), u"1,5");
    value.GetDouble();
    EXPECT_EQ(wideOf(value), u"1.5");
}

TEST(FilterValue, DoubleReadsAsFarAsThereIsANumber) {
    const struct {
        const char16_t* text;
        double number;
    } cases[] = {{u"", 0},   {u"abc", 0}, {u"12abc", 12}, {u"  -3.5e2", -350},
                 {u"+7", 7}, {u"+-7", 0}, {u".5", 0.5},   {u"1e999", 0}};
    for (const auto& expected : cases) EXPECT_EQ(wide(expected.text, 3).GetDouble(), expected.number);
}

TEST(FilterValue, DateIsReadOrRefused) {
    zr::DateTime date{7, zr::DateTime::Status::Null};
    EXPECT_EQ(wide(u"2024-02-29 18:00:00", 9).GetDate(date), 1);
    EXPECT_DOUBLE_EQ(date.days, 45351.75);
    EXPECT_EQ(date.status, zr::DateTime::Status::Valid);
    date.days = 7;
    EXPECT_EQ(wide(u"yesterday", 9).GetDate(date), 0);
    EXPECT_EQ(date.days, 7);
}

TEST(FilterValue, CopyIsDeepAndDropsTheCache) {
    CZRFilterValue value;
    value.SetText("\x80", 9, 4);
    value.SetBlob("\0\1\2", 3);
    value.GetWide();
    const CZRFilterValue copy(value);
    EXPECT_NE(copy.Data, value.Data);
    EXPECT_EQ(dataOf(copy), "\x80");
    EXPECT_EQ(copy.Encoding, 9);
    EXPECT_EQ(copy.ValueType, 4);
    EXPECT_EQ(copy.Converted, nullptr);
    ASSERT_EQ(copy.BlobLength, 3u);
    EXPECT_EQ(std::memcmp(copy.Blob, "\0\1\2", 3), 0);
    CZRFilterValue assigned;
    assigned.SetInt32(1, 2);
    assigned = value;
    CZRFilterValue& same = assigned;
    assigned = same;
    EXPECT_TRUE(assigned.Equals(value));
    assigned = CZRFilterValue();
    EXPECT_TRUE(assigned.IsNull());
    EXPECT_EQ(assigned.BlobLength, 0u);
}

TEST(FilterValueEquals, NullsAreEqualToNullsAlone) {
    CZRFilterValue null;
    CZRFilterValue typedNull;
    typedNull.SetNull(5);
    EXPECT_TRUE(null.Equals(typedNull));
    EXPECT_TRUE(null.EqualsLoosely(typedNull));
    EXPECT_FALSE(null.Equals(wide(u"", -1)));
    EXPECT_FALSE(wide(u"", -1).EqualsLoosely(null));
    EXPECT_TRUE(null.NotEquals(wide(u"", -1)));
}

TEST(FilterValueEquals, StrictFormComparesTypes) {
    EXPECT_FALSE(wide(u"a", 4).Equals(wide(u"a", 5)));
    EXPECT_TRUE(wide(u"a", 4).EqualsLoosely(wide(u"a", 5)));
    EXPECT_TRUE(wide(u"a", 4).NotEquals(wide(u"a", 5)));
    EXPECT_TRUE(wide(u"a", 4).Equals(wide(u"a", 4)));
    EXPECT_FALSE(wide(u"a", 4).Equals(wide(u"ab", 4)));
}

TEST(FilterValueEquals, FloatingNumbersAreComparedAsNumbers) {
    EXPECT_TRUE(wide(u"1.5", 3).Equals(wide(u"1.500000", 3)));
    EXPECT_TRUE(wide(u"1,5", 3).Equals(wide(u"15e-1", 3)));
    EXPECT_FALSE(wide(u"1.5", 3).Equals(wide(u"1.6", 3)));
    EXPECT_FALSE(wide(u"nan", 3).Equals(wide(u"nan", 3))) << "what is not a number equals nothing";
    EXPECT_FALSE(wide(u"abc", 3).Equals(wide(u"abc", 3)));
    EXPECT_FALSE(wide(u"", 3).Equals(wide(u"0", 3)));
}

TEST(FilterValueEquals, TextsThatBeginWithAnExponentAreComparedAsText) {
    EXPECT_TRUE(wide(u"E5", 3).Equals(wide(u"E5", 3)));
    EXPECT_FALSE(wide(u"E5", 3).Equals(wide(u"e5", 3)));
    EXPECT_TRUE(wide(u"", 3).Equals(wide(u"", 3)));
}

TEST(FilterValueEquals, TypesTwoToFiveAreBroughtToOneEncoding) {
    for (int type = 2; type <= 5; ++type) {
        CZRFilterValue narrow;
        narrow.SetText("12", 7, type);
        EXPECT_TRUE(narrow.Equals(wide(u"12", type))) << type;
        EXPECT_TRUE(wide(u"12", type).Equals(narrow)) << type;
    }
    CZRFilterValue narrow;
    narrow.SetText("12", 7, 6);
    EXPECT_FALSE(narrow.Equals(wide(u"12", 6))) << "other types compare bytes";
}

TEST(FilterValueEquals, BinaryPartsMustMatch) {
    CZRFilterValue left = wide(u"a", 4);
    CZRFilterValue right = wide(u"a", 4);
    left.SetBlob("\1\2", 2);
    EXPECT_FALSE(left.Equals(right));
    EXPECT_TRUE(left.EqualsLoosely(right)) << "missing on one side";
    EXPECT_TRUE(right.EqualsLoosely(left));
    right.SetBlob("\1\3", 2);
    EXPECT_FALSE(left.Equals(right));
    EXPECT_FALSE(left.EqualsLoosely(right));
    right.SetBlob("\1\2", 2);
    EXPECT_TRUE(left.Equals(right));
    right.SetBlob("\1\2\3", 3);
    EXPECT_FALSE(left.Equals(right));
    right.SetBlob(nullptr, 3);
    EXPECT_EQ(right.BlobLength, 0u);
}

TEST(FilterValueEquals, ComparingChangesNeitherSide) {
    CZRFilterValue left = wide(u"1,5", 3);
    CZRFilterValue right;
    right.SetText("1,5", 7, 3);
    EXPECT_TRUE(left.Equals(right));
    EXPECT_EQ(wideOf(left), u"1,5");
    EXPECT_EQ(right.Converted, nullptr);
}

}  // namespace
