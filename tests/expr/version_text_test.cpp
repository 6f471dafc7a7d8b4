#include "expr/version_text.h"

#include <gtest/gtest.h>

namespace {

struct Words {
    bool ok;
    std::uint32_t ms, ls;
};

Words Parse(const std::string& text) {
    Words w{false, 0, 0};
    w.ok = ParseVersionText(text, &w.ms, &w.ls);
    return w;
}

TEST(VersionText, FourPartsMakeTwoWords) {
    Words w = Parse("4.1.2.3");
    EXPECT_TRUE(w.ok);
    EXPECT_EQ(w.ms, 0x00040001u);
    EXPECT_EQ(w.ls, 0x00020003u);
    w = Parse("1.2.3.4.5");  // the fourth part runs to the end and reads as 4
    EXPECT_TRUE(w.ok);
    EXPECT_EQ(w.ls, 0x00030004u);
    w = Parse("7b.0..65535");  // a non-zero part is taken as read; an empty part is 0
    EXPECT_TRUE(w.ok);
    EXPECT_EQ(w.ms, 0x00070000u);
    EXPECT_EQ(w.ls, 0x0000FFFFu);
}

TEST(VersionText, RefusedTexts) {
    EXPECT_FALSE(Parse("1.2.3").ok);
    EXPECT_FALSE(Parse("1.0.0.x").ok);
    EXPECT_FALSE(Parse("a.1.1.1").ok);
    EXPECT_FALSE(Parse("1. 0.0.0").ok);
    EXPECT_FALSE(Parse("").ok);
}

}  // namespace
