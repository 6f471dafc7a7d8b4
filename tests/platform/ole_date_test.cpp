// The date parser against the texts Windows accepts and rejects with locale 0x0409, and the
// conversion to a file time that update files are stamped with.
#include "platform/ole_date.h"

#include <gtest/gtest.h>

#include "platform/errors.h"
#include "tests/support/case_file.h"

namespace {

using plat::OleDateTime;

std::string Show(const OleDateTime& v) {
    char text[64];
    std::snprintf(text, sizeof text, "%04d-%02d-%02d %02d:%02d:%02d", v.year, v.month, v.day, v.hour,
                  v.minute, v.second);
    return text;
}

// What a text reads as, in the form of the case file: the date, "--mm-dd" for a text without a
// year (it falls in the clock's year), or "rejected", in which case the value must be untouched.
void ExpectRead(const std::string& text, const std::string& expected) {
    const OleDateTime untouched{1, 2, 3, 4, 5, 6};
    OleDateTime value = untouched;
    const bool accepted = plat::ParseDateTime(text, &value);
    if (expected == "rejected") {
        EXPECT_FALSE(accepted);
        EXPECT_EQ(Show(value), Show(untouched));
    } else if (expected.rfind("--", 0) == 0) {
        ASSERT_TRUE(accepted);
        EXPECT_EQ("--" + Show(value).substr(5, 5), expected);
    } else {
        EXPECT_TRUE(accepted);
        EXPECT_EQ(Show(value), expected);
    }
}

TEST(OleDateParse, ReadsTheTextsAsWindowsDoes) {
    for (const pextest::Case& c : pextest::ReadCases("platform/cases/ole_dates.txt")) {
        SCOPED_TRACE(c.where);
        ExpectRead(pextest::Unescape(c[0]), c[1]);
    }
    ExpectRead("", "rejected");  // a line of the case file cannot hold the empty text
}

// Clock time is taken as universal time; dates before 1601 have no file time.
TEST(OleDateFileTime, ClockTimeIsUniversalTimeFrom1601On) {
    std::uint64_t fileTime = 0, before = 0, after = 0;
    ASSERT_TRUE(plat::ToFileTime({2003, 12, 31, 22, 30, 0}, &fileTime));
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
