// The test program's environment variables, set and removed the same way on every target
// (setenv has no Windows form; _putenv_s has no POSIX one). The platform's process start
// hands the changed environment to the programs it starts.
#pragma once
#include <string>

namespace pextest {

void SetEnvironment(const std::string& name, const std::string& value);
void RemoveEnvironment(const std::string& name);

// The file name of a program built with the tests: ".exe" added on Windows.
std::string ProgramFile(const std::string& name);

}  // namespace pextest
