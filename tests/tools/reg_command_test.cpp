// `pexupdate reg` asking before it overwrites or deletes, answered on its standard input. The
// golden run pexupdate_reg shows the verbs, switches, messages and exit codes; what the registry
// holds and how .reg files read and write is platform/reg_file_test.cpp's.
#include <gtest/gtest.h>

#include <string>

#include "tests/support/platform_guard.h"
#include "tests/support/run_pexupdate.h"
#include "tests/support/test_machine.h"

namespace {

using Outcome = pextest::CommandOutcome;

// The commands run through a POSIX shell (quoting, redirection), which a Windows build lacks.
class RegCommandTest : public ::testing::Test {
protected:
    void SetUp() override { PEX_LINUX_ONLY(); }

    // pexupdate reg ARGS on this test's machine, given input at its prompts; args are given to
    // the shell as they stand. Output holds standard output and standard error together.
    Outcome Reg(const std::string& args, const std::string& input = "") {
        machine_.WriteFile("C:\\input.txt", input);
        return pextest::RunPexupdate(PEXUPDATE_PATH, machine_, "reg " + args + " <'" + machine_.DriveC() + "/input.txt'");
    }

    pextest::TestMachine machine_;
};

const char kKey[] = "'HKLM\\Software\\Vantric\\Pex\\Zendor32'";

TEST_F(RegCommandTest, ExistingValuesAndDeletionsAskUnlessForced) {
    const std::string key = kKey;
    ASSERT_EQ(0, Reg("add " + key + " /v A /d old").exit);
    Outcome declined = Reg("add " + key + " /v A /d new", "n\n");
    EXPECT_NE(0, declined.exit);
    EXPECT_NE(std::string::npos, declined.out.find("overwrite")) << declined.out;
    EXPECT_EQ(0, Reg("add " + key + " /v A /d new", "yes\n").exit);
    EXPECT_NE(std::string::npos, Reg("query " + key + " /v A").out.find("REG_SZ    new"));

    ASSERT_EQ(0, Reg("add " + key + " /v B /d b").exit);
    EXPECT_EQ(0, Reg("delete " + key + " /v a /f").exit);
    EXPECT_EQ(1, Reg("query " + key + " /v A").exit);
    EXPECT_EQ(0, Reg("delete " + key + " /va /f").exit);
    EXPECT_EQ(1, Reg("query " + key + " /v B").exit);
    EXPECT_NE(0, Reg("delete 'HKLM\\Software\\Vantric'", "n\n").exit);
    EXPECT_EQ(0, Reg("delete 'HKLM\\Software\\Vantric' /f").exit);
    Outcome gone = Reg("query " + key);
    EXPECT_EQ(1, gone.exit);
    EXPECT_NE(std::string::npos, gone.out.find("unable to find")) << gone.out;
}

}  // namespace
