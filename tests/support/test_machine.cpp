#include "tests/support/test_machine.h"

#include <filesystem>
#include <fstream>
#include <sstream>
#include <stdexcept>
#include <cstdlib>

#include "platform/machine.h"
#include "platform/paths.h"

namespace fs = std::filesystem;

namespace pextest {

#ifndef _WIN32
TestMachine::TestMachine() {
    std::string tmpl = (fs::temp_directory_path() / "pexmachine-XXXXXX").string();
    if (!mkdtemp(tmpl.data())) throw std::runtime_error("cannot create a test machine root");
    root_ = tmpl;
    plat::machine::SetRoot(root_);
    plat::machine::Ensure();
    plat::paths::ChangeDirectory("C:\\");
}

TestMachine::~TestMachine() {
    std::error_code ec;
    // Read-only files stay removable on the host: the emulation only refuses through the platform.
    fs::remove_all(root_, ec);
}

std::string TestMachine::DriveC() const { return root_ + "/drive_c"; }
#endif

void TestMachine::WriteFile(const std::string& winPath, const std::string& bytes) const {
    fs::path host = plat::paths::ToHost(winPath);
    fs::create_directories(host.parent_path());
    std::ofstream out(host, std::ios::binary | std::ios::trunc);
    out << bytes;
}

std::string TestMachine::ReadFile(const std::string& winPath) const {
    return ReadHostFile(plat::paths::ToHost(winPath));
}

std::string ReadHostFile(const std::string& hostPath) {
    std::ifstream in(hostPath, std::ios::binary);
    std::ostringstream s;
    s << in.rdbuf();
    return s.str();
}

}  // namespace pextest
