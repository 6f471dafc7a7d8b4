// Hostile sizes: a huge cell, a line of a million separators, a million tiny rows (short rows
// under a header too wide are refused at its line: content_table_test's bounds). Each load runs
// in a child process under an address-space limit, so that a load whose memory grows faster than
// its input fails the test instead of passing on a machine with room to spare.
#include <gtest/gtest.h>

#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <functional>
#include <string>

#include "manifest/content_table.h"

namespace {

#if defined(__SANITIZE_ADDRESS__)
constexpr bool kSanitized = true;  // the sanitizer reserves terabytes of address space
#else
constexpr bool kSanitized = false;
#endif

// Runs check in a child limited to 1 GiB of address space; true when it returned true.
bool InLimitedChild(const std::function<bool()>& check) {
    const pid_t child = fork();
    if (child == 0) {
        const rlimit limit{1ull << 30, 1ull << 30};
        _exit(setrlimit(RLIMIT_AS, &limit) == 0 && check() ? 0 : 1);
    }
    int status = 0;
    return child > 0 && waitpid(child, &status, 0) == child && WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

constexpr char kHeader[] = "FileName,UpgradeStatus\r\n";

TEST(ContentTableLimits, HugeInputsLoadOrFailWithinMemoryLinearInTheirSize) {
    if (kSanitized) GTEST_SKIP() << "address-space limits do not apply under the address sanitizer";
    EXPECT_TRUE(InLimitedChild([] {
        const std::size_t size = CContentTable::kMaxFileBytes - 64;
        std::string text = kHeader + std::string(size, 'c') + ",Downloaded\r\n";
        CContentTable table;
        return table.LoadFromText(text) == CContentTable::kOk && table.Cell(0, 0).size() == size;
    })) << "a cell of 64 MiB";
    EXPECT_TRUE(InLimitedChild([] {
        CContentTable table;
        return table.LoadFromText(kHeader + std::string(1000000, ',') + "x\r\n") < 0;
    })) << "a row of a million separators";
    EXPECT_TRUE(InLimitedChild([] {
        CContentTable table;
        return table.LoadFromText(std::string(1000000, ',') + "\r\nx\r\n") < 0;
    })) << "a header of a million separators";
    EXPECT_TRUE(InLimitedChild([] {
        std::string text = kHeader;
        for (int row = 0; row < 1000000; ++row) text += "x\n";
        CContentTable table;
        return table.LoadFromText(text) == CContentTable::kOk && table.RowCount() == 1000000;
    })) << "a million rows of one byte";
}

}  // namespace
