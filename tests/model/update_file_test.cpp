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

// One decompressor serves every file of the process; a failure leaves the file to decompress.
TEST_F(UpdateFile, DecompressesInPlaceThroughOneSharedDecompressor) {
    CFile_ patch(2, true, false, "C:\\App", "a.dll", kDownload, "", "", true, 3);
    EXPECT_FALSE(patch.Decompress(nullptr));
    EXPECT_TRUE(patch.IsDecompressionNeeded());
    EXPECT_TRUE(trace.Contains("CFile_::Decompress, creating Decompressor"));
    EXPECT_TRUE(trace.Contains("CFile_::Decompress return value is 0"));

    trace.Clear();
    CFile_ plain(1, true, false, "C:\\App", "a.dll", kDownload, "", "", true, 0);  // None: no expansion
    EXPECT_FALSE(plain.Decompress(nullptr));
    EXPECT_TRUE(plain.IsDecompressionNeeded());
    EXPECT_FALSE(trace.Contains("CFile_::Decompress, creating Decompressor"));
}

TEST_F(UpdateFile, ExistingTargetIsBackedUpBesideAnyOlderBackupAndRestored) {
    machine.WriteFile(kTarget, "old");
    machine.WriteFile(kBackup, "someone else's");
    CFile_ file = Make();
    EXPECT_EQ(1, file.Apply());
    EXPECT_EQ("new", Read(kTarget));
    EXPECT_EQ("old", Read(kOlderBackup));
    EXPECT_TRUE(trace.Contains("CFile_: MakeBackupFileName, about to try 'C:\\App\\Sub\\a.dll.$bak$x'"));

    EXPECT_TRUE(file.Rollback());
    EXPECT_EQ("old", Read(kTarget));
    EXPECT_FALSE(Exists(kOlderBackup));
    EXPECT_EQ("someone else's", Read(kBackup));
}

TEST_F(UpdateFile, AFailedBackupLeavesAReadOnlyTargetAlone) {
    machine.WriteFile(kTarget, "old");
    ASSERT_TRUE(plat::files::SetAttributes(kTarget, plat::files::kAttrReadOnly));
    CFile_ file = Make();
    plat::fault::FailNth(plat::fault::Op::Copy, 1, plat::kErrorDiskFull);
    EXPECT_EQ(0, file.Apply());
    EXPECT_EQ("old", Read(kTarget));
    EXPECT_TRUE(trace.Contains(
        "CFile_: Backup of file Dist\\a.dll to C:\\App\\Sub\\a.dll.$bak$ failed, reason code is 112"));
    EXPECT_TRUE(file.Rollback());  // nothing to undo
    EXPECT_EQ("old", Read(kTarget));
}

// Result 4 leaves the new file in place, not applied; Rollback still puts the old one back.
TEST_F(UpdateFile, CommandsRunInTheHomeDirectoryAndTheirFailureIsUndone) {
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

    machine.WriteFile("C:\\App\\Sub\\old.txt", "x");
    EXPECT_EQ(1, Make("[DEL] old.txt").Apply());
    EXPECT_FALSE(Exists("C:\\App\\Sub\\old.txt"));
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

// A restore that fails keeps the backup through every later step until a restore succeeds; a
// deletion of a new target that fails is retried by the next rollback.
TEST_F(UpdateFile, FailedRollbacksNeverLoseThePreviousVersionAndAreRetried) {
    machine.WriteFile(kTarget, "old");
    CFile_ file = Make();
    ASSERT_EQ(1, file.Apply());
    plat::fault::FailNth(plat::fault::Op::Copy, 1, plat::kErrorSharingViolation);
    EXPECT_FALSE(file.Rollback());
    plat::fault::Clear();
    EXPECT_FALSE(file.IsApplied());
    EXPECT_TRUE(trace.Contains("CFile_: Rollback failed, retrying, error code is 32"));

    // The clean-up's RemoveBackupFile and a retried Apply both leave the backup alone.
    EXPECT_FALSE(file.RemoveBackupFile());
    EXPECT_EQ(1, file.Apply());
    EXPECT_EQ("old", Read(kBackup));
    EXPECT_TRUE(file.Rollback());
    EXPECT_EQ("old", Read(kTarget));
    EXPECT_FALSE(Exists(kBackup));

    CFile_ added(8, true, false, "C:\\App\\Sub", "b.dll", kDownload, "", "", false, 0);
    ASSERT_EQ(1, added.Apply());
    plat::fault::FailNth(plat::fault::Op::Remove, 1, plat::kErrorSharingViolation);
    EXPECT_FALSE(added.Rollback());
    plat::fault::Clear();
    EXPECT_TRUE(added.Rollback());
    EXPECT_FALSE(Exists("C:\\App\\Sub\\b.dll"));
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

// A rollback gives the target back the read-only attribute and the times it had.
TEST_F(UpdateFile, ARollbackRestoresAttributesAndTimes) {
    machine.WriteFile(kTarget, "old");
    constexpr plat::files::FileTime kWritten = 126000000000000000ull;
    ASSERT_TRUE(plat::files::SetTimes(kTarget, 0, 0, kWritten));
    ASSERT_TRUE(plat::files::SetAttributes(kTarget, plat::files::kAttrReadOnly));
    CFile_ file = Make();
    ASSERT_EQ(1, file.Apply());
    EXPECT_EQ(0u, plat::files::GetAttributes(kTarget) & plat::files::kAttrReadOnly);
    EXPECT_TRUE(file.Rollback());
    EXPECT_EQ("old", Read(kTarget));
    plat::files::FileStatus status;
    ASSERT_TRUE(plat::files::GetStatus(kTarget, &status));
    EXPECT_NE(0u, status.attributes & plat::files::kAttrReadOnly);
    EXPECT_EQ(kWritten, status.lastWrite);
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
