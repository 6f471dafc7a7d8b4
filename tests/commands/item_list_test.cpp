#include "commands/item_list.h"

#include <gtest/gtest.h>

namespace {

using Items = std::vector<std::string>;

// Blanks, tabs and line feeds are trimmed, carriage returns kept; empty items count only
// before more text.
TEST(ItemList, SplitsTrimsAndDropsTrailingEmptyItems) {
    EXPECT_EQ(SplitItemList("[RUN] a.exe; [DEL] b.txt; \t\n"), (Items{"[RUN] a.exe", "[DEL] b.txt"}));
    EXPECT_EQ(SplitItemList("a;;"), (Items{"a"}));
    EXPECT_EQ(SplitItemList(" \t\n"), Items{});
    EXPECT_EQ(SplitItemList(";a; ;b"), (Items{"", "a", "", "b"}));
    EXPECT_EQ(SplitItemList(" \ta \n;\r b\r"), (Items{"a", "\r b\r"}));
    EXPECT_EQ(SplitItemList("x, y,z;w", ','), (Items{"x", "y", "z;w"}));
}

}  // namespace
