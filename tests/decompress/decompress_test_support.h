// Shared set-up of the dispatcher's tests: a fresh machine and trace, built modules placed on the
// machine, and no library left loaded after a test (the dispatcher's state outlives its tests).
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

using Lines = std::vector<std::string>;

// The built Rivzip.dll and a module that lacks its entry (set by tests/decompress.cmake).
constexpr char kRivzipModule[] = PEX_RIVZIP_DLL;
constexpr char kModuleWithoutEntry[] = PEX_MODULE_WITHOUT_ENTRY;

class DecompressTest : public ::testing::Test {
protected:
    void TearDown() override { CDecompressionObjects().Unload(); }

    void Place(const char* hostModule, const std::string& winPath) {
        const std::filesystem::path target = plat::paths::ToHost(winPath);
        std::filesystem::create_directories(target.parent_path());
        std::filesystem::copy_file(hostModule, target, std::filesystem::copy_options::overwrite_existing);
    }

    pextest::TestMachine machine_;
    pextest::TraceCapture trace_;
};

}  // namespace dectest
