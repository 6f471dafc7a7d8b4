// The COM string stand-in: narrow texts survive the trip through the wide form byte for byte.
#include "platform/bstr.h"

#include <gtest/gtest.h>

#include <cstring>

namespace {

TEST(BstrTest, EveryByteRoundTripsNarrowWideNarrow) {
    std::string all;
    for (int b = 0; b < 256; ++b) all += static_cast<char>(b);
    _bstr_t text(all);
    EXPECT_EQ(text.length(), 256u);
    EXPECT_EQ(static_cast<std::string>(text), all);
    for (int b = 0; b < 256; ++b) EXPECT_EQ(static_cast<int>(text.wide()[b]), b);

    // Through a C string every byte but NUL, which ends it.
    _bstr_t fromC(all.c_str() + 1);
    EXPECT_EQ(fromC.length(), 255u);
    EXPECT_EQ(std::strcmp(static_cast<const char*>(fromC), all.c_str() + 1), 0);
}

TEST(BstrTest, WideOnlyCharactersNullAndConcatenation) {
    _bstr_t wide(L"\u20AC1");  // a character outside the narrow range
    EXPECT_EQ(std::string(wide), "?1");

    _bstr_t none(static_cast<const char*>(nullptr));
    EXPECT_EQ(none.length(), 0u);
    EXPECT_STREQ(static_cast<const char*>(none), "");
    EXPECT_EQ(std::string(_bstr_t("ab") + _bstr_t(L"cd")), "abcd");
    EXPECT_TRUE(_bstr_t("ab") == _bstr_t(L"ab"));
}

}  // namespace
