// Files and folders by Windows path, with the Windows answers for in-use and missing files.
// Read-only targets, backups and durable writes are the apply pipeline's and the crash tests'.
#include "platform/files.h"

#include <gtest/gtest.h>
#ifndef _WIN32
#include <sys/file.h>
#include <fcntl.h>
#include <unistd.h>
#endif

#include <filesystem>
#include <regex>

#include "platform/errors.h"
#include "platform/paths.h"
#include "platform/regular_file.h"
#include "tests/support/case_file.h"
#include "tests/support/platform_guard.h"
#include "tests/support/test_machine.h"

namespace {

namespace files = plat::files;
namespace fs = std::filesystem;

class Files : public ::testing::Test {
protected:
    void SetUp() override {
        m.WriteFile("C:\\app\\src.txt", "new content");
        m.WriteFile("C:\\app\\dst.txt", "old content");
    }

    // Expects the call to fail with the Windows code.
    static void ExpectFails(bool result, std::uint32_t code) {
        EXPECT_FALSE(result);
        EXPECT_EQ(plat::LastError(), code);
    }

    // Carries out one line of the operations' case file and gives its result as the file does.
    std::string Do(const pextest::Case& c) {
        const std::string& op = c[0];
        const auto result = [](bool ok) { return ok ? "ok" : std::to_string(plat::LastError()); };
        if (op == "find") {
            std::string names;
            for (const auto& e : files::Find(c[1])) names += (names.empty() ? "" : " ") + e.name;
            return names.empty() ? std::to_string(plat::LastError()) : names;
        }
        if (op == "attributes") {
            const std::uint32_t attributes = files::GetAttributes(c[1]);
            if (attributes == files::kInvalidAttributes) return std::to_string(plat::LastError());
            return "attributes " + std::to_string(attributes);
        }
        if (op == "content") return m.ReadFile(c[1]);
        if (op == "exists") return files::Exists(c[1]) ? "yes" : "no";
        if (op == "copy" || op == "copy-new") return result(files::Copy(c[1], c[2], op == "copy-new"));
        if (op == "rename" || op == "rename-over") return result(files::Rename(c[1], c[2], op == "rename-over"));
        if (op == "remove") return result(files::Remove(c[1]));
        if (op == "mkdir") return result(files::MakeDirectory(c[1]));
        if (op == "rmdir") return result(files::RemoveDirectory(c[1]));
        ADD_FAILURE() << "unknown operation " << op;
        return "";
    }

    pextest::TestMachine m;
};

TEST_F(Files, OperationsGiveTheWindowsResults) {
    m.WriteFile("C:\\app\\noext", "");
    fs::create_directory(m.DriveC() + "/app/Sub");
    const auto sub = files::Find("C:\\app\\sub");
    ASSERT_EQ(sub.size(), 1u);
    EXPECT_EQ(sub[0].attributes, files::kAttrDirectory);
    EXPECT_EQ(files::Find("C:\\app\\src.txt")[0].size, 11u);
    for (const pextest::Case& c : pextest::ReadCases("platform/cases/file_operations.txt")) {
        SCOPED_TRACE(c.where);
        EXPECT_EQ(Do(c), c[3]);
    }
}

// On Windows the same rule is the share mode of an open handle (cfile_test.cpp). A copy to keep
// of a source that somebody holds is a real copy, so that the copy is not held too.
TEST_F(Files, AFileLockedByAnotherOpenerIsInUse) {
    PEX_LINUX_ONLY();
#ifndef _WIN32
    const int fd = open(plat::paths::ToHost("C:\\app\\dst.txt").c_str(), O_RDONLY);
    ASSERT_EQ(flock(fd, LOCK_SH), 0);
    ASSERT_TRUE(files::CopyToKeep("C:\\app\\dst.txt", "C:\\app\\kept.txt"));
    EXPECT_TRUE(files::Remove("C:\\app\\kept.txt"));
    ASSERT_EQ(flock(fd, LOCK_EX), 0);
    ExpectFails(files::Copy("C:\\app\\src.txt", "C:\\app\\dst.txt", false), plat::kErrorSharingViolation);
    ExpectFails(files::CopyToKeep("C:\\app\\dst.txt", "C:\\app\\kept.txt"), plat::kErrorSharingViolation);
    ExpectFails(files::Remove("C:\\app\\dst.txt"), plat::kErrorSharingViolation);
    std::string bytes;
    ExpectFails(files::ReadAll("C:\\app\\dst.txt", &bytes), plat::kErrorSharingViolation);
    close(fd);
    EXPECT_TRUE(files::Copy("C:\\app\\src.txt", "C:\\app\\dst.txt", false));
#endif
}

// The version reader reads pieces of a module up to its very last byte, and never beyond it.
TEST_F(Files, ARegularFileReadsAnyRangeUpToItsEnd) {
    files::RegularFile f;
    ASSERT_TRUE(f.Open("C:\\app\\src.txt"));  // "new content"
    std::string bytes;
    EXPECT_TRUE(f.ReadAt(4, 7, &bytes));
    EXPECT_EQ(bytes, "content");
    EXPECT_TRUE(f.ReadAt(11, 0, &bytes));
    EXPECT_FALSE(f.ReadAt(5, 7, &bytes));
    EXPECT_FALSE(f.ReadAt(12, 0, &bytes));
}

TEST_F(Files, TempFileNamesAreNewEmptyFiles) {
#ifndef _WIN32
    EXPECT_EQ(files::TempFolder(), "C:\\windows\\temp\\");
#endif
    const std::string a = files::TempFileName("C:\\windows\\temp\\", "pexium");
    const std::string b = files::TempFileName("C:\\windows\\temp", "pex");
    EXPECT_TRUE(std::regex_match(a, std::regex(R"(C:\\windows\\temp\\pex[0-9a-f]{4}\.tmp)"))) << a;
    EXPECT_NE(a, b);
    std::string bytes = "x";
    ASSERT_TRUE(files::ReadAll(a, &bytes));
    EXPECT_EQ(bytes, "");
    EXPECT_EQ(files::TempFileName("C:\\app", "ab", 0x2f), "C:\\app\\ab002f.tmp");
    EXPECT_FALSE(files::Exists("C:\\app\\ab002f.tmp"));
    EXPECT_EQ(files::TempFileName("C:\\none", "pex"), "");
    EXPECT_EQ(plat::LastError(), plat::kErrorPathNotFound);
}

}  // namespace
