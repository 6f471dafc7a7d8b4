// The test machine on Windows: the real machine, restored by the sandbox around each test,
// and a scratch folder of the test's own as its root.
#ifdef _WIN32
#include <filesystem>
#include <random>
#include <stdexcept>

#include "platform/paths.h"
#include "tests/support/machine_sandbox.h"
#include "tests/support/test_machine.h"

namespace fs = std::filesystem;

namespace pextest {

TestMachine::TestMachine() {
    sandbox::Restore();
    std::random_device random;
    root_ = (fs::temp_directory_path() / ("pexmachine-" + std::to_string(random()))).string();
    std::error_code ec;
    if (!fs::create_directories(root_, ec)) throw std::runtime_error("cannot create a test root");
    plat::paths::ChangeDirectory("C:\\");
}

TestMachine::~TestMachine() {
    // The current folder may be one that the sandbox is about to remove.
    plat::paths::ChangeDirectory("C:\\");
    sandbox::Restore();
}

std::string TestMachine::DriveC() const { return "C:"; }

}  // namespace pextest
#endif
