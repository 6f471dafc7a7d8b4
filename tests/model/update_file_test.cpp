// CFile_ on an emulated machine: backups beside older ones, install commands, the setup
// fallback, and rollbacks that never lose the previous version. Whole runs cover the rest.
#include "model/update_file.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

using Lines = std::vector<std::string>;

constexpr char kDownload[] = "C:\\Cache\\a.dll";
constexpr char kTarget[] = "C:\\App\\Sub\\a.dll";
constexpr char kBackup[] = "C:\\App\\Sub\\a.dll.$bak$";
const std::string kOlderBackup = std::string(kBackup) + "x";  // beside a backup already there

class UpdateFile : public ::testing::Test {
protected:
    void SetUp() override { machine.WriteFile(kDownload, "new"); }
    void TearDown() override { plat::fault::Clear(); }

    // Row 7, installed into C:\App\Sub; the directory in the file name is not used.
    static CFile_ Make(const std::string& command = "", const std::string& date = "") {
        return CFile_(7, true, false, "C:\\App\\Sub", "Dist\\a.dll", kDownload, command, date,
                      false, 0);
    }
    std::string Read(const std::string& path) const { return machine.ReadFile(path); }
    static bool Exists(const std::string& path) { return plat::files::Exists(path); }

    pextest::TestMachine machine;
    pextest::TraceCapture trace;
};

TEST_F(UpdateFile, ExistingTargetIsBackedUpBesideAnyOlderBackupAndRestored) {
    machine.WriteFile(kTarget, "old");
    machine.WriteFile(kBackup, "someone else's");
    CFile_ file = Make();
    EXPECT_EQ(1, file.Apply());
    EXPECT_EQ("new", Read(kTarget));
    EXPECT_EQ("old", Read(kOlderBackup));

    EXPECT_TRUE(file.Rollback());
    EXPECT_EQ("old", Read(kTarget));
    EXPECT_FALSE(Exists(kOlderBackup));
    EXPECT_EQ("someone else's", Read(kBackup));
}

// Result 4 leaves the new file in place, not applied; Rollback still puts the old one back.
TEST_F(UpdateFile, AFailedCommandIsUndone) {
    machine.WriteFile(kTarget, "old");
    for (const char* command : {"[DEL] missing.txt", "[TRY-DEL] missing.txt"}) {
        SCOPED_TRACE(command);
        trace.Clear();
        CFile_ file = Make(command);
        EXPECT_EQ(4, file.Apply());
        EXPECT_EQ("new", Read(kTarget));
        EXPECT_FALSE(file.IsApplied());
        EXPECT_EQ(command[1] == 'D', trace.Contains("CFile_: Command execution threw error"));
        EXPECT_FALSE(file.RemoveBackupFile());  // the only copy of "old"
        EXPECT_TRUE(file.Rollback());
        EXPECT_EQ("old", Read(kTarget));
        EXPECT_FALSE(Exists(kBackup));
    }

    EXPECT_EQ(1, Make("   ").Apply());  // blanks are run, and find nothing to do
    EXPECT_TRUE(trace.Contains("CFile_: Command(s) found:    "));
}

TEST_F(UpdateFile, SetupFallbackCountsAsNotAppliedButIsUndoneWhenItInstalled) {
    plat::fault::FailNth(plat::fault::Op::Copy, 1, plat::kErrorAccessDenied);
    CFile_ file = Make();
    EXPECT_EQ(0, file.Apply());
    EXPECT_EQ("new", Read(kTarget));
    EXPECT_TRUE(trace.Contains("CFile_: SetupInstallFileEx succeeded."));
    EXPECT_TRUE(file.Rollback());
    EXPECT_FALSE(Exists(kTarget));

    CFile_ missing(8, true, false, "C:\\App\\Sub", "b.dll", "C:\\Cache\\b.dll", "", "", false, 0);
    EXPECT_EQ(0, missing.Apply());
    EXPECT_TRUE(trace.Contains("CFile_: SetupInstallFileEx failed, error code is 2"));
}

// A file under a backup's name that this run did not make is never taken for its own, whatever
// its bytes: a target already at the new version beside an older backup keeps that version on
// rollback, and the older backup stays as it is.
TEST_F(UpdateFile, AFileUnderABackupsNameIsNeverAdoptedOrRemoved) {
    machine.WriteFile(kTarget, "new");
    machine.WriteFile(kBackup, "older");
    CFile_ file = Make();
    EXPECT_EQ(1, file.Apply());
    EXPECT_EQ("new", Read(kOlderBackup));
    EXPECT_TRUE(file.Rollback());
    EXPECT_EQ("new", Read(kTarget));
    EXPECT_EQ("older", Read(kBackup));
    EXPECT_FALSE(Exists(kOlderBackup));
}

// A read-only download is removed all the same; a download that is the target itself never is.
TEST_F(UpdateFile, RemovingTheDownload) {
    ASSERT_TRUE(plat::files::SetAttributes(kDownload, plat::files::kAttrReadOnly));
    CFile_ file = Make();
    EXPECT_TRUE(file.Remove());
    EXPECT_FALSE(Exists(kDownload));

    machine.WriteFile("C:\\App\\a.dll", "installed");
    CFile_ itself(1, true, true, "C:\\App", "a.dll", "c:\\app\\A.DLL", "", "", false, 0);
    EXPECT_FALSE(itself.Remove());
    EXPECT_EQ("installed", Read("C:\\App\\a.dll"));
}

}  // namespace
