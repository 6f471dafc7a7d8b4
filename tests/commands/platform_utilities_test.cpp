// The shared utilities: product profile, process start, versions, registry texts, paths,
// temporary names, directory trees and numbers.
#include <gtest/gtest.h>

#include "commands/platform_utilities.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"
#include "tests/support/trace_capture.h"

namespace reg = plat::reg;

namespace {

const char* const kPex = "software\\Vantric\\Pex";

class UtilitiesTest : public ::testing::Test {
protected:
    pextest::TestMachine machine;
};

TEST_F(UtilitiesTest, ProfileReadsWritesAndDeletesEntries) {
    CProfile profile;
    EXPECT_EQ(profile.ReadProfileEntry("Orlandel", "Site", "none"), "none");
    EXPECT_TRUE(pextest::RegKeyExists(reg::kLocalMachine, std::string(kPex) + "\\Orlandel"));
    EXPECT_FALSE(profile.WriteProfileEntry("Orlandel", nullptr, "x"));
    EXPECT_TRUE(profile.WriteProfileEntry("Orlandel", "Site", "server1/pub"));
    EXPECT_EQ(profile.ReadProfileEntry("Orlandel", "Site", ""), "server1/pub");
    std::string bytes;
    ASSERT_TRUE(pextest::GetRegValue(reg::kLocalMachine, std::string(kPex) + "\\Orlandel", "Site", &bytes));
    EXPECT_EQ(bytes, std::string("server1/pub", 12));  // stored with its terminating zero
    EXPECT_TRUE(profile.WriteProfileEntry("Orlandel", "Site", nullptr));
    EXPECT_FALSE(profile.WriteProfileEntry("Orlandel", "Site", nullptr));
    EXPECT_EQ(profile.ReadProfileEntry("Orlandel", "Site", "gone"), "gone");
    // The empty section is the products key itself.
    EXPECT_TRUE(profile.WriteProfileEntry("", "DefaultPath", "C:\\Suite"));
    EXPECT_EQ(profile.ReadProfileEntry("", "DefaultPath", "."), "C:\\Suite");
}

TEST_F(UtilitiesTest, RunProcessWaitsOrGivesUp) {
    EXPECT_TRUE(RunProcess("pextestprog exit 5", "C:\\", true, kInfinite, true));  // exit code ignored
    EXPECT_TRUE(RunProcess("pextestprog mark ran.txt", "C:\\", true, 60000, false));
    EXPECT_TRUE(plat::files::Exists("C:\\ran.txt"));
    EXPECT_FALSE(RunProcess("nosuchprogram", "C:\\", true, kInfinite, true));
    // Past its time-out the program is left running and the call fails.
    EXPECT_FALSE(RunProcess("pextestprog sleep 2000", "C:\\", true, 20, true));
    EXPECT_TRUE(RunProcess("pextestprog sleep 2000", "C:\\", false, 0, false));
}

TEST_F(UtilitiesTest, FileVersionOfAWindowsBinary) {
    machine.WriteFile("C:\\App\\versioned.dll", pextest::ReadHostFile(PEX_FIXTURE_DIR "/versioned.dll"));
    std::uint32_t ms = 0, ls = 0;
    ASSERT_TRUE(GetFileVersion("C:\\App\\versioned.dll", &ms, &ls));
    EXPECT_EQ(ms, (3u << 16) | 10u);
    EXPECT_EQ(ls, (40000u << 16) | 5u);
    std::string text;
    EXPECT_TRUE(GetFileVersionText("C:\\App\\versioned.dll", &text));
    EXPECT_EQ(text, "3.10.-25536.5");
    machine.WriteFile("C:\\App\\plain.txt", "no version here");
    EXPECT_FALSE(GetFileVersionText("C:\\App\\plain.txt", &text));
    EXPECT_EQ(text, "");
}

TEST_F(UtilitiesTest, RegistryValueLines) {
    const std::string sz("C:\\x", 5);
    EXPECT_EQ(RegistryValueText("Path", reg::kRegSz, reinterpret_cast<const std::uint8_t*>(sz.data()), 5),
              "\"Path\"=\"C:\\x\"");
    const std::uint8_t dword[4] = {0xFF, 0xFF, 0xFF, 0xFF};
    EXPECT_EQ(RegistryValueText("Flags", reg::kRegDword, dword, 4), "\"Flags\"=dword:ffffffff (-1)");
    EXPECT_EQ(RegistryValueText("Blob", reg::kRegBinary, dword, 4), "\"Blob\" = Unsupported Type (3)");
}

TEST_F(UtilitiesTest, RegistryKeyDumpIsRecursive) {
    long status = -1;
    EXPECT_EQ(RegistryKeyDump("HKLM", reg::kLocalMachine, "Software\\Missing", &status),
              "[HKLM\\Software\\Missing] -- not found\n");
    EXPECT_EQ(status, 0);
    pextest::SetRegText(reg::kLocalMachine, "Software\\Suite", "Name", "Suite");
    pextest::SetRegValue(reg::kLocalMachine, "Software\\Suite\\Sub", "Blob", reg::kRegBinary, "\x01\x02");
    pextest::SetRegValue(reg::kLocalMachine, "Software\\Suite\\Sub", "Count", reg::kRegDword,
                         std::string("\x0A\0\0\0", 4));
    EXPECT_EQ(RegistryKeyDump("HKLM", reg::kLocalMachine, "Software\\Suite", &status),
              "[HKLM\\Software\\Suite]\n"
              "\"Name\"=\"Suite\"\n"
              "\n[HKLM\\Software\\Suite\\Sub]\n"
              "\"Blob\" = Unsupported Type (3)\n"
              "\"Count\"=dword:a (10)\n");
    EXPECT_EQ(status, 0);
    // A value whose data does not fit fails the whole dump.
    pextest::SetRegValue(reg::kLocalMachine, "Software\\Suite\\Sub", "Big", reg::kRegBinary, std::string(4000, 'x'));
    EXPECT_EQ(RegistryKeyDump("HKLM", reg::kLocalMachine, "Software\\Suite", &status), "");
    EXPECT_EQ(status, 234);
}

TEST_F(UtilitiesTest, InprocServerPathFollowsTheClassIdentifier) {
    EXPECT_EQ(InprocServerPath("Vantric.Missing"), "");
    pextest::SetRegText(reg::kClassesRoot, "Vantric.Test\\CLSID", "", "{1234}");
    pextest::SetRegText(reg::kClassesRoot, "CLSID\\{1234}\\InprocServer32", "InprocServer32", "C:\\a.dll");
    EXPECT_EQ(InprocServerPath("Vantric.Test"), "C:\\a.dll");
    pextest::SetRegText(reg::kClassesRoot, "CLSID\\{1234}\\InprocServer32", "", "C:\\b.dll");
    EXPECT_EQ(InprocServerPath("Vantric.Test"), "C:\\b.dll");
}

TEST_F(UtilitiesTest, PathsTemporaryNamesAndDirectoryTrees) {
    std::string path = "C:\\x\\y.txt";
    ComposePath(path, "D:\\other\\z.dat", 8 + 4);
    EXPECT_EQ(path, "C:\\x\\");
    EXPECT_EQ(AddTrailingBackslash(""), "\\");
    EXPECT_EQ(AddTrailingBackslash("C:\\a\\"), "C:\\a\\");

    pextest::TraceCapture trace;
    const std::string temp = sGetTempFileName();
    EXPECT_EQ(temp.rfind(plat::files::TempFolder() + "pex", 0), 0u) << temp;
    EXPECT_TRUE(plat::files::Exists(temp));
    EXPECT_EQ(trace.Lines(), (std::vector<std::string>{"CManifestParser: sGetTempFileName",
                                                       "CManifestParser: sGetTempFileName, return is '" + temp + "'"}));

    EXPECT_FALSE(CreateDirectoryTree(""));
    EXPECT_TRUE(CreateDirectoryTree("C:\\a\\b\\c\\"));
    EXPECT_EQ(plat::files::GetAttributes("C:\\a\\b\\c") & plat::files::kAttrDirectory, plat::files::kAttrDirectory);
    ASSERT_TRUE(plat::paths::ChangeDirectory("C:\\a"));
    EXPECT_TRUE(CreateDirectoryTree("plain"));  // a relative name without a backslash ends
    EXPECT_TRUE(plat::files::Exists("C:\\a\\plain"));
}

TEST_F(UtilitiesTest, NumbersFollowTheAutomaticBase) {
    EXPECT_EQ(NumberFromText(" 0x1A \t\n"), 26u);
    EXPECT_EQ(NumberFromText("017"), 15u);
    EXPECT_EQ(NumberFromText("42abc"), 42u);
    EXPECT_EQ(NumberFromText("abc"), 0u);
    EXPECT_EQ(NumberFromText("-1"), 0xFFFFFFFFu);
    EXPECT_EQ(NumberFromText("99999999999"), 0xFFFFFFFFu);
}

}  // namespace
