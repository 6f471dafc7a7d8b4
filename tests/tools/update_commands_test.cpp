// `pexupdate all` and `product` as a person runs them, and a script of several lines. The library's log lives beside
// Mendler.dll, shared by every run, so one test runs `all` and `product` in turn.
#include <gtest/gtest.h>

#ifndef _WIN32
#include <sys/wait.h>
#endif

#include <algorithm>
#include <cstdio>
#include <string>

#include "tests/support/platform_guard.h"
#include "tests/support/run_pexupdate.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"
#include "tests/support/trace_capture.h"

namespace reg = plat::reg;

namespace {

pextest::CommandOutcome RunPex(const pextest::TestMachine& machine, const std::string& args) {
    return pextest::RunPexupdate(PEXUPDATE_PATH, machine, args);
}

std::vector<std::string> LogLines() {
    const std::string exe = PEXUPDATE_PATH;
    return pextest::TraceLines(
        pextest::ReadHostFile(exe.substr(0, exe.rfind('/')) + "/log/pex_support_mendler.log"));
}

bool Has(const std::vector<std::string>& lines, const std::string& line) {
    return std::find(lines.begin(), lines.end(), line) != lines.end();
}

#ifndef _WIN32  // the Windows command line takes no line feed in an argument
// A text of several lines that does not parse names the line and marks within it, tabs kept
// (the golden run pexupdate_script shows the other commands and marks).
TEST(UpdateCommands, ScriptMarksTheLineOfATextOfSeveralLines) {
    pextest::TestMachine machine;
    const pextest::CommandOutcome outcome = RunPex(machine, "script \"$(printf 'FORCED = TRUE;\\n\\tSNOOZEABLE = = 1')\"");
    EXPECT_EQ(outcome.exit, 1);
    EXPECT_NE(outcome.out.find("at line 2, column 15:\n  \tSNOOZEABLE = = 1\n  \t             ^\n"
                               "not valid: the text does not parse\n"),
              std::string::npos)
        << outcome.out;
}
#endif

// The exit status says whether something needs attention (the golden run pexupdate_script shows
// a machine without products and a product that is not registered).
TEST(UpdateCommands, StatusExitsWithWhetherSomethingIsPendingOrFailed) {
    pextest::TestMachine machine;
    pextest::SetRegText(reg::kLocalMachine, "Software\\Vantric\\Pex\\Statusprobe", "ContentFileName",
                        "C:\\Statusprobe\\content.csv");
    machine.WriteFile("C:\\Statusprobe\\content.csv", "FileName,UpgradeStatus,HomeDir\r\na.dll,ApplicationFailed,C:\\App\r\n");
    pextest::CommandOutcome failed = RunPex(machine, "status Statusprobe");
    EXPECT_EQ(failed.exit, 1);
    EXPECT_NE(failed.out.find("  not applied: row 0 a.dll in C:\\App: ApplicationFailed\n"), std::string::npos) << failed.out;
    EXPECT_EQ(RunPex(machine, "status --json").exit, 1);
    machine.WriteFile("C:\\Statusprobe\\content.csv", "FileName,UpgradeStatus\r\na.dll,AppliedSuccessfully\r\n");
    EXPECT_EQ(RunPex(machine, "status").exit, 0);
}

TEST(UpdateCommands, AllAndProductRunTheLibraryAndExplainWhereTheLogIs) {
    pextest::TestMachine machine;
    pextest::SetRegText(reg::kLocalMachine, "Software\\Vantric\\Pex\\Orlandel", "ContentFileName",
                        "C:\\Orlandel\\content.csv");
    machine.WriteFile("C:\\Orlandel\\content.csv", "FileName,UpgradeStatus\r\n");

    pextest::CommandOutcome all = RunPex(machine, "all");
    EXPECT_EQ(all.exit, 0) << all.out;
    EXPECT_EQ(all.out.rfind("Analyzing data...\nDecompressing...\nApplying...\nCleaning up\nFinished.\n", 0), 0u) << all.out;
    EXPECT_NE(all.out.find("Trace log: "), std::string::npos);
    auto lines = LogLines();
    ASSERT_FALSE(lines.empty());
    EXPECT_EQ(lines[0].rfind("Vantric Software Update - Mendler (Version ", 0), 0u);
    EXPECT_TRUE(Has(lines, "UpdateAll, key 1 is 'Orlandel'"));
    EXPECT_TRUE(Has(lines, "CManifestParser: LoadManifest load from file success"));

    pextest::CommandOutcome product = RunPex(machine, "product Orlandel --quiet");
    EXPECT_EQ(product.exit, 0);
    EXPECT_EQ(product.out, "");
    lines = LogLines();
    EXPECT_EQ(lines[0].rfind("Vantric Software Update - Mendler (Version ", 0), 0u);
    EXPECT_TRUE(Has(lines, "CManifestParser: LoadManifest, Project name is 'Orlandel'"));
    EXPECT_FALSE(Has(lines, "UpdateAll, main key is open"));

    EXPECT_EQ(RunPex(machine, "product").exit, 2);
    pextest::CommandOutcome help = RunPex(machine, "all --help");
    EXPECT_EQ(help.exit, 0);
    EXPECT_EQ(help.out.rfind("usage: pexupdate", 0), 0u);
}

}  // namespace
