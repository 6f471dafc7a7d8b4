// `pexupdate all` and `pexupdate product` as a person runs them. The library's log lives beside
// Mendler.dll, shared by every run, so this is one test that runs the commands in turn.
#include <gtest/gtest.h>

#include <sys/wait.h>

#include <algorithm>
#include <cstdio>
#include <string>

#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"
#include "tests/support/trace_capture.h"

namespace reg = plat::reg;

namespace {

struct Outcome {
    int exit = -1;
    std::string out;
};

Outcome RunPex(const pextest::TestMachine& machine, const std::string& args) {
    const std::string command = "'" PEXUPDATE_PATH "' --machine '" + machine.Root() + "' " + args + " 2>&1";
    Outcome o;
    FILE* pipe = popen(command.c_str(), "r");
    char buffer[4096];
    for (size_t n; (n = fread(buffer, 1, sizeof buffer, pipe)) > 0;) o.out.append(buffer, n);
    const int status = pclose(pipe);
    o.exit = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    return o;
}

std::vector<std::string> LogLines() {
    const std::string exe = PEXUPDATE_PATH;
    return pextest::TraceLines(
        pextest::ReadHostFile(exe.substr(0, exe.rfind('/')) + "/log/pex_support_mendler.log"));
}

bool Has(const std::vector<std::string>& lines, const std::string& line) {
    return std::find(lines.begin(), lines.end(), line) != lines.end();
}

TEST(UpdateCommands, AllAndProductRunTheLibraryAndExplainWhereTheLogIs) {
    pextest::TestMachine machine;
    pextest::SetRegText(reg::kLocalMachine, "Software\\Vantric\\Pex\\Orlandel", "ContentFileName",
                        "C:\\Orlandel\\content.csv");
    machine.WriteFile("C:\\Orlandel\\content.csv", "FileName,UpgradeStatus\r\n");

    Outcome all = RunPex(machine, "all");
    EXPECT_EQ(all.exit, 0) << all.out;
    EXPECT_EQ(all.out.rfind("Analyzing data...\nDecompressing...\nApplying...\nCleaning up\nFinished.\n", 0), 0u) << all.out;
    EXPECT_NE(all.out.find("Trace log: "), std::string::npos);
    auto lines = LogLines();
    ASSERT_FALSE(lines.empty());
    EXPECT_EQ(lines[0].rfind("Vantric Software Update - Mendler (Version ", 0), 0u);
    EXPECT_TRUE(Has(lines, "UpdateAll, key 1 is 'Orlandel'"));
    EXPECT_TRUE(Has(lines, "CManifestParser: LoadManifest load from file success"));

    Outcome product = RunPex(machine, "product Orlandel --quiet");
    EXPECT_EQ(product.exit, 0);
    EXPECT_EQ(product.out, "");
    lines = LogLines();
    EXPECT_EQ(lines[0].rfind("Vantric Software Update - Mendler (Version ", 0), 0u);
    EXPECT_TRUE(Has(lines, "CManifestParser: LoadManifest, Project name is 'Orlandel'"));
    EXPECT_FALSE(Has(lines, "UpdateAll, main key is open"));

    EXPECT_EQ(RunPex(machine, "product").exit, 2);
    Outcome help = RunPex(machine, "all --help");
    EXPECT_EQ(help.exit, 0);
    EXPECT_EQ(help.out.rfind("usage: pexupdate", 0), 0u);
}

}  // namespace
