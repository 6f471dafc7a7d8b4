// A fresh emulated machine for one test: a new machine root in a temporary host folder,
// removed again when the test ends. On Windows the machine is the real one: the test gets a
// scratch folder as its root, and what it adds to the drive and the registry is removed again
// (test_machine_win32.cpp).
#pragma once
#include <string>

namespace pextest {

class TestMachine {
public:
    TestMachine();   // creates the root, points the platform at it, current directory C:\ .
    ~TestMachine();  // removes the root folder and everything in it
    TestMachine(const TestMachine&) = delete;
    TestMachine& operator=(const TestMachine&) = delete;

    const std::string& Root() const { return root_; }
    // Host path of drive C: (root/drive_c; on Windows "C:" itself).
    std::string DriveC() const;
    // Writes a file by Windows path (creating its folders) with the given bytes.
    void WriteFile(const std::string& winPath, const std::string& bytes) const;
    // Reads a file by Windows path; empty when missing.
    std::string ReadFile(const std::string& winPath) const;

private:
    std::string root_;
};

// The bytes of a host file (fixtures); empty when missing.
std::string ReadHostFile(const std::string& hostPath);
}  // namespace pextest
