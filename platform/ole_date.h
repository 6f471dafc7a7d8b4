// Date and time texts as the framework's COleDateTime::ParseDateTime reads them with locale
// 0x0409 (English, United States), and the conversion of the result to a file time.
#pragma once
#include <cstdint>
#include <string>

namespace plat {

// A calendar date and clock time. A text that holds only a time gives the framework's day
// zero, 30 December 1899.
struct OleDateTime {
    int year = 1899, month = 12, day = 30;
    int hour = 0, minute = 0, second = 0;
};

// ParseDateTime (no flags, locale 0x0409). Accepts, with blanks and commas between the parts:
//   month/day/year and month-day-year, or day/month/year when the first number cannot be a
//     month and the second can (31/12/2003);
//   year/month/day and year-month-day when the first number has three or more digits or
//     exceeds 31;
//   month names and their three-letter abbreviations, before or after the day
//     (Dec 31, 2003 / 31 Dec 2003), optionally after a weekday name (Wed, 31 Dec 2003);
//   month and year alone (12/2003, Dec 2003: the first day of the month), month and day alone
//     (the current year);
//   a time h:mm or h:mm:ss, 24-hour or 12-hour with AM/PM (also "10 PM"), before or after
//     the date; a time alone falls on 30 December 1899.
// Two-digit years 00-29 are 2000-2029, 30-99 are 1930-1999. Years 100-9999 only; a field out
// of range (month 13, 30 February, hour 25, minute 60) rejects the text, as does any other
// character, a '.' included (so no fractions of a second and no ISO "T").
// True and *result filled on success; false with *result unchanged otherwise.
bool ParseDateTime(const std::string& text, OleDateTime* result);

// SystemTimeToFileTime of the value: 100-nanosecond intervals since 1601-01-01, the clock time
// taken as universal time. False with last error 87 for a date before 1601 (1/1/100 parses
// but has no file time) or a field out of range.
bool ToFileTime(const OleDateTime& value, std::uint64_t* fileTime);

}  // namespace plat
