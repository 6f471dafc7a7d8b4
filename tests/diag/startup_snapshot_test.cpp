// The banner and support snapshot at the top of every fresh log, and its rotation.
#include <gtest/gtest.h>

#include <regex>

#include "diag/module_version.h"
#include "diag/startup_snapshot.h"
#include "diag/suite_components.h"
#include "entry/library_startup.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"
#include "tests/support/trace_capture.h"

namespace reg = plat::reg;

namespace {

class SnapshotTest : public ::testing::Test {
protected:
    pextest::TestMachine machine;
};

// The previous run's log replaces the older backup.
TEST_F(SnapshotTest, EachLoadStartsAFreshLogWithTheBanner) {
    const std::string log = "C:\\Suite\\log\\pex_support_mendler.log";
    machine.WriteFile("C:\\Suite\\log\\pex_support_mendler.bak", "the run before\r\n");
    StartLibrary("C:\\Suite\\Mendler.dll");
    TRACE(g_TraceLog, "first run");
    StopLibrary();
    StartLibrary("C:\\Suite\\Mendler.dll");
    StopLibrary();

    const auto previous = pextest::TraceLines(machine.ReadFile("C:\\Suite\\log\\pex_support_mendler.bak"));
    const auto current = pextest::TraceLines(machine.ReadFile(log));
    ASSERT_GE(current.size(), 3u);
    // The Mendler.dll that the library search finds beside the test program.
    EXPECT_TRUE(std::regex_match(current[0], std::regex(R"(Vantric Software Update - Mendler \(Version \d\d\.\d\d\.\d\d\.\d\d\))")))
        << current[0];
    EXPECT_EQ(current[1], std::string(49, '='));
    EXPECT_EQ(current[2], "Current Working Directory: [C:\\]");
    EXPECT_EQ(previous.front(), current.front());
    EXPECT_EQ(previous.back(), "first run");
    g_TraceLog.SetFileName("");
}

TEST_F(SnapshotTest, RegistryKeysAreDumpedOrReported) {
    pextest::SetRegValue(reg::kLocalMachine, "Software\\Vantric\\Pex", "Blob", reg::kRegBinary, "\x01");
    pextest::TraceCapture trace;
    LogRegistryKeys("HKLM\\Software\\Vantric\r\nhklm\\Software\r\nHKCU\\Software\\Missing\r\nNoRoot\r\n");
    EXPECT_EQ(trace.Lines(), (std::vector<std::string>{
                                 "Logging Registry Settings: HKLM\\Software\\Vantric",
                                 "[HKLM\\Software\\Vantric]",
                                 "",
                                 "[HKLM\\Software\\Vantric\\Pex]",
                                 "\"Blob\" = Unsupported Type (3)",
                                 "Unknown Registry Root: hklm",
                                 "Logging Registry Settings: HKCU\\Software\\Missing",
                                 "[HKCU\\Software\\Missing] -- not found",
                                 "Unable to log malformed key: NoRoot",
                             }));
}

TEST_F(SnapshotTest, AFileWithoutVersionInformationIsVersionZero) {
    machine.WriteFile("C:\\Suite\\Mendler.dll", "not a module");
    EXPECT_STREQ(ModuleVersion("C:\\Suite\\Mendler.dll").Text(true), "Version 00.00.00.00");
    EXPECT_STREQ(ModuleVersion("C:\\Suite\\Mendler.dll").Text(false), "Version 0.0.0.0");
}

}  // namespace
