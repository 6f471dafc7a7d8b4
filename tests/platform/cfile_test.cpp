// The framework's file class over the emulated machine: open modes, share modes as other
// openers see them, errors as Windows codes, and writes refused by the fault plan.
#include "platform/cfile.h"

#include <gtest/gtest.h>

#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "tests/support/test_machine.h"

namespace {

using plat::CFile;
using plat::CFileException;

constexpr unsigned kCreateWrite = CFile::modeCreate | CFile::modeWrite | CFile::shareExclusive;

class CFileTest : public ::testing::Test {
protected:
    void SetUp() override {
        plat::fault::Clear();
        m.WriteFile("C:\\app\\data.bin", "0123456789");
    }
    void TearDown() override { plat::fault::Clear(); }

    // Opens and expects failure with the Windows code, both in the exception and the last error.
    static void ExpectOpenFails(const std::string& path, unsigned flags, std::uint32_t code) {
        CFile file;
        CFileException error(0, "");
        EXPECT_FALSE(file.Open(path, flags, &error)) << path;
        EXPECT_EQ(error.OsError(), code) << path;
        EXPECT_EQ(plat::LastError(), code) << path;
        EXPECT_FALSE(file.IsOpen());
    }

    pextest::TestMachine m;
};

TEST_F(CFileTest, OpenReportsWindowsCodes) {
    ExpectOpenFails("C:\\app\\missing.bin", CFile::modeRead, plat::kErrorFileNotFound);
    ExpectOpenFails("C:\\nowhere\\data.bin", CFile::modeRead, plat::kErrorPathNotFound);
    ExpectOpenFails("C:\\nowhere\\data.bin", kCreateWrite, plat::kErrorPathNotFound);
    ExpectOpenFails("C:\\app", CFile::modeRead, plat::kErrorAccessDenied);

    ASSERT_TRUE(plat::files::SetAttributes("C:\\app\\data.bin", plat::files::kAttrReadOnly));
    ExpectOpenFails("C:\\app\\data.bin", kCreateWrite, plat::kErrorAccessDenied);
    EXPECT_EQ(m.ReadFile("C:\\app\\data.bin"), "0123456789");
    CFile reader;
    EXPECT_TRUE(reader.Open("C:\\app\\data.bin", CFile::modeRead | CFile::shareDenyNone));
}

// Whether a second opener gets in beside a holder, as the share modes decide; a refused open
// changes nothing, and a closed holder keeps nobody out.
TEST_F(CFileTest, ShareModesDecideWhoElseGetsIn) {
    const unsigned read = CFile::modeRead, readWrite = CFile::modeReadWrite;
    const struct { unsigned holder, opener; bool allowed; } cases[] = {
        {readWrite | CFile::shareExclusive, read | CFile::shareDenyNone, false},
        {readWrite | CFile::shareExclusive, kCreateWrite, false},
        {read | CFile::shareDenyWrite, read | CFile::shareDenyWrite, true},
        {read | CFile::shareDenyWrite, readWrite | CFile::shareDenyNone, false},
        {readWrite | CFile::shareDenyNone, readWrite | CFile::shareDenyNone, true},
    };
    for (const auto& c : cases) {
        CFile holder, opener;
        ASSERT_TRUE(holder.Open("C:\\app\\data.bin", c.holder));
        EXPECT_EQ(opener.Open("C:\\app\\data.bin", c.opener), c.allowed) << c.holder << " " << c.opener;
        if (!c.allowed) {
            EXPECT_EQ(plat::LastError(), plat::kErrorSharingViolation);
        }
        if (c.holder & CFile::shareExclusive) {
            EXPECT_FALSE(plat::files::Copy("C:\\app\\data.bin", "C:\\app\\copy.bin", false));
            holder.Close();
            EXPECT_TRUE(plat::files::Copy("C:\\app\\data.bin", "C:\\app\\copy.bin", false));
        }
    }
    EXPECT_EQ(m.ReadFile("C:\\app\\data.bin"), "0123456789");
}

TEST_F(CFileTest, RefusedWritesThrowWithTheWindowsCode) {
    CFile out;
    ASSERT_TRUE(out.Open("C:\\app\\out.bin", kCreateWrite));
    out.Write("ab", 2);
    plat::fault::FailNth(plat::fault::Op::Write, 1, plat::kErrorDiskFull);
    try {
        out.Write("cd", 2);
        FAIL() << "the write was not refused";
    } catch (const CFileException& e) {
        EXPECT_EQ(e.OsError(), plat::kErrorDiskFull);
        EXPECT_EQ(e.FileName(), "C:\\app\\out.bin");
    }
    out.Write("ef", 2);  // only the first write after the rule fails
    out.Close();
    EXPECT_EQ(m.ReadFile("C:\\app\\out.bin"), "abef");
}

}  // namespace
