// The date parser reads the text in two passes: a scanner that turns it into numbers, names and
// separators (rejecting any character the locale's formats do not use), and a reader that takes
// one time group and up to three date fields from them and then decides which field is which.
#include "platform/ole_date.h"

#include <cctype>
#include <optional>
#include <vector>

#include "platform/errors.h"
#include "platform/sync.h"

namespace plat {

namespace {

enum class Kind { Number, Month, Weekday, AmPm, DateSep, Colon };

struct Token {
    Kind kind;
    int value = 0;   // number, month 1-12, or 0 for AM / 12 for PM
    int digits = 0;  // digits written, for numbers
};

const char* const kMonths[] = {"january", "february", "march",     "april",   "may",      "june",
                               "july",    "august",   "september", "october", "november", "december"};
const char* const kWeekdays[] = {"sunday",   "monday", "tuesday", "wednesday",
                                 "thursday", "friday", "saturday"};

// A full name or its three-letter abbreviation; 1-based index or 0.
template <std::size_t N>
int MatchName(const std::string& word, const char* const (&names)[N]) {
    for (std::size_t i = 0; i < N; ++i) {
        std::string name = names[i];
        if (word == name || word == name.substr(0, 3)) return static_cast<int>(i) + 1;
    }
    return 0;
}

std::optional<Token> WordToken(const std::string& word) {
    if (int month = MatchName(word, kMonths)) return Token{Kind::Month, month};
    if (MatchName(word, kWeekdays)) return Token{Kind::Weekday};
    if (word == "am") return Token{Kind::AmPm, 0};
    if (word == "pm") return Token{Kind::AmPm, 12};
    return std::nullopt;
}

// Splits the text into tokens; blanks, tabs and commas only separate. Empty on a character or
// word that no US-English date format uses.
std::optional<std::vector<Token>> Scan(const std::string& text) {
    std::vector<Token> tokens;
    std::size_t i = 0;
    while (i < text.size()) {
        unsigned char c = static_cast<unsigned char>(text[i]);
        if (std::isdigit(c)) {
            Token t{Kind::Number};
            for (; i < text.size() && std::isdigit(static_cast<unsigned char>(text[i])); ++i, ++t.digits) {
                if (t.digits == 9) return std::nullopt;
                t.value = t.value * 10 + (text[i] - '0');
            }
            tokens.push_back(t);
        } else if (std::isalpha(c)) {
            std::string word;
            for (; i < text.size() && std::isalpha(static_cast<unsigned char>(text[i])); ++i)
                word += static_cast<char>(std::tolower(static_cast<unsigned char>(text[i])));
            std::optional<Token> t = WordToken(word);
            if (!t) return std::nullopt;
            tokens.push_back(*t);
        } else if (c == '/' || c == '-' || c == ':') {
            tokens.push_back(Token{c == ':' ? Kind::Colon : Kind::DateSep});
            ++i;
        } else if (c == ' ' || c == '\t' || c == ',') {
            ++i;
        } else {
            return std::nullopt;
        }
    }
    return tokens;
}

struct Clock {
    int hour = 0, minute = 0, second = 0;
    int meridiem = -1;  // -1 none, 0 AM, 12 PM
};

struct Pieces {
    std::vector<Token> dateFields;  // numbers and month names, in text order
    std::optional<Clock> time;
};

// Reads h:mm[:ss] [AM|PM] or h AM|PM starting at tokens[i]; advances i past it.
std::optional<Clock> ReadTime(const std::vector<Token>& tokens, std::size_t& i) {
    auto is = [&](std::size_t k, Kind kind) { return k < tokens.size() && tokens[k].kind == kind; };
    Clock clock;
    clock.hour = tokens[i++].value;
    if (is(i, Kind::Colon)) {
        if (!is(i + 1, Kind::Number)) return std::nullopt;
        clock.minute = tokens[i + 1].value;
        i += 2;
        if (is(i, Kind::Colon)) {
            if (!is(i + 1, Kind::Number)) return std::nullopt;
            clock.second = tokens[i + 1].value;
            i += 2;
        }
    }
    if (is(i, Kind::AmPm)) clock.meridiem = tokens[i++].value;
    return clock;
}

// Sorts the tokens into the time group and the date fields. A date separator must stand
// between two date fields; a weekday name is skipped (its day is not checked).
std::optional<Pieces> Read(const std::vector<Token>& tokens) {
    Pieces pieces;
    bool afterField = false, needField = false;
    for (std::size_t i = 0; i < tokens.size();) {
        const Token& t = tokens[i];
        auto next = [&](Kind kind) { return i + 1 < tokens.size() && tokens[i + 1].kind == kind; };
        bool isTime = t.kind == Kind::Number && !needField && (next(Kind::Colon) || next(Kind::AmPm));
        if (isTime) {
            if (pieces.time) return std::nullopt;
            pieces.time = ReadTime(tokens, i);
            if (!pieces.time) return std::nullopt;
            afterField = false;
            continue;
        }
        if (t.kind == Kind::Number || t.kind == Kind::Month) {
            pieces.dateFields.push_back(t);
            afterField = true;
            needField = false;
        } else if (t.kind == Kind::DateSep && afterField) {
            afterField = false;
            needField = true;
        } else if (t.kind != Kind::Weekday || needField) {
            return std::nullopt;
        }
        ++i;
    }
    if (needField) return std::nullopt;
    return pieces;
}

// A field that can only be a year: three or more digits, or too large for a day.
bool YearLike(const Token& t) {
    return t.digits >= 3 || t.value > 31;
}

struct Ymd {
    int year, month, day;
    int yearDigits;
};

int CurrentYear() {
    return LocalTime().year;
}

// The fields when one of them is a month name.
std::optional<Ymd> NamedMonthDate(const std::vector<Token>& numbers, int month) {
    if (numbers.size() == 2) {
        const Token& a = numbers[0];
        const Token& b = numbers[1];
        if (YearLike(a)) return Ymd{a.value, month, b.value, a.digits};
        return Ymd{b.value, month, a.value, b.digits};
    }
    if (numbers.size() == 1) {
        const Token& a = numbers[0];
        if (YearLike(a)) return Ymd{a.value, month, 1, a.digits};
        return Ymd{CurrentYear(), month, a.value, 4};
    }
    return std::nullopt;
}

// The fields when all are numbers: month/day/year, day/month/year when the month cannot be
// one, or year/month/day when the first is a year.
std::optional<Ymd> NumericDate(const std::vector<Token>& n) {
    if (n.size() == 3) {
        if (YearLike(n[0])) return Ymd{n[0].value, n[1].value, n[2].value, n[0].digits};
        if (n[0].value > 12 && n[1].value <= 12) return Ymd{n[2].value, n[1].value, n[0].value, n[2].digits};
        return Ymd{n[2].value, n[0].value, n[1].value, n[2].digits};
    }
    if (n.size() == 2) {
        if (YearLike(n[1])) return Ymd{n[1].value, n[0].value, 1, n[1].digits};
        if (YearLike(n[0])) return Ymd{n[0].value, n[1].value, 1, n[0].digits};
        if (n[0].value > 12 && n[1].value <= 12) return Ymd{CurrentYear(), n[1].value, n[0].value, 4};
        return Ymd{CurrentYear(), n[0].value, n[1].value, 4};
    }
    return std::nullopt;
}

std::optional<Ymd> AssignDate(const std::vector<Token>& fields) {
    std::vector<Token> numbers;
    int month = 0;
    for (const Token& t : fields) {
        if (t.kind == Kind::Number) {
            numbers.push_back(t);
        } else if (month != 0) {
            return std::nullopt;
        } else {
            month = t.value;
        }
    }
    return month != 0 ? NamedMonthDate(numbers, month) : NumericDate(numbers);
}

bool IsLeap(int year) {
    return (year % 4 == 0 && year % 100 != 0) || year % 400 == 0;
}

int DaysInMonth(int year, int month) {
    static const int kDays[] = {31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
    return month == 2 && IsLeap(year) ? 29 : kDays[month - 1];
}

bool ValidDate(int year, int month, int day) {
    return year >= 100 && year <= 9999 && month >= 1 && month <= 12 && day >= 1 &&
           day <= DaysInMonth(year, month);
}

// 24-hour clock from the time group; nullopt when a field is out of range.
std::optional<Clock> To24Hour(Clock c) {
    if (c.minute > 59 || c.second > 59) return std::nullopt;
    if (c.meridiem < 0) return c.hour <= 23 ? std::optional<Clock>(c) : std::nullopt;
    if (c.hour > 12) return std::nullopt;
    c.hour = c.hour % 12 + c.meridiem;
    return c;
}

}  // namespace

bool ParseDateTime(const std::string& text, OleDateTime* result) {
    std::optional<std::vector<Token>> tokens = Scan(text);
    if (!tokens) return false;
    std::optional<Pieces> pieces = Read(*tokens);
    if (!pieces || (pieces->dateFields.empty() && !pieces->time)) return false;

    OleDateTime value;
    if (!pieces->dateFields.empty()) {
        std::optional<Ymd> date = AssignDate(pieces->dateFields);
        if (!date) return false;
        if (date->yearDigits <= 2) date->year += date->year < 30 ? 2000 : 1900;
        if (!ValidDate(date->year, date->month, date->day)) return false;
        value.year = date->year;
        value.month = date->month;
        value.day = date->day;
    }
    if (pieces->time) {
        std::optional<Clock> clock = To24Hour(*pieces->time);
        if (!clock) return false;
        value.hour = clock->hour;
        value.minute = clock->minute;
        value.second = clock->second;
    }
    *result = value;
    return true;
}

namespace {

// Days from 1970-01-01 to the given date in the proleptic Gregorian calendar.
std::int64_t DaysFromCivil(int y, int m, int d) {
    y -= m <= 2;
    const int era = (y >= 0 ? y : y - 399) / 400;
    const int yoe = y - era * 400;
    const int doy = (153 * (m + (m > 2 ? -3 : 9)) + 2) / 5 + d - 1;
    const int doe = yoe * 365 + yoe / 4 - yoe / 100 + doy;
    return static_cast<std::int64_t>(era) * 146097 + doe - 719468;
}

constexpr std::int64_t kDaysFrom1601To1970 = 134774;
constexpr std::uint64_t kTicksPerSecond = 10000000;

}  // namespace

bool ToFileTime(const OleDateTime& v, std::uint64_t* fileTime) {
    bool valid = v.year >= 1601 && v.year <= 30827 && v.month >= 1 && v.month <= 12 && v.day >= 1 &&
                 v.day <= DaysInMonth(v.year, v.month) && v.hour >= 0 && v.hour <= 23 &&
                 v.minute >= 0 && v.minute <= 59 && v.second >= 0 && v.second <= 59;
    if (!valid) {
        SetLastErrorCode(kErrorInvalidParameter);
        return false;
    }
    auto days = static_cast<std::uint64_t>(DaysFromCivil(v.year, v.month, v.day) + kDaysFrom1601To1970);
    auto seconds = days * 86400u + static_cast<std::uint64_t>(v.hour * 3600 + v.minute * 60 + v.second);
    *fileTime = seconds * kTicksPerSecond;
    return true;
}

}  // namespace plat
