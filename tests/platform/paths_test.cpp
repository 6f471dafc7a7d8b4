// Windows path rules, the machine layout and the mapping of Windows paths to host paths.
#include "platform/paths.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

#include "platform/errors.h"
#include "platform/machine.h"
#include "tests/support/platform_guard.h"
#include "tests/support/test_machine.h"

namespace {

using plat::paths::PathParts;
namespace fs = std::filesystem;

TEST(SplitPath, MatchesTheRunTimeTableAndMakePathMergesThePartsBack) {
    struct Row {
        const char* path;
        PathParts parts;
    };
    const Row rows[] = {
        {"\"C:\\App\\victim.txt\"", {"", "\"C:\\App\\", "victim", ".txt\""}},
        {"C:", {"C:", "", "", ""}},
        {"a.b.c", {"", "", "a.b", ".c"}},
        {".\\App", {"", ".\\", "App", ""}},
        {"\\Program Files\\App", {"", "\\Program Files\\", "App", ""}},
        {"Sub\\App", {"", "Sub\\", "App", ""}},
        {"C:\\x\\y.txt", {"C:", "\\x\\", "y", ".txt"}},
        {"C:x.txt", {"C:", "", "x", ".txt"}},
        {"dir/file", {"", "dir/", "file", ""}},
        {"noext.", {"", "", "noext", "."}},
        {".hidden", {"", "", "", ".hidden"}},
        {"C:\\App\\", {"C:", "\\App\\", "", ""}},
        {"\\\\server\\share\\f.txt", {"", "\\\\server\\share\\", "f", ".txt"}},
    };
    for (const Row& row : rows) {
        SCOPED_TRACE(row.path);
        const PathParts p = plat::paths::SplitPath(row.path);
        EXPECT_EQ(p.drive, row.parts.drive);
        EXPECT_EQ(p.dir, row.parts.dir);
        EXPECT_EQ(p.fname, row.parts.fname);
        EXPECT_EQ(p.ext, row.parts.ext);
        // The parts of a split path merge back into the same text.
        EXPECT_EQ(plat::paths::MakePath(p), row.path);
    }
    // Making a path adds the separators and the dot that the parts lack.
    EXPECT_EQ(plat::paths::MakePath({"C", "x", "f", "txt"}), "C:x\\f.txt");
    EXPECT_EQ(plat::paths::MakePath({"D:", "\\a/", "", ".log"}), "D:\\a/.log");
}

TEST(ComposePath, TakesEachPartFromTheFirstElseTheSecondPath) {
    using plat::paths::ComposePath;
    EXPECT_EQ(ComposePath("C:\\x\\y.txt", "", 8 + 4), "C:\\x\\");
    EXPECT_EQ(ComposePath("C:\\x\\y.txt", "D:\\p\\q.dat", 8 + 4 + 32 + 16), "C:\\x\\q.dat");
    EXPECT_EQ(ComposePath("C:\\x\\y.txt", "D:\\p\\q.dat", 0xFF), "C:\\x\\y.txt");
    EXPECT_EQ(ComposePath("C:\\x\\y.txt", "D:\\p\\q.dat", 0xF0), "D:\\p\\q.dat");
    // A part selected from the first path stays out when that path lacks it.
    EXPECT_EQ(ComposePath("C:\\x\\y", "q.dat", 2 + 1 + 16), "y");
    EXPECT_EQ(ComposePath("C:\\x\\y.txt", "D:\\p\\q.dat", 0), "");
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
    EXPECT_EQ(ToHost("C:\\app\\A.DLL"), m.DriveC() + "/app/A.DLL");
    EXPECT_EQ(ToHost("C:\\App\\a.dll"), m.DriveC() + "/app/a.dll");
    EXPECT_EQ(ToHost("C:\\app\\ONLY.TXT"), m.DriveC() + "/app/Only.txt");
    EXPECT_EQ(ToHost("c:/APP/only.txt"), m.DriveC() + "/app/Only.txt");
    EXPECT_EQ(ToHost("c:/APP/New.Txt"), m.DriveC() + "/app/New.Txt");
    EXPECT_EQ(ToHost("C:\\New\\Sub\\"), m.DriveC() + "/New/Sub");
    EXPECT_EQ(ToHost("\\WINDOWS\\System32"), m.DriveC() + "/windows/system32");
    EXPECT_EQ(ToHost("C:\\"), m.DriveC());
    EXPECT_EQ(ToHost("Q:\\x"), "");
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
    EXPECT_EQ(FullPath("..\\x\\.\\y\\"), "C:\\x\\y\\");
    EXPECT_EQ(FullPath("\\..\\q"), "C:\\q");
    EXPECT_EQ(FullPath("C:sub"), "C:\\APP\\sub");
    EXPECT_EQ(FullPath("d:/a//b"), "D:\\a\\b");
    EXPECT_FALSE(plat::paths::ChangeDirectory("C:\\nope"));
    EXPECT_EQ(plat::LastError(), plat::kErrorFileNotFound);
    EXPECT_FALSE(plat::paths::ChangeDirectory("C:\\nope\\deeper"));
    EXPECT_EQ(plat::LastError(), plat::kErrorPathNotFound);
    EXPECT_EQ(plat::paths::CurrentDirectory(), "C:\\APP");

    ASSERT_TRUE(plat::paths::ChangeDirectory("Z:\\tmp"));
    EXPECT_EQ(plat::paths::CurrentDrive(), 'Z');
    EXPECT_EQ(FullPath("\\etc"), "Z:\\etc");
    EXPECT_EQ(FullPath("C:sub"), "C:\\sub");

#ifndef _WIN32
    plat::machine::SetRoot(m.Root());  // a new machine starts again at C:\ .
    EXPECT_EQ(plat::paths::CurrentDirectory(), "C:\\");
#endif
}

// Found by fuzzing: doubled separators around the server name shifted the rest of the path.
// Windows itself keeps such doubled separators; the rule is the emulation's.
TEST(FullPath, UncPathsKeepTheirComponentsWhateverTheSeparators) {
    PEX_LINUX_ONLY();
    pextest::TestMachine m;
    using plat::paths::FullPath;
    EXPECT_EQ(FullPath("\\\\server\\share\\x"), "\\\\server\\share\\x");
    EXPECT_EQ(FullPath("\\\\server\\\\share\\x\\"), "\\\\server\\share\\x\\");
    EXPECT_EQ(FullPath("\\\\\\a\\b"), "\\\\a\\b\\");
    EXPECT_EQ(FullPath("//a//b/../c"), "\\\\a\\b\\c");
}

}  // namespace
