// What the support snapshot does with keys that no run's fixed key list has, and the version of
// a file without version information. The banner, the snapshot and the log's rotation to its
// .bak at each load are the golden runs' (host_calls_twice, startup_snapshot; the status of
// pexupdate_status_interrupted reads a run from the .bak).
#include <gtest/gtest.h>

#include "diag/module_version.h"
#include "diag/startup_snapshot.h"
#include "diag/suite_components.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"
#include "tests/support/trace_capture.h"

namespace reg = plat::reg;

namespace {

TEST(SnapshotTest, RegistryKeysAreDumpedOrReported) {
    pextest::TestMachine machine;
    pextest::CreateRegKey(reg::kLocalMachine, "Software\\Vantric\\Pex");
    pextest::TraceCapture trace;
    LogRegistryKeys("HKLM\\Software\\Vantric\r\nhklm\\Software\r\nHKCU\\Software\\Missing\r\nNoRoot\r\n");
    EXPECT_EQ(trace.Lines(), (std::vector<std::string>{
                                 "Logging Registry Settings: HKLM\\Software\\Vantric",
                                 "[HKLM\\Software\\Vantric]",
                                 "",
                                 "[HKLM\\Software\\Vantric\\Pex]",
                                 "Unknown Registry Root: hklm",
                                 "Logging Registry Settings: HKCU\\Software\\Missing",
                                 "[HKCU\\Software\\Missing] -- not found",
                                 "Unable to log malformed key: NoRoot",
                             }));
}

TEST(SnapshotTest, AFileWithoutVersionInformationIsVersionZero) {
    pextest::TestMachine machine;
    machine.WriteFile("C:\\Suite\\Mendler.dll", "not a module");
    EXPECT_STREQ(ModuleVersion("C:\\Suite\\Mendler.dll").Text(true), "Version 00.00.00.00");
    EXPECT_STREQ(ModuleVersion("C:\\Suite\\Mendler.dll").Text(false), "Version 0.0.0.0");
}

}  // namespace
