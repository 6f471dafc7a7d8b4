// CFile_ on an emulated machine: installing over an absent, present, read-only and in-use
// target, the date stamp, install commands, and rollbacks that never lose the previous version.
#include "model/update_file.h"

#include <gtest/gtest.h>
#include <zlib.h>

#include <string>
#include <vector>

#include "platform/cfile.h"
#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "platform/setup_install.h"
#include "tests/support/platform_guard.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

using Lines = std::vector<std::string>;

constexpr char kDownload[] = "C:\\Cache\\a.dll";
constexpr char kTarget[] = "C:\\App\\Sub\\a.dll";
constexpr char kBackup[] = "C:\\App\\Sub\\a.dll.$bak$";

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
    const std::string plain(4000, 'p');
    std::string packed(compressBound(plain.size()), '\0');
    uLongf size = packed.size();
    ASSERT_EQ(Z_OK, compress(reinterpret_cast<Bytef*>(packed.data()), &size,
                             reinterpret_cast<const Bytef*>(plain.data()), plain.size()));
    machine.WriteFile(kDownload, packed.substr(0, size));
    CFile_ zlib(1, true, false, "C:\\App", "a.dll", kDownload, "", "", true, 2);
    EXPECT_TRUE(zlib.Decompress(nullptr));
    EXPECT_FALSE(zlib.IsDecompressionNeeded());
    EXPECT_EQ(plain, Read(kDownload));
    EXPECT_TRUE(trace.Contains("CFile_::Decompress, creating Decompressor"));

    trace.Clear();
    CFile_ patch(2, true, false, "C:\\App", "a.dll", kDownload, "", "", true, 3);
    EXPECT_FALSE(patch.Decompress(nullptr));
    EXPECT_TRUE(patch.IsDecompressionNeeded());
    EXPECT_FALSE(trace.Contains("CFile_::Decompress, creating Decompressor"));
    EXPECT_TRUE(trace.Contains("CFile_::Decompress return value is 0"));
}

TEST_F(UpdateFile, NewTargetNeedsNoBackupAndItsRollbackDeletesIt) {
    CFile_ file = Make();
    trace.Clear();
    EXPECT_EQ(1, file.Apply());
    EXPECT_EQ("new", Read(kTarget));
    EXPECT_EQ(trace.Lines(), (Lines{
        "CFile_: Apply",
        "CFile_: Applying file 'Dist\\a.dll'",
        "CFile_: Backup not needed, no instance of target file on system to back up...",
        "CFile_: Copy successful, source is (C:\\Cache\\a.dll), target is (C:\\App\\Sub\\a.dll)",
        "CFile_: SetFileDateTime, Unable to parse provided date time string ''",
        "CFile_: No Commands found",
        "CFile_: return value is 1",
    }));
    machine.WriteFile(kDownload, "newer");
    EXPECT_EQ(1, file.Apply());  // applied once is applied: nothing is copied again
    EXPECT_EQ("new", Read(kTarget));

    EXPECT_TRUE(file.Rollback());
    EXPECT_FALSE(Exists(kTarget));
    EXPECT_TRUE(trace.Contains("CFile_: No backup file name, removing original"));
    EXPECT_TRUE(file.Remove());
    EXPECT_FALSE(Exists(kDownload));
}

TEST_F(UpdateFile, ExistingTargetIsBackedUpBesideAnyOlderBackupAndRestored) {
    machine.WriteFile(kTarget, "old");
    machine.WriteFile(kBackup, "someone else's");
    CFile_ file = Make();
    EXPECT_EQ(1, file.Apply());
    EXPECT_EQ("new", Read(kTarget));
    EXPECT_EQ("old", Read(std::string(kBackup) + "x"));
    EXPECT_TRUE(trace.Contains("CFile_: MakeBackupFileName, about to try 'C:\\App\\Sub\\a.dll.$bak$x'"));

    EXPECT_TRUE(file.Rollback());
    EXPECT_EQ("old", Read(kTarget));
    EXPECT_FALSE(Exists(std::string(kBackup) + "x"));
    EXPECT_EQ("someone else's", Read(kBackup));
}

TEST_F(UpdateFile, ReadOnlyTargetIsClearedAndReplacedAndAFailedBackupLeavesItAlone) {
    machine.WriteFile(kTarget, "old");
    ASSERT_TRUE(plat::files::SetAttributes(kTarget, plat::files::kAttrReadOnly));
    CFile_ file = Make();
    plat::fault::FailNth(plat::fault::Op::Copy, 1, plat::kErrorDiskFull);
    EXPECT_EQ(0, file.Apply());
    EXPECT_EQ("old", Read(kTarget));
    EXPECT_TRUE(trace.Contains(
        "CFile_: Backup of file Dist\\a.dll to C:\\App\\Sub\\a.dll.$bak$ failed, reason code is 112"));
    EXPECT_TRUE(file.Rollback());  // nothing to undo

    EXPECT_EQ(1, file.Apply());
    EXPECT_EQ("new", Read(kTarget));
    EXPECT_TRUE(file.RemoveBackupFile());
    EXPECT_FALSE(Exists(kBackup));
}

// The stamp is the text's clock time as universal time, whatever follows a ".".
TEST_F(UpdateFile, DateIsStampedAsUniversalTimeAndABadDateOnlyCostsTheStamp) {
    CFile_ file = Make("", "12/31/2003 22:30:00.250");
    EXPECT_EQ(1, file.Apply());
    plat::files::FileStatus status;
    ASSERT_TRUE(plat::files::GetStatus(kTarget, &status));
    EXPECT_EQ(127173834000000000ull, status.lastWrite);  // 2003-12-31 22:30:00 UTC
    EXPECT_TRUE(trace.Contains("CFile_: SetFileDateTime, success setting file time for "
                               "'C:\\App\\Sub\\a.dll' to 12/31/2003 22:30:00"));

    plat::files::FileStatus download;
    ASSERT_TRUE(plat::files::GetStatus(kDownload, &download));
    CFile_ undated = Make("", "next Tuesday");
    ASSERT_TRUE(file.Rollback());
    EXPECT_EQ(1, undated.Apply());
    ASSERT_TRUE(plat::files::GetStatus(kTarget, &status));
    EXPECT_EQ(download.lastWrite, status.lastWrite);  // as the copy left it

    EXPECT_FALSE(Make("", "1/1/1600").SetFileDateTime(kTarget));
    EXPECT_TRUE(trace.Contains("CFile_: SetFileDateTime, Unable to convert System Time object to "
                               "File Time object. GetLastError returns 87"));
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

// A program holds the target open (it may be read, not replaced): the copy goes to the restart
// queue, and the file does not count as applied, so neither date nor commands happen.
TEST_F(UpdateFile, InUseTargetIsQueuedForRestartAndNotApplied) {
    PEX_NOT_UNDER_WINE(pextest::kWineSetupApi);
    machine.WriteFile(kTarget, "old");
    machine.WriteFile("C:\\App\\Sub\\marker.txt", "x");
    plat::CFile running;
    ASSERT_TRUE(running.Open(kTarget, plat::CFile::modeRead | plat::CFile::shareDenyWrite));
    CFile_ file = Make("[DEL] marker.txt", "1/2/2004");
    EXPECT_EQ(0, file.Apply());
    EXPECT_EQ("old", Read(kTarget));
    EXPECT_TRUE(Exists("C:\\App\\Sub\\marker.txt"));
    EXPECT_TRUE(trace.Contains(
        "CFile_: Copy not successfull, reason code is 32, source was (C:\\Cache\\a.dll), target was "
        "(C:\\App\\Sub\\a.dll), retrying with SetupAPI"));
    EXPECT_TRUE(trace.Contains(
        "CFile_: SetupInstallFileEx succeeded, but the file was in use.  It has been queued to be "
        "installed on the next system reboot."));
    std::vector<plat::setup::PendingRename> queue;
    ASSERT_TRUE(plat::setup::ReadPendingRenames(&queue));
    ASSERT_EQ(1u, queue.size());
    EXPECT_EQ(kTarget, queue[0].to);
    EXPECT_EQ("new", Read(queue[0].from));
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

// A restore that fails keeps the backup through every later step until a restore succeeds.
TEST_F(UpdateFile, FailedRestoreNeverLosesThePreviousVersion) {
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
}

TEST_F(UpdateFile, FailedDeletionOfANewTargetIsRetriedByTheNextRollback) {
    CFile_ file = Make();
    ASSERT_EQ(1, file.Apply());
    plat::fault::FailNth(plat::fault::Op::Remove, 1, plat::kErrorSharingViolation);
    EXPECT_FALSE(file.Rollback());
    plat::fault::Clear();
    EXPECT_TRUE(file.Rollback());
    EXPECT_FALSE(Exists(kTarget));
}

// What a run finds of an earlier run that ended before it was done: the target already holding
// the new bytes beside the backup of the previous version, or a backup taken just before the end.
TEST_F(UpdateFile, LeftoversOfAnEndedRunAreTakenOverOnlyWhenTheirBytesProveWhatTheyAre) {
    machine.WriteFile(kTarget, "new");
    machine.WriteFile(kBackup, "old");
    CFile_ copied = Make();
    EXPECT_EQ(1, copied.Apply());
    EXPECT_TRUE(trace.Contains("CFile_: 'C:\\App\\Sub\\a.dll' already holds this update, copied by an earlier run "
                               "that did not finish; its previous version stays in 'C:\\App\\Sub\\a.dll.$bak$'"));
    EXPECT_FALSE(Exists(std::string(kBackup) + "x")) << "the new bytes are not backed up over the previous version";
    EXPECT_TRUE(copied.Rollback());
    EXPECT_EQ("old", Read(kTarget));
    EXPECT_FALSE(Exists(kBackup));

    // The target as it is, already in a backup: that backup is taken again, not a second one.
    machine.WriteFile(kBackup, "old");
    CFile_ backedUp = Make();
    EXPECT_EQ(1, backedUp.Apply());
    EXPECT_EQ("old", Read(kBackup));
    EXPECT_FALSE(Exists(std::string(kBackup) + "x"));
    EXPECT_TRUE(backedUp.RemoveBackupFile());
    EXPECT_FALSE(Exists(kBackup));

    // The new bytes without a backup may have been there before the update: kept on rollback.
    CFile_ unproven = Make();
    EXPECT_EQ(1, unproven.Apply());
    EXPECT_EQ("new", Read(kBackup));
    EXPECT_TRUE(unproven.Rollback());
    EXPECT_EQ("new", Read(kTarget));
}

TEST_F(UpdateFile, LeftoversOfACommittedFileGoOnlyWhileTheTargetHoldsTheDownload) {
    const std::string older = std::string(kBackup) + "x";
    machine.WriteFile(kTarget, "something else");
    machine.WriteFile(kBackup, "old");
    machine.WriteFile(older, "older");
    CFile_ committed(7, true, true, "C:\\App\\Sub", "a.dll", kDownload, "", "", false, 0);
    EXPECT_TRUE(committed.RemoveLeftovers());
    EXPECT_TRUE(Exists(kBackup) && Exists(older) && Exists(kDownload)) << "nothing proves they are obsolete";

    machine.WriteFile(kTarget, "new");
    EXPECT_TRUE(committed.RemoveLeftovers());
    EXPECT_FALSE(Exists(kBackup) || Exists(older) || Exists(kDownload));
    EXPECT_EQ("new", Read(kTarget));
}

}  // namespace
