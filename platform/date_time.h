#pragma once

#include <string>
#include <string_view>

namespace zr {

// Dates as days since 30 December 1899. The whole part is the day and may be negative; the fraction, without
// its sign, is the time of day. Days of the years 100 to 9999 are valid.
bool areDaysValid(double days);

// "YYYY-MM-DD hh:mm:ss", rounded to the second. The days must be valid.
std::u16string formatDays(double days);

// Reads a date, a time, or a date and a time behind it (blanks or a "T" between them). Dates: year-month-day
// with "-" or "/", month/day/year, day.month.year, and day, English month name and year in any order that
// tells them apart. Times: hours:minutes, with seconds and their fraction, with AM or PM. A time alone is on
// day 0. False, and nothing written, for anything else.
bool parseDays(std::u16string_view text, double& days);

}  // namespace zr
