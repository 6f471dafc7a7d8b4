// CFile_ on an emulated machine: a command list of blanks and the removal of downloads. Whole
// runs cover the rest: backups beside older ones and rollbacks after a failed command
// (rollback_beside_backups, group_rollback_and_statuses), install commands (install_commands),
// the setup fallback (setup_fallback, target_in_use).
#include "model/update_file.h"

#include <gtest/gtest.h>

#include <string>

#include "platform/files.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

constexpr char kDownload[] = "C:\\Cache\\a.dll";

class UpdateFile : public ::testing::Test {
protected:
    void SetUp() override { machine.WriteFile(kDownload, "new"); }

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

// Blanks are a command list of their own, run, that finds nothing to do (a content file's cell
// of blanks reaches no command at all: rollback_beside_backups).
TEST_F(UpdateFile, BlanksAreRunAsACommandList) {
    EXPECT_EQ(1, Make("   ").Apply());
    EXPECT_TRUE(trace.Contains("CFile_: Command(s) found:    "));
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
