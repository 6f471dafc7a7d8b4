#include "commands/item_list.h"

#include <gtest/gtest.h>

#include "tests/support/case_file.h"

TEST(ItemList, SplitsTrimsAndDropsTrailingEmptyItems) {
    for (const pextest::Case& c : pextest::ReadCases("commands/cases/item_lists.txt")) {
        SCOPED_TRACE(c.where);
        std::vector<std::string> items;
        for (std::size_t i = 2; i < c.fields.size(); ++i) items.push_back(pextest::Unescape(c[i]));
        EXPECT_EQ(SplitItemList(pextest::Unescape(c[1]), c[0][0]), items);
    }
}
