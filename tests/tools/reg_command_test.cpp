// `pexupdate reg` as people use it: the verbs and switches of the Windows command, its
// messages and exit codes, export and import through files. What the registry holds and how
// .reg files read and write is platform/reg_file_test.cpp's.
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

TEST_F(RegCommandTest, AddThenQueryShowsEachTypeAsWindowsDoes) {
    const std::string key = kKey;
    for (const char* add : {" /v DefaultPath /d 'C:\\Program Files\\Vantric'", " /v Mode /t REG_DWORD /d 31",
                            " /v List /t reg_multi_sz /d 'a\\0b'", " /ve /t REG_BINARY /d 0aFF /f", "'\\Sub'"})
        EXPECT_EQ(0, Reg("add " + key + add).exit) << add;
    Outcome q = Reg("query hkey_local_machine\\\\Software\\\\Vantric\\\\Pex\\\\Zendor32");
    EXPECT_EQ(0, q.exit) << q.out;
    EXPECT_EQ("\nHKEY_LOCAL_MACHINE\\Software\\Vantric\\Pex\\Zendor32\n"
              "    DefaultPath    REG_SZ    C:\\Program Files\\Vantric\n"
              "    Mode    REG_DWORD    0x1f\n"
              "    List    REG_MULTI_SZ    a\\0b\n"
              "    (Default)    REG_BINARY    0AFF\n"
              "\nHKEY_LOCAL_MACHINE\\Software\\Vantric\\Pex\\Zendor32\\Sub\n",
              q.out);
    EXPECT_EQ("\nHKEY_LOCAL_MACHINE\\Software\\Vantric\\Pex\\Zendor32\n"
              "    Mode    REG_DWORD    0x1f\n",
              Reg("query " + key + " /V mode").out);
}

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

TEST_F(RegCommandTest, ExportedFilesImportIntoAnotherMachine) {
    const std::string key = kKey;
    ASSERT_EQ(0, Reg("add " + key + " /v Path /t REG_EXPAND_SZ /d '%ProgramFiles%\\x'").exit);
    ASSERT_EQ(0, Reg("add " + key + "'\\Deep' /v N /t REG_NONE").exit);
    const std::string file = machine_.Root() + "/drive_c/export.reg";
    ASSERT_EQ(0, Reg("export 'HKLM\\Software\\Vantric' '" + file + "'").exit);
    EXPECT_NE(0, Reg("export 'HKLM\\Software\\Vantric' 'C:\\export.reg'", "n\n").exit);
    EXPECT_EQ(0, Reg("export 'HKLM\\Software\\Vantric' 'C:\\export.reg' /y").exit);
    const std::string before = Reg("query 'HKLM\\Software\\Vantric' /s").out;
    ASSERT_EQ(0, Reg("delete 'HKLM\\Software\\Vantric' /f").exit);
    Outcome imported = Reg("import 'C:\\export.reg'");
    EXPECT_EQ(0, imported.exit) << imported.out;
    EXPECT_EQ(before, Reg("query 'HKLM\\Software\\Vantric' /s").out);
}

TEST_F(RegCommandTest, BadInputIsRefusedWithAMessage) {
    machine_.WriteFile("C:\\bad.reg", "REGEDIT4\n[HKLM\\Software\\Half]\n\"a\"=\"1\"\n\"b\"=dword:xyz\n");
    Outcome import = Reg("import 'C:\\bad.reg'");
    EXPECT_EQ(1, import.exit);
    EXPECT_NE(std::string::npos, import.out.find("line 4")) << import.out;

    for (const char* args : {"", "frobnicate", "query", "query HKXX\\\\Software", "add HKLM /zz",
                             "add 'HKLM\\x' /v a /t REG_DWORD /d 12abc", "add 'HKLM\\x' /v",
                             "delete HKLM /f", "query HKLM /v a /ve", "import"}) {
        Outcome o = Reg(args);
        EXPECT_NE(0, o.exit) << args;
        EXPECT_NE(std::string::npos, o.out.find("ERROR")) << args << ": " << o.out;
    }
    EXPECT_EQ(1, Reg("import '" + machine_.Root() + "/none.reg'").exit);
    for (const char* help : {"--help", "query --help", "add /?", "import -h"}) {
        Outcome o = Reg(help);
        EXPECT_EQ(0, o.exit) << help;
        EXPECT_NE(std::string::npos, o.out.find("reg ")) << help;
    }
}

}  // namespace
