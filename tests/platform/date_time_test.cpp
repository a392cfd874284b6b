#include "platform/date_time.h"

#include <gtest/gtest.h>

#include <string>

#include "zrparsersql/wide_string.h"

namespace {

double parsed(std::u16string_view text) {
    double days = -1e9;
    EXPECT_TRUE(zr::parseDays(text, days)) << CString(text).toUtf8();
    return days;
}

bool isDate(std::u16string_view text) {
    double days = 0;
    return zr::parseDays(text, days);
}

std::string shown(double days) {
    return CString(zr::formatDays(days)).toUtf8();
}

TEST(DateTime, CountsFromTheEndOf1899) {
    EXPECT_EQ(shown(0), "1899-12-30 00:00:00");
    EXPECT_EQ(shown(1), "1899-12-31 00:00:00");
    EXPECT_EQ(shown(2), "1900-01-01 00:00:00");
    EXPECT_EQ(shown(25569), "1970-01-01 00:00:00");
    EXPECT_EQ(shown(36526.5), "2000-01-01 12:00:00");
    EXPECT_EQ(shown(-1), "1899-12-29 00:00:00");
}

TEST(DateTime, TakesTheTimeOfEarlyDaysWithoutItsSign) {
    EXPECT_EQ(shown(-1.25), "1899-12-29 06:00:00");
}

TEST(DateTime, RoundsToTheSecond) {
    EXPECT_EQ(shown(1 - 1e-7), "1899-12-31 00:00:00");
    EXPECT_EQ(shown(2958465.9999999), "9999-12-31 23:59:59");
}

TEST(DateTime, IsValidFromYear100To9999) {
    EXPECT_EQ(shown(-657434), "0100-01-01 00:00:00");
    EXPECT_TRUE(zr::areDaysValid(-657434.9));
    EXPECT_FALSE(zr::areDaysValid(-657435));
    EXPECT_TRUE(zr::areDaysValid(2958465.9));
    EXPECT_FALSE(zr::areDaysValid(2958466));
}

TEST(DateTime, ReadsWhatItWrites) {
    for (double days = -657434; days < 2958466; days += 99991) EXPECT_EQ(parsed(zr::formatDays(days)), days);
    EXPECT_DOUBLE_EQ(parsed(u"2024-02-29 18:00:00"), 45351.75);
    EXPECT_DOUBLE_EQ(parsed(u"1899-12-29 06:00:00"), -1.25);
}

TEST(DateTime, ReadsDatesInSeveralForms) {
    for (std::u16string_view text :
         {u"2024-02-29", u"2024/2/29", u"2/29/2024", u"29.02.2024", u"29 Feb 2024", u"February 29, 2024",
          u"29-feb-2024", u"2024 feb 29", u"  2024-02-29  ", u"2024-02-29T00:00"})
        EXPECT_EQ(parsed(text), 45351) << CString(text).toUtf8();
}

TEST(DateTime, ReadsTimes) {
    EXPECT_DOUBLE_EQ(parsed(u"6:00"), 0.25);
    EXPECT_DOUBLE_EQ(parsed(u"12:00:00 AM"), 0);
    EXPECT_DOUBLE_EQ(parsed(u"12:00 pm"), 0.5);
    EXPECT_DOUBLE_EQ(parsed(u"00:00:01.5"), 1.5 / 86400);
}

TEST(DateTime, RefusesWhatIsNoDate) {
    for (std::u16string_view text :
         {u"", u"  ", u"abc", u"2023-02-29", u"2024-13-01", u"2024-00-10", u"24:00", u"1:60", u"13:00 pm",
          u"0:30 am", u"2024-02-29x", u"2024-02-29 10:00 tomorrow", u"5", u"99-01-01", u"2024-02-2910:00",
          u"12 Foo 2024", u"99999999999-1-1"})
        EXPECT_FALSE(isDate(text)) << CString(text).toUtf8();
}

}  // namespace
