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

    pextest::TestMachine m;
};

TEST_F(Files, CopyReportsExistingTargetsAndMissingNames) {
    ExpectFails(files::Copy("C:\\app\\src.txt", "C:\\app\\dst.txt", true), plat::kErrorFileExists);
    EXPECT_EQ(m.ReadFile("C:\\app\\dst.txt"), "old content");
    ExpectFails(files::Copy("C:\\app\\none.txt", "C:\\app\\x.txt", false), plat::kErrorFileNotFound);
    ExpectFails(files::Copy("C:\\none\\a.txt", "C:\\app\\x.txt", false), plat::kErrorPathNotFound);
    ExpectFails(files::Copy("C:\\app\\src.txt", "C:\\none\\x.txt", false), plat::kErrorPathNotFound);
    ExpectFails(files::Copy("C:\\app\\src.txt", "C:\\app\\src.txt", false), plat::kErrorSharingViolation);
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

TEST_F(Files, RenameRemoveAndFoldersGiveTheWindowsCodes) {
    ExpectFails(files::Rename("C:\\app\\src.txt", "C:\\app\\dst.txt", false), plat::kErrorAlreadyExists);
    ASSERT_TRUE(files::Rename("C:\\app\\src.txt", "C:\\app\\dst.txt", true));
    EXPECT_EQ(m.ReadFile("C:\\app\\dst.txt"), "new content");
    ExpectFails(files::Rename("C:\\app\\src.txt", "C:\\app\\x.txt", false), plat::kErrorFileNotFound);
    ExpectFails(files::Rename("C:\\app\\dst.txt", "C:\\no\\x.txt", false), plat::kErrorPathNotFound);

    ExpectFails(files::Remove("C:\\app\\src.txt"), plat::kErrorFileNotFound);
    ExpectFails(files::Remove("C:\\none\\src.txt"), plat::kErrorPathNotFound);
    ExpectFails(files::Remove("C:\\app"), plat::kErrorAccessDenied);
    EXPECT_EQ(files::GetAttributes("C:\\app\\src.txt"), files::kInvalidAttributes);
    EXPECT_EQ(plat::LastError(), plat::kErrorFileNotFound);

    ExpectFails(files::MakeDirectory("C:\\APP"), plat::kErrorAlreadyExists);
    ExpectFails(files::MakeDirectory("C:\\a\\b"), plat::kErrorPathNotFound);
    ASSERT_TRUE(files::MakeDirectory("C:\\a"));
    EXPECT_EQ(files::GetAttributes("C:\\A"), files::kAttrDirectory);
    ExpectFails(files::RemoveDirectory("C:\\app"), plat::kErrorDirNotEmpty);
    EXPECT_TRUE(files::RemoveDirectory("C:\\a"));
    EXPECT_FALSE(files::Exists("C:\\a"));
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

TEST_F(Files, FindMatchesWildcardsWithoutRegardToCase) {
    m.WriteFile("C:\\app\\noext", "");
    fs::create_directory(m.DriveC() + "/app/Sub");
    auto names = [](const std::string& pattern) {
        std::string out;
        for (const auto& e : files::Find(pattern)) out += e.name + " ";
        return out;
    };
    EXPECT_EQ(names("C:\\app\\*.TXT"), "dst.txt src.txt ");
    EXPECT_EQ(names("C:\\APP\\s?c.txt"), "src.txt ");
    EXPECT_EQ(names("C:\\app\\SRC.TXT"), "src.txt ");
    EXPECT_EQ(names("C:\\app\\*.*"), "dst.txt noext src.txt Sub ");
    const auto sub = files::Find("C:\\app\\sub");
    ASSERT_EQ(sub.size(), 1u);
    EXPECT_EQ(sub[0].attributes, files::kAttrDirectory);
    EXPECT_EQ(files::Find("C:\\app\\src.txt")[0].size, 11u);

    EXPECT_EQ(names("C:\\app\\s?.txt"), "");
    EXPECT_EQ(plat::LastError(), plat::kErrorFileNotFound);
    EXPECT_EQ(names("C:\\none\\*"), "");
    EXPECT_EQ(plat::LastError(), plat::kErrorPathNotFound);
}

}  // namespace
