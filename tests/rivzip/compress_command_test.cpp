// `pexupdate compress` and `pexupdate expand` as people run them: Windows paths of the machine
// or host paths, exit codes, and no half-expanded output left behind.
#include <gtest/gtest.h>

#include <string>

#include "platform/files.h"
#include "tests/rivzip/memory_streams.h"
#include "tests/support/platform_guard.h"
#include "tests/support/run_pexupdate.h"
#include "tests/support/test_machine.h"

namespace rivziptest {
namespace {

// The commands run through a POSIX shell (quoting, redirection), which a Windows build lacks.
class CompressCommand : public ::testing::Test {
protected:
    void SetUp() override { PEX_LINUX_ONLY(); }
    int Pexupdate(const std::string& args) { return pextest::RunPexupdate(PEXUPDATE_PATH, machine_, args).exit; }
    pextest::TestMachine machine_;
};

TEST_F(CompressCommand, CompressThenExpandByWindowsOrHostPaths) {
    Bytes bytes = TextLike(90000, 41);
    std::string original(bytes.begin(), bytes.end());
    machine_.WriteFile("C:\\pub\\setup.exe", original);
    ASSERT_EQ(Pexupdate("compress 'C:\\pub\\setup.exe' '" + machine_.DriveC() + "/pub/setup.ex_'"), 0);
    EXPECT_LT(machine_.ReadFile("C:\\pub\\setup.ex_").size(), original.size());
    ASSERT_EQ(Pexupdate("expand 'C:\\pub\\setup.ex_' 'C:\\pub\\again.exe'"), 0);
    EXPECT_EQ(machine_.ReadFile("C:\\pub\\again.exe"), original);
}

TEST_F(CompressCommand, FailuresAndUsage) {
    machine_.WriteFile("C:\\dl\\plain.txt", "not compressed");
    EXPECT_EQ(Pexupdate("expand 'C:\\dl\\plain.txt' 'C:\\dl\\out.txt'"), 1);
    EXPECT_FALSE(plat::files::Exists("C:\\dl\\out.txt")) << "a failed expansion leaves no output";
    EXPECT_EQ(Pexupdate("expand 'C:\\dl\\missing.ex_' 'C:\\dl\\out.txt'"), 1);
    EXPECT_EQ(Pexupdate("expand 'C:\\dl\\plain.txt'"), 2);
    EXPECT_EQ(Pexupdate("compress --help") + Pexupdate("expand --help"), 0);
}

}  // namespace
}  // namespace rivziptest
