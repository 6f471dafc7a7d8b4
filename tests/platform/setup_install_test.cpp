// Install at restart: a target in use (another opener holds it without sharing) is
// staged beside itself and queued in PendingFileRenameOperations in Windows' own layout.
// `pexupdate boot` carrying the queue out is the golden run pexupdate_boot.
#include "platform/setup_install.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "platform/cfile.h"
#include "platform/errors.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/registry.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"

namespace {

using namespace std::string_literals;
using plat::setup::PendingRename;

constexpr std::uint32_t kStyle = plat::setup::kCopySourceAbsolute | plat::setup::kCopyInUseNeedsReboot;

// How a program holds a file in use: open without sharing.
constexpr unsigned kHeld = plat::CFile::modeRead | plat::CFile::shareExclusive;

// The stored queue's bytes, or "<none>".
std::string StoredQueue(std::uint32_t* type) {
    std::string bytes;
    return pextest::GetRegValue(plat::reg::kLocalMachine, plat::setup::kSessionManagerKey,
                                plat::setup::kPendingRenamesValue, &bytes, type) ? bytes : "<none>";
}

// A free target is installed at once and nothing is queued; failures give the Windows codes.
TEST(SetupInstall, FreeTargetIsInstalledAtOnceAndFailuresAreReported) {
    pextest::TestMachine m;
    m.WriteFile("C:\\dl\\new.dll", "new");
    m.WriteFile("C:\\app\\a.dll", "old");
    bool inUse = true;
    ASSERT_TRUE(plat::setup::InstallFile("C:\\dl\\new.dll", "C:\\app\\a.dll", kStyle, &inUse));
    EXPECT_FALSE(inUse);
    EXPECT_EQ(m.ReadFile("C:\\app\\a.dll"), "new");
    std::uint32_t type = 0;
    EXPECT_EQ(StoredQueue(&type), "<none>");

    inUse = true;
    EXPECT_FALSE(plat::setup::InstallFile("C:\\dl\\missing.dll", "C:\\app\\x.dll", kStyle, &inUse));
    EXPECT_EQ(plat::LastError(), 2u);
    EXPECT_FALSE(inUse);
    ASSERT_TRUE(plat::files::SetAttributes("C:\\app\\a.dll", plat::files::kAttrReadOnly));
    EXPECT_FALSE(plat::setup::InstallFile("C:\\dl\\new.dll", "C:\\app\\a.dll", kStyle, &inUse));
    EXPECT_EQ(plat::LastError(), 5u);

    // Without the in-use style a target in use is a plain failure.
    plat::CFile lock;
    ASSERT_TRUE(lock.Open("C:\\app\\a.dll", kHeld));
    ASSERT_TRUE(plat::files::SetAttributes("C:\\app\\a.dll", plat::files::kAttrNormal));
    EXPECT_FALSE(plat::setup::InstallFile("C:\\dl\\new.dll", "C:\\app\\a.dll", 0, &inUse));
    EXPECT_EQ(plat::LastError(), 32u);
}

TEST(SetupInstall, QueueLayoutRoundTrips) {
    std::vector<PendingRename> queue{{"C:\\a.tmp", "C:\\a.dll", true},
                                     {"C:\\old.log", "", false},
                                     {"C:\\b.tmp", "C:\\b.dll", false}};
    std::string data = plat::setup::EncodePendingRenames(queue);
    EXPECT_EQ(data, "\\??\\C:\\a.tmp\0!\\??\\C:\\a.dll\0\\??\\C:\\old.log\0\0"
                    "\\??\\C:\\b.tmp\0\\??\\C:\\b.dll\0\0"s);
    std::vector<PendingRename> back = plat::setup::DecodePendingRenames(data);
    ASSERT_EQ(back.size(), 3u);
    EXPECT_EQ(back[1].from, "C:\\old.log");
    EXPECT_EQ(back[1].to, "");
    EXPECT_TRUE(back[0].replace);
    EXPECT_FALSE(back[2].replace);
    EXPECT_EQ(back[2].to, "C:\\b.dll");
}

}  // namespace
