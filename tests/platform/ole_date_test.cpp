// The date parser against the texts Windows accepts and rejects with locale 0x0409, and the
// conversion to a file time that update files are stamped with.
#include "platform/ole_date.h"

#include <gtest/gtest.h>

#include "platform/errors.h"

namespace {

using plat::OleDateTime;

struct Accepted {
    const char* text;
    OleDateTime value;
};

std::string Show(const OleDateTime& v) {
    char text[64];
    std::snprintf(text, sizeof text, "%04d-%02d-%02d %02d:%02d:%02d", v.year, v.month, v.day, v.hour,
                  v.minute, v.second);
    return text;
}

constexpr OleDateTime kNewYearsEve{2003, 12, 31, 0, 0, 0};
constexpr OleDateTime kNewYearsEveLate{2003, 12, 31, 22, 30, 0};

const Accepted kAccepted[] = {
    // As Windows reads them.
    {"12/31/2003 10:30:00 PM", kNewYearsEveLate}, {"2003-12-31 22:30:00", kNewYearsEveLate},
    {"Dec 31, 2003", kNewYearsEve}, {"31 Dec 2003", kNewYearsEve},
    {"2003/12/31", kNewYearsEve}, {"12-31-2003", kNewYearsEve},
    {"12/31/03", kNewYearsEve}, {"31/12/2003", kNewYearsEve},
    {"December 31 2003 10:30 pm", kNewYearsEveLate}, {"Wed, 31 Dec 2003 22:30:00", kNewYearsEveLate},
    {"10:30", {1899, 12, 30, 10, 30, 0}}, {"10:30 AM", {1899, 12, 30, 10, 30, 0}},
    {"22:30:15", {1899, 12, 30, 22, 30, 15}}, {"2004-02-29", {2004, 2, 29, 0, 0, 0}},
    {"12/31/9999", {9999, 12, 31, 0, 0, 0}}, {"1/1/100", {100, 1, 1, 0, 0, 0}},
    {"12/31/1600", {1600, 12, 31, 0, 0, 0}}, {"1/1/99", {1999, 1, 1, 0, 0, 0}},
    {"1/2/29", {2029, 1, 2, 0, 0, 0}}, {"1/2/30", {1930, 1, 2, 0, 0, 0}},
    {"1/2/00", {2000, 1, 2, 0, 0, 0}},
    // The same formats in the other combinations the locale allows.
    {"10:30 PM 12/31/2003", kNewYearsEveLate}, {"31-Dec-2003 10:30PM", kNewYearsEveLate},
    {"december 31, 2003 10 PM", {2003, 12, 31, 22, 0, 0}}, {"Dec 2003", {2003, 12, 1, 0, 0, 0}},
    {"12/2003", {2003, 12, 1, 0, 0, 0}}, {"  12/31/2003\t", kNewYearsEve},
    {"12/31/2003 12:00:00 AM", {2003, 12, 31, 0, 0, 0}}, {"12/31/2003 12:15 PM", {2003, 12, 31, 12, 15, 0}},
    {"99-12-31", {1999, 12, 31, 0, 0, 0}}, {"12/11/2003", {2003, 12, 11, 0, 0, 0}},
    {"2003/12", {2003, 12, 1, 0, 0, 0}}, {"99/12", {1999, 12, 1, 0, 0, 0}},
};

TEST(OleDateParse, AcceptsTheTextsWindowsAccepts) {
    for (const Accepted& a : kAccepted) {
        OleDateTime value;
        EXPECT_TRUE(plat::ParseDateTime(a.text, &value)) << a.text;
        EXPECT_EQ(Show(value), Show(a.value)) << a.text;
    }
}

// Without a year the date falls in the current year (the clock's, so not checked here); month and
// day follow the same rules as with one.
TEST(OleDateParse, DatesWithoutAYear) {
    const struct { const char* text; int month, day; } cases[] = {
        {"12/11", 12, 11}, {"13/12", 12, 13}, {"12/13", 12, 13}, {"Dec 13", 12, 13}};
    for (const auto& c : cases) {
        OleDateTime value;
        ASSERT_TRUE(plat::ParseDateTime(c.text, &value)) << c.text;
        EXPECT_EQ(value.month * 100 + value.day, c.month * 100 + c.day) << c.text;
    }
}

TEST(OleDateParse, RejectsTheTextsWindowsRejects) {
    const char* const rejected[] = {
        // As Windows rejects them.
        "12.31.2003", "13/31/2003", "2/30/2003", "2003-02-29", "12/31/2003 25:00", "yesterday", "",
        "2003-12-31T22:30:00", "12/31/2003 10:30:00.5", "0/0/0",
        // Fields out of range and malformed texts.
        "12/31/2003 10:60", "12/31/2003 10:30:60", "12/31/2003 13:00 PM", "1/1/10000", "12//2003",
        "/12/31/2003", "12/31/2003-", "Dec Jan 2003", "12/31/2003 10:30 11:30", "1/2/3/4", "2003",
        "PM", "Dec 31 2003 x", "   ", "12/31/2003 10:", "Wed"};
    for (const char* text : rejected) {
        OleDateTime value{1, 2, 3, 4, 5, 6};
        EXPECT_FALSE(plat::ParseDateTime(text, &value)) << '"' << text << '"';
        EXPECT_EQ(Show(value), Show(OleDateTime{1, 2, 3, 4, 5, 6})) << "changed by " << text;
    }
}

// Clock time is taken as universal time; dates before 1601 have no file time.
TEST(OleDateFileTime, ClockTimeIsUniversalTimeFrom1601On) {
    std::uint64_t fileTime = 0, before = 0, after = 0;
    ASSERT_TRUE(plat::ToFileTime(kNewYearsEveLate, &fileTime));
    EXPECT_EQ(fileTime, 127173834000000000ULL);  // 2003-12-31 22:30:00 UTC
    ASSERT_TRUE(plat::ToFileTime({1601, 1, 1, 0, 0, 0}, &fileTime));
    EXPECT_EQ(fileTime, 0u);
    ASSERT_TRUE(plat::ToFileTime({2004, 2, 28, 0, 0, 0}, &before));
    ASSERT_TRUE(plat::ToFileTime({2004, 3, 1, 0, 0, 0}, &after));
    EXPECT_EQ(after - before, 2 * 86400 * 10000000ULL);  // the leap day lies between

    fileTime = 7;
    EXPECT_FALSE(plat::ToFileTime({1600, 12, 31, 0, 0, 0}, &fileTime));
    EXPECT_EQ(plat::LastError(), plat::kErrorInvalidParameter);
    EXPECT_EQ(fileTime, 7u);
    EXPECT_FALSE(plat::ToFileTime({2003, 2, 29, 0, 0, 0}, &fileTime));
}

}  // namespace
