// Processes: start by command line with Windows splitting and search rules, wait, exit code.
// The child is pextestprog, built beside this test program (the application folder).
#include "platform/process.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <string>
#include <vector>

#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "tests/support/case_file.h"
#include "tests/support/environment.h"
#include "tests/support/platform_guard.h"
#include "tests/support/test_machine.h"

namespace {

using plat::proc::Process;
using plat::proc::WaitResult;

// Runs a command line to its end, waiting as install commands do (dispatching messages); the
// exit code, or -1 when it did not start.
long RunToEnd(const std::string& line, const std::string& dir = "") {
    Process p;
    if (!plat::proc::Start(line, dir, &p)) return -1;
    EXPECT_EQ(plat::proc::WaitDispatching(p, plat::proc::kInfinite, true), WaitResult::Ended);
    std::uint32_t code = 0;
    EXPECT_TRUE(plat::proc::ExitCode(p, &code));
    return static_cast<long>(code);
}

// Puts a copy of pextestprog on the machine under another name (its execute bit kept).
void InstallTestProgram(const pextest::TestMachine& m, const std::string& winPath) {
    std::string app = plat::files::ModuleFileName(nullptr);
    std::string prog = app.substr(0, app.find_last_of('\\') + 1) + pextest::ProgramFile("pextestprog");
    m.WriteFile(winPath, "");
    std::filesystem::copy_file(plat::paths::ToHost(prog), plat::paths::ToHost(winPath),
                               std::filesystem::copy_options::overwrite_existing);
}

TEST(SplitCommandLine, FollowsTheWindowsRules) {
    for (const pextest::Case& c : pextest::ReadCases("platform/cases/command_lines.txt")) {
        SCOPED_TRACE(c.where);
        const std::vector<std::string> expected(c.fields.begin() + 1, c.fields.end());
        EXPECT_EQ(plat::proc::SplitCommandLine(c[0]), expected);
    }
    EXPECT_TRUE(plat::proc::SplitCommandLine("   ").empty());
}

// Windows' search: the application folder (also by the program's Windows name, in any case), the
// current folder, which is also the default working folder, PATH, and a path as given.
TEST(Process, ProgramsAreFoundWhereWindowsLooksAndGiveTheirExitCode) {
    pextest::TestMachine m;
    EXPECT_EQ(RunToEnd("pextestprog exit 7"), 7);
    EXPECT_EQ(RunToEnd("PEXTESTPROG.exe exit 3"), 3);
    InstallTestProgram(m, "C:\\cur\\here.exe");
    InstallTestProgram(m, "C:\\tools\\onpath.exe");
    InstallTestProgram(m, "C:\\Program Files\\Vantric Tool\\run me.exe");
    ASSERT_TRUE(plat::paths::ChangeDirectory("C:\\cur"));
    EXPECT_EQ(RunToEnd("here mark marker.txt"), 0);
    EXPECT_EQ(m.ReadFile("C:\\cur\\marker.txt"), "marked\n");

    std::string saved = std::getenv("PATH") ? std::getenv("PATH") : "";
    pextest::SetEnvironment("PATH", "C:\\tools;C:\\nowhere");
    long onPath = RunToEnd("onpath.exe exit 5");
    pextest::SetEnvironment("PATH", saved);
    EXPECT_EQ(onPath, 5);

    EXPECT_EQ(RunToEnd(R"("C:\Program Files\Vantric Tool\run me.exe" exit 6)"), 6);
    // Unquoted, Windows tries the path at each blank until a program is found; the program
    // then sees the rest of the line split at the blanks (an unknown command: 99). Wine quotes
    // the program's path in the line it hands over, so there the program sees "exit 6".
    if (!pextest::UnderWine()) {
        EXPECT_EQ(RunToEnd(R"(C:\Program Files\Vantric Tool\run me.exe exit 6)"), 99);
    }
}

TEST(Process, CommandLineReachesTheProgramIntact) {
    pextest::TestMachine m;
    ASSERT_TRUE(plat::files::MakeDirectory("C:\\Work Dir"));
    EXPECT_EQ(RunToEnd(R"(pextestprog argv out.txt "a b" c\"d e\\f "g\\\"h" "" tail\ "x|y>z" $HOME *)",
                       "C:\\Work Dir"),
              0);
    std::string seen = m.ReadFile("C:\\Work Dir\\out.txt");
    EXPECT_EQ(seen.substr(seen.find('\n') + 1),
              "argv\nout.txt\na b\nc\"d\ne\\\\f\ng\\\"h\n\ntail\\\nx|y>z\n$HOME\n*\n");
}

TEST(Process, ProgramThatCannotStart) {
    pextest::TestMachine m;
    Process p;
    for (const pextest::Case& c : pextest::ReadCases("platform/cases/failed_starts.txt")) {
        SCOPED_TRACE(c.where);
        EXPECT_FALSE(plat::proc::Start(c[0], c[1], &p));
        EXPECT_EQ(plat::LastError(), std::stoul(c[2]));
    }
    EXPECT_FALSE(plat::proc::Start("", "", &p));
    EXPECT_EQ(plat::LastError(), 2u);
    EXPECT_FALSE(p);

    plat::fault::FailNth(plat::fault::Op::ProcessStart, 1, 5);
    EXPECT_FALSE(plat::proc::Start("pextestprog exit 0", "", &p));
    EXPECT_EQ(plat::LastError(), 5u);
    plat::fault::Clear();
}

}  // namespace
