#include "platform/date_time.h"

#include <array>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <vector>

#include "platform/case_mapping.h"

namespace zr {
namespace {

constexpr int kSecondsOfDay = 24 * 60 * 60;
constexpr double kFirstDay = -657434;        // 1 January 100
constexpr double kBehindLastDay = 2958466;   // 1 January 10000
constexpr int kEpochFromCivilZero = 693899;  // 30 December 1899, counted from 1 March 0000

struct Date {
    int year;
    int month;
    int day;
};

// Counting years from March puts the leap day at a year's end, so that months add up by one formula.
int daysFromDate(const Date& date) {
    const int year = date.month <= 2 ? date.year - 1 : date.year;
    const int monthFromMarch = (date.month + 9) % 12;
    const int dayOfYear = (153 * monthFromMarch + 2) / 5 + date.day - 1;
    return year * 365 + year / 4 - year / 100 + year / 400 + dayOfYear - kEpochFromCivilZero;
}

Date dateFromDays(int days) {
    const int count = days + kEpochFromCivilZero;
    const int era = count / 146097;
    const int dayOfEra = count % 146097;
    const int yearOfEra = (dayOfEra - dayOfEra / 1460 + dayOfEra / 36524 - dayOfEra / 146096) / 365;
    const int dayOfYear = dayOfEra - (365 * yearOfEra + yearOfEra / 4 - yearOfEra / 100);
    const int monthFromMarch = (5 * dayOfYear + 2) / 153;
    const int month = monthFromMarch < 10 ? monthFromMarch + 3 : monthFromMarch - 9;
    return {yearOfEra + era * 400 + (month <= 2), month, dayOfYear - (153 * monthFromMarch + 2) / 5 + 1};
}

bool isDateValid(const Date& date) {
    if (date.year < 100 || date.year > 9999 || date.month < 1 || date.month > 12 || date.day < 1)
        return false;
    const Date back = dateFromDays(daysFromDate(date));
    return back.month == date.month && back.day == date.day;
}

// A run of digits, a run of letters, or one other unit; blanks are dropped, but remembered.
struct Piece {
    enum class Kind { Number, Word, Sign };
    Kind kind;
    std::u16string text;  // words in lower case
    bool blankBefore;
    int number() const {
        int value = 0;
        for (char16_t digit : text) value = value * 10 + (digit - u'0');
        return value;
    }
};

bool isDigit(char16_t unit) {
    return unit >= u'0' && unit <= u'9';
}
bool isLetter(char16_t unit) {
    return (unit | 0x20) >= u'a' && (unit | 0x20) <= u'z';
}

std::vector<Piece> cutIntoPieces(std::u16string_view text) {
    std::vector<Piece> pieces;
    bool blank = false;
    for (std::size_t at = 0; at < text.size();) {
        if (isWhiteSpace(text[at])) {
            blank = true;
            ++at;
            continue;
        }
        const std::size_t start = at++;
        Piece::Kind kind = Piece::Kind::Sign;
        if (isDigit(text[start])) {
            kind = Piece::Kind::Number;
            while (at < text.size() && isDigit(text[at])) ++at;
        } else if (isLetter(text[start])) {
            kind = Piece::Kind::Word;
            while (at < text.size() && isLetter(text[at])) ++at;
        }
        pieces.push_back({kind, std::u16string(text.substr(start, at - start)), blank});
        makeLower(pieces.back().text.data(), pieces.back().text.size());
        blank = false;
    }
    return pieces;
}

class DateReader {
 public:
    explicit DateReader(std::u16string_view text) : pieces_(cutIntoPieces(text)) {}

    bool read(double& days) {
        if (pieces_.empty()) return false;
        Date date{1899, 12, 30};
        double time = 0;
        const bool hasDate = readDate(date);
        if (hasDate && at_ < pieces_.size()) {
            if (isWord(u"t"))
                ++at_;
            else if (!pieces_[at_].blankBefore)
                return false;
        }
        const bool hasTime = at_ < pieces_.size() && readTime(time);
        if (at_ != pieces_.size() || (!hasDate && !hasTime)) return false;
        const int day = daysFromDate(date);
        days = day < 0 ? day - time : day + time;
        return true;
    }

 private:
    bool isNumber(std::size_t ahead = 0) const {
        return at_ + ahead < pieces_.size() && pieces_[at_ + ahead].kind == Piece::Kind::Number &&
               pieces_[at_ + ahead].text.size() <= 9;
    }
    bool isSign(char16_t sign, std::size_t ahead = 0) const {
        return at_ + ahead < pieces_.size() && pieces_[at_ + ahead].kind == Piece::Kind::Sign &&
               pieces_[at_ + ahead].text[0] == sign;
    }
    bool isWord(std::u16string_view word) const {
        return at_ < pieces_.size() && pieces_[at_].kind == Piece::Kind::Word && pieces_[at_].text == word;
    }
    int number(std::size_t ahead = 0) const { return pieces_[at_ + ahead].number(); }
    bool isYear(std::size_t ahead) const { return isNumber(ahead) && pieces_[at_ + ahead].text.size() == 4; }

    // The number of the month whose English name the piece is, or begins with three letters of; 0 for none.
    int monthAt(std::size_t ahead) const {
        static constexpr std::array<std::u16string_view, 12> kNames = {
            u"january", u"february", u"march",     u"april",   u"may",      u"june",
            u"july",    u"august",   u"september", u"october", u"november", u"december"};
        if (at_ + ahead >= pieces_.size() || pieces_[at_ + ahead].kind != Piece::Kind::Word) return 0;
        const std::u16string& word = pieces_[at_ + ahead].text;
        for (std::size_t month = 0; month < kNames.size(); ++month)
            if (word.size() >= 3 && kNames[month].starts_with(word)) return static_cast<int>(month) + 1;
        return 0;
    }

    bool accept(const Date& date, std::size_t pieces, Date& result) {
        if (!isDateValid(date)) return false;
        result = date;
        at_ += pieces;
        return true;
    }

    bool readDate(Date& date) {
        for (char16_t sign : {u'-', u'/', u'.'}) {
            if (!isNumber() || !isSign(sign, 1) || !isNumber(2) || !isSign(sign, 3) || !isNumber(4)) continue;
            if (isYear(0) && sign != u'.') return accept({number(0), number(2), number(4)}, 5, date);
            if (isYear(4) && sign == u'/') return accept({number(4), number(0), number(2)}, 5, date);
            if (isYear(4) && sign == u'.') return accept({number(4), number(2), number(0)}, 5, date);
        }
        return readNamedDate(date);
    }

    bool readNamedDate(Date& date) {
        // Signs between the three parts say nothing.
        std::vector<std::size_t> parts;
        std::size_t ahead = 0;
        for (; parts.size() < 3 && at_ + ahead < pieces_.size(); ++ahead)
            if (!isSign(u'-', ahead) && !isSign(u',', ahead)) parts.push_back(ahead);
        if (parts.size() < 3) return false;
        if (isNumber(parts[0]) && monthAt(parts[1]) && isYear(parts[2]))
            return accept({number(parts[2]), monthAt(parts[1]), number(parts[0])}, ahead, date);
        if (monthAt(parts[0]) && isNumber(parts[1]) && isYear(parts[2]))
            return accept({number(parts[2]), monthAt(parts[0]), number(parts[1])}, ahead, date);
        if (isYear(parts[0]) && monthAt(parts[1]) && isNumber(parts[2]))
            return accept({number(parts[0]), monthAt(parts[1]), number(parts[2])}, ahead, date);
        return false;
    }

    bool readTime(double& time) {
        if (!isNumber() || !isSign(u':', 1) || !isNumber(2)) return false;
        int hours = number();
        const int minutes = number(2);
        double seconds = 0;
        at_ += 3;
        if (isSign(u':') && isNumber(1)) {
            seconds = number(1);
            at_ += 2;
            if (isSign(u'.') && isNumber(1)) {
                seconds += number(1) / std::pow(10.0, static_cast<double>(pieces_[at_ + 1].text.size()));
                at_ += 2;
            }
        }
        if (isWord(u"am") || isWord(u"pm")) {
            if (hours < 1 || hours > 12) return false;
            hours = hours % 12 + (isWord(u"pm") ? 12 : 0);
            ++at_;
        }
        if (hours > 23 || minutes > 59 || seconds >= 60) return false;
        time = (hours * 3600 + minutes * 60 + seconds) / kSecondsOfDay;
        return true;
    }

    std::vector<Piece> pieces_;
    std::size_t at_ = 0;
};

}  // namespace

bool areDaysValid(double days) {
    return days > kFirstDay - 1 && days < kBehindLastDay;
}

std::u16string formatDays(double days) {
    double whole;
    const double fraction = std::fabs(std::modf(days, &whole));
    int day = static_cast<int>(whole);
    int second = static_cast<int>(std::lround(fraction * kSecondsOfDay));
    if (second == kSecondsOfDay) {
        // Rounded up to midnight, but not beyond the last day that can be written.
        if (day + 1 < kBehindLastDay) {
            ++day;
            second = 0;
        } else {
            --second;
        }
    }
    const Date date = dateFromDays(day);
    char text[64];
    const int length = std::snprintf(text, sizeof text, "%04d-%02d-%02d %02d:%02d:%02d", date.year,
                                     date.month, date.day, second / 3600, second / 60 % 60, second % 60);
    return std::u16string(text, text + length);
}

bool parseDays(std::u16string_view text, double& days) {
    return DateReader(text).read(days);
}

}  // namespace zr
