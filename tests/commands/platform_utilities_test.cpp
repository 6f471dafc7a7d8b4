// The shared utilities: product profile, versions, registry texts, paths, temporary names,
// directory trees and numbers. RunProcess is command_executors_test's, through [RUN].
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

// Reading and deleting entries are also the manifest's tests, through the product settings.
TEST_F(UtilitiesTest, ProfileReadsWritesAndDeletesEntries) {
    CProfile profile;
    EXPECT_EQ(profile.ReadProfileEntry("Orlandel", "Site", "none"), "none");
    EXPECT_TRUE(pextest::RegKeyExists(reg::kLocalMachine, std::string(kPex) + "\\Orlandel"));  // made by the read
    EXPECT_FALSE(profile.WriteProfileEntry("Orlandel", nullptr, "x"));
    EXPECT_TRUE(profile.WriteProfileEntry("", "Site", "server1/pub"));  // "": the products key itself
    std::string bytes;
    ASSERT_TRUE(pextest::GetRegValue(reg::kLocalMachine, kPex, "Site", &bytes));
    EXPECT_EQ(bytes, std::string("server1/pub", 12));  // stored with its terminating zero
    EXPECT_EQ(profile.ReadProfileEntry("", "Site", ""), "server1/pub");
    EXPECT_TRUE(profile.WriteProfileEntry("", "Site", nullptr));
    EXPECT_FALSE(profile.WriteProfileEntry("", "Site", nullptr));
    EXPECT_EQ(profile.ReadProfileEntry("", "Site", "gone"), "gone");
}

// The text shows each part as a signed 16-bit number, as the snapshot always has.
TEST_F(UtilitiesTest, FileVersionTextOfAWindowsBinary) {
    machine.WriteFile("C:\\App\\versioned.dll", pextest::ReadHostFile(PEX_FIXTURE_DIR "/versioned.dll"));
    std::string text;
    EXPECT_TRUE(GetFileVersionText("C:\\App\\versioned.dll", &text));
    EXPECT_EQ(text, "3.10.-25536.5");  // 3.10.40000.5
    machine.WriteFile("C:\\App\\plain.txt", "no version here");
    EXPECT_FALSE(GetFileVersionText("C:\\App\\plain.txt", &text));
    EXPECT_EQ(text, "");
    std::string noFixedPart = pextest::ReadHostFile(PEX_FIXTURE_DIR "/versioned.dll");
    noFixedPart[noFixedPart.find("\xBD\x04\xEF\xFE")] = 0;  // the fixed part's signature
    machine.WriteFile("C:\\App\\nofixed.dll", noFixedPart);
    EXPECT_FALSE(GetFileVersionText("C:\\App\\nofixed.dll", &text));
}

// Keys that are not there are the snapshot's test (startup_snapshot_test.cpp).
TEST_F(UtilitiesTest, RegistryKeyDumpIsRecursive) {
    long status = -1;
    pextest::SetRegText(reg::kLocalMachine, "Software\\Suite", "Name", "Suite");
    pextest::SetRegValue(reg::kLocalMachine, "Software\\Suite\\Sub", "Blob", reg::kRegBinary, "\x01\x02");
    pextest::SetRegValue(reg::kLocalMachine, "Software\\Suite\\Sub", "Count", reg::kRegDword, "\xFF\xFF\xFF\xFF");
    EXPECT_EQ(RegistryKeyDump("HKLM", reg::kLocalMachine, "Software\\Suite", &status),
              "[HKLM\\Software\\Suite]\n"
              "\"Name\"=\"Suite\"\n"
              "\n[HKLM\\Software\\Suite\\Sub]\n"
              "\"Blob\" = Unsupported Type (3)\n"
              "\"Count\"=dword:ffffffff (-1)\n");
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

TEST_F(UtilitiesTest, TrailingBackslashesTemporaryNamesAndDirectoryTrees) {
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
