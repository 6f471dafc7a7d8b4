// The shared utilities: product profile, paths, temporary names, directory trees and numbers.
// RunProcess is command_executors_test's, through [RUN]. File version texts, registry dumps and
// in-process server paths are the golden run startup_snapshot's.
#include <gtest/gtest.h>

#include "commands/platform_utilities.h"
#include "commands/registry_command.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "tests/support/case_file.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"
#include "tests/support/trace_capture.h"

namespace reg = plat::reg;

namespace {

const char* const kPex = "software\\Vantric\\Pex";

// Reading and deleting entries are also the manifest's tests, through the product settings.
TEST(Utilities, ProfileReadsWritesAndDeletesEntries) {
    pextest::TestMachine machine;
    CProfile profile;
    EXPECT_EQ(profile.ReadProfileEntry("Orlandel", "Site", "none"), "none");
    EXPECT_TRUE(pextest::RegKeyExists(reg::kLocalMachine, std::string(kPex) + "\\Orlandel"));  // made by the read
    EXPECT_FALSE(profile.WriteProfileEntry("Orlandel", nullptr, "x"));
    EXPECT_TRUE(profile.WriteProfileEntry("", "Site", "server1/pub"));  // "": the products key itself
    std::string bytes;
    ASSERT_TRUE(pextest::GetRegValue(reg::kLocalMachine, kPex, "Site", &bytes));
    EXPECT_EQ(bytes, std::string("server1/pub", 12));  // stored with its terminating zero
    EXPECT_TRUE(profile.WriteProfileEntry("", "Site", nullptr));
    EXPECT_FALSE(profile.WriteProfileEntry("", "Site", nullptr));
    EXPECT_EQ(profile.ReadProfileEntry("", "Site", "gone"), "gone");
}

TEST(Utilities, TrailingBackslashesTemporaryNamesAndDirectoryTrees) {
    pextest::TestMachine machine;
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

TEST(Numbers, UnsignedWithTheAutomaticBaseAndSignedDecimal) {
    for (const pextest::Case& c : pextest::ReadCases("commands/cases/numbers.txt")) {
        SCOPED_TRACE(c.where);
        const std::string text = pextest::Unescape(c[0]);
        EXPECT_EQ(std::to_string(NumberFromText(text)), c[1]);
        EXPECT_EQ(std::to_string(RegistryDwordFromText(text)), c[2]);
    }
}

}  // namespace
