// Shared set-up of the dispatcher's tests: a fresh machine and trace, built modules placed on the
// machine, the dispatcher's process-wide state reset after each test.
#pragma once
#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <vector>

#include "decompress/decompression_objects.h"
#include "platform/paths.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace dectest {

// The built Rivzip.dll and a module that lacks its entry (set by tests/decompress.cmake).
constexpr char kRivzipModule[] = PEX_RIVZIP_DLL;
constexpr char kModuleWithoutEntry[] = PEX_MODULE_WITHOUT_ENTRY;

class DecompressTest : public ::testing::Test {
protected:
    // Unloads whatever a test loaded, so the next starts with no library (the state outlives tests).
    void TearDown() override { CDecompressionObjects().Unload(); }

    // Copies a built module to a Windows path of the machine.
    void Place(const char* hostModule, const std::string& winPath) {
        const std::filesystem::path target = plat::paths::ToHost(winPath);
        std::filesystem::create_directories(target.parent_path());
        std::filesystem::copy_file(hostModule, target, std::filesystem::copy_options::overwrite_existing);
    }

    // The temporary name that the trace shows sGetTempFileName giving (the last one).
    std::string TempName() const {
        const std::string prefix = "CManifestParser: sGetTempFileName, return is '";
        std::string name;
        for (const std::string& line : trace_.Lines())
            if (line.rfind(prefix, 0) == 0) name = line.substr(prefix.size(), line.size() - prefix.size() - 1);
        return name;
    }

    // The trace lines of one in-place expansion that succeeds or fails in the expander.
    std::vector<std::string> ExpansionLines(const std::string& op, const std::string& path, const std::string& temp,
                                            const std::string& outcome) const {
        const std::string p = "CDecompressionObjects::" + op + ", ";
        return {"CManifestParser: sGetTempFileName",
                "CManifestParser: sGetTempFileName, return is '" + temp + "'",
                p + "rename from '" + path + "' to '" + temp + "' successfull",
                p + "open of '" + temp + "' successfull",
                p + "open of '" + path + "' successfull",
                p + outcome};
    }

    pextest::TestMachine machine_;
    pextest::TraceCapture trace_;
};

}  // namespace dectest
