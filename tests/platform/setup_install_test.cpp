// Install at restart: a target in use (another opener holds it without sharing) is
// staged beside itself and queued in PendingFileRenameOperations in Windows' own layout;
// `pexupdate boot` carries the queue out.
#include "platform/setup_install.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "platform/cfile.h"
#include "platform/errors.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "platform/process.h"
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

long Boot() {
    plat::proc::Process p;
    if (!plat::proc::Start("pexupdate boot", "", &p)) return -1;
    plat::proc::Wait(p, plat::proc::kInfinite);
    std::uint32_t code = 0;
    plat::proc::ExitCode(p, &code);
    return static_cast<long>(code);
}

TEST(SetupInstall, FailedRenameStaysQueuedAndNothingElseIsLost) {
    pextest::TestMachine m;
    m.WriteFile("C:\\app\\gone.tmp", "");
    m.WriteFile("C:\\app\\staged.tmp", "new b");
    m.WriteFile("C:\\app\\a.dll", "old a");
    m.WriteFile("C:\\app\\b.dll", "old b");
    ASSERT_TRUE(plat::files::Remove("C:\\app\\gone.tmp"));
    ASSERT_EQ(plat::setup::QueuePendingRename({"C:\\app\\gone.tmp", "C:\\app\\a.dll", true}), 0);
    ASSERT_EQ(plat::setup::QueuePendingRename({"C:\\app\\staged.tmp", "C:\\app\\b.dll", true}), 0);

    EXPECT_EQ(Boot(), 1);
    EXPECT_EQ(m.ReadFile("C:\\app\\a.dll"), "old a");
    EXPECT_EQ(m.ReadFile("C:\\app\\b.dll"), "new b");
    EXPECT_FALSE(plat::files::Exists("C:\\app\\staged.tmp"));
    std::uint32_t type = 0;
    EXPECT_EQ(StoredQueue(&type), "\\??\\C:\\app\\gone.tmp\0!\\??\\C:\\app\\a.dll\0\0"s);
    EXPECT_EQ(type, plat::reg::kRegMultiSz);
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
