// CFile_ on an emulated machine: a command list of blanks and the removal of downloads. Whole
// runs cover the rest: backups beside older ones and rollbacks after a failed command
// (rollback_beside_backups, group_rollback_and_statuses), install commands (install_commands),
// the setup fallback (setup_fallback, target_in_use).
#include "model/update_file.h"

#include <gtest/gtest.h>

#include <string>

#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

class UpdateFile : public ::testing::Test {
protected:
    pextest::TestMachine machine;
    pextest::TraceCapture trace;
};

// Blanks are a command list of their own, run, that finds nothing to do (a content file's cell
// of blanks reaches no command at all: rollback_beside_backups).
TEST_F(UpdateFile, BlanksAreRunAsACommandList) {
    machine.WriteFile("C:\\Cache\\a.dll", "new");
    CFile_ blanks(7, true, false, "C:\\App\\Sub", "a.dll", "C:\\Cache\\a.dll", "   ", "", false, 0);
    EXPECT_EQ(1, blanks.Apply());
    EXPECT_TRUE(trace.Contains("CFile_: Command(s) found:    "));
}

// A download that is the target itself is never removed (no run gets that far: copying a file
// onto itself fails). A read-only download is removed all the same: download_removal.
TEST_F(UpdateFile, ADownloadThatIsTheTargetIsKept) {
    machine.WriteFile("C:\\App\\a.dll", "installed");
    CFile_ itself(1, true, true, "C:\\App", "a.dll", "c:\\app\\A.DLL", "", "", false, 0);
    EXPECT_FALSE(itself.Remove());
    EXPECT_EQ("installed", machine.ReadFile("C:\\App\\a.dll"));
}

}  // namespace
