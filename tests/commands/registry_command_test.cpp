#include "commands/registry_command.h"

#include <gtest/gtest.h>

#include "tests/support/case_file.h"

namespace {

// The parts of the parsed assignment, or the message of its first defect.
std::vector<std::string> Outcome(const std::string& parameter) {
    RegistryAssignment a;
    if (const char* message = ParseRegistryAssignment(parameter, &a)) return {parameter, message};
    const char* const types[] = {"Dword", "String", "Unknown"};
    return {parameter, types[static_cast<int>(a.type)],
            a.root == RegistryRoot::CurrentUser ? "CurrentUser" : "LocalMachine", a.subKey, a.valueName, a.data};
}

// Writing the parsed values is the executor's test and the golden run install_commands'.
TEST(RegistryCommand, PartsAndDefects) {
    for (const pextest::Case& c : pextest::ReadCases("commands/cases/registry_assignments.txt")) {
        SCOPED_TRACE(c.where);
        EXPECT_EQ(Outcome(c[0]), c.fields);
    }
}

}  // namespace
