// Windows path rules, the machine layout and the mapping of Windows paths to host paths.
#include "platform/paths.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

#include "platform/errors.h"
#include "platform/machine.h"
#include "tests/support/case_file.h"
#include "tests/support/platform_guard.h"
#include "tests/support/test_machine.h"

namespace {

using plat::paths::PathParts;
namespace fs = std::filesystem;

TEST(SplitPath, MatchesTheRunTimeTableAndMakePathMergesThePartsBack) {
    for (const pextest::Case& c : pextest::ReadCases("platform/cases/split_paths.txt")) {
        SCOPED_TRACE(c.where);
        const PathParts p = plat::paths::SplitPath(c[0]);
        EXPECT_EQ(p.drive, c[1]);
        EXPECT_EQ(p.dir, c[2]);
        EXPECT_EQ(p.fname, c[3]);
        EXPECT_EQ(p.ext, c[4]);
        EXPECT_EQ(plat::paths::MakePath(p), c[0]);
    }
    // Making a path adds the separators and the dot that the parts lack.
    EXPECT_EQ(plat::paths::MakePath({"C", "x", "f", "txt"}), "C:x\\f.txt");
    EXPECT_EQ(plat::paths::MakePath({"D:", "\\a/", "", ".log"}), "D:\\a/.log");
}

TEST(ComposePath, TakesEachPartFromTheFirstElseTheSecondPath) {
    for (const pextest::Case& c : pextest::ReadCases("platform/cases/compose_paths.txt")) {
        SCOPED_TRACE(c.where);
        const auto flags = static_cast<unsigned char>(std::stoi(c[2]));
        EXPECT_EQ(plat::paths::ComposePath(c[0], c[1], flags), c[3]);
    }
}

// Set-up adopts the folders it finds without regard to case, as Windows would see them.
TEST(Machine, EnsureAdoptsAnExistingWindowsFolderWhateverItsCase) {
    PEX_LINUX_ONLY();
    pextest::TestMachine m;
    fs::remove_all(m.DriveC() + "/windows");
    fs::create_directories(m.DriveC() + "/Windows/SYSTEM32");
    ASSERT_TRUE(plat::machine::Ensure());
    EXPECT_FALSE(fs::exists(m.DriveC() + "/windows"));
    EXPECT_TRUE(fs::is_directory(m.DriveC() + "/Windows/temp"));
}

// Most paths are mapped in one status query of the whole path; that short cut must give what
// matching component by component gives: the exact spelling wins, other cases still match.
TEST(ToHost, MatchesExistingComponentsWithoutRegardToCaseAndToWindowsMapsBack) {
    PEX_LINUX_ONLY();
    pextest::TestMachine m;
    m.WriteFile("C:\\app\\a.dll", "x");
    std::ofstream(m.DriveC() + "/app/A.DLL") << "y";  // the host holds both spellings
    std::ofstream(m.DriveC() + "/app/Only.txt") << "z";
    using plat::paths::ToHost;
    for (const pextest::Case& c : pextest::ReadCases("platform/cases/host_paths.txt")) {
        SCOPED_TRACE(c.where);
        EXPECT_EQ(ToHost(c[0]), c[1] == "unmapped" ? "" : m.DriveC() + c[1]);
    }
    EXPECT_EQ(plat::LastError(), plat::kErrorPathNotFound);

    // A host path names the drive that holds it, else Z:.
    EXPECT_EQ(plat::paths::ToWindows(m.DriveC() + "/app/a.dll"), "C:\\app\\a.dll");
    EXPECT_EQ(plat::paths::ToWindows(m.DriveC()), "C:\\");
    const std::string outside = fs::weakly_canonical(m.Root()).string() + "/elsewhere";
    std::string expected = "Z:" + outside;
    for (char& c : expected) c = c == '/' ? '\\' : c;
    EXPECT_EQ(plat::paths::ToWindows(outside), expected);
    EXPECT_EQ(ToHost(expected), outside);
    EXPECT_EQ(ToHost("Z:\\"), "/");
}

TEST(CurrentDirectory, ResolvesRelativePathsDrivesTheCurrentDriveAndRefusesMissingFolders) {
    pextest::TestMachine m;
    m.WriteFile("C:\\app\\a.dll", "x");
    using plat::paths::FullPath;
    EXPECT_EQ(plat::paths::CurrentDirectory(), "C:\\");
    ASSERT_TRUE(plat::paths::ChangeDirectory("c:/APP/"));
    EXPECT_EQ(plat::paths::CurrentDirectory(), "C:\\APP");
#ifndef _WIN32
    EXPECT_EQ(plat::paths::ToHost("a.dll"), m.DriveC() + "/app/a.dll");
#endif
    EXPECT_FALSE(plat::paths::ChangeDirectory("C:\\nope"));
    EXPECT_EQ(plat::LastError(), plat::kErrorFileNotFound);
    EXPECT_FALSE(plat::paths::ChangeDirectory("C:\\nope\\deeper"));
    EXPECT_EQ(plat::LastError(), plat::kErrorPathNotFound);
    EXPECT_EQ(plat::paths::CurrentDirectory(), "C:\\APP");

    ASSERT_TRUE(plat::paths::ChangeDirectory("Z:\\tmp"));
    EXPECT_EQ(plat::paths::CurrentDrive(), 'Z');

#ifndef _WIN32
    plat::machine::SetRoot(m.Root());  // a new machine starts again at C:\ .
    EXPECT_EQ(plat::paths::CurrentDirectory(), "C:\\");
#endif
}

TEST(FullPath, ResolvesAgainstTheCurrentFolderAndDrive) {
    pextest::TestMachine m;
    m.WriteFile("C:\\app\\a.dll", "x");
    for (const pextest::Case& c : pextest::ReadCases("platform/cases/full_paths.txt")) {
        SCOPED_TRACE(c.where);
#ifdef _WIN32
        if (c[3] == "emulation") continue;
#endif
        ASSERT_TRUE(plat::paths::ChangeDirectory(c[0]));
        EXPECT_EQ(plat::paths::FullPath(c[1]), c[2]);
    }
}

}  // namespace
