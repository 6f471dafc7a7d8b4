#include "tests/support/environment.h"

#include <cstdlib>

namespace pextest {

void SetEnvironment(const std::string& name, const std::string& value) {
#ifdef _WIN32
    _putenv_s(name.c_str(), value.c_str());
#else
    setenv(name.c_str(), value.c_str(), 1);
#endif
}

void RemoveEnvironment(const std::string& name) {
#ifdef _WIN32
    // An empty value removes the variable.
    _putenv_s(name.c_str(), "");
#else
    unsetenv(name.c_str());
#endif
}

std::string ProgramFile(const std::string& name) {
#ifdef _WIN32
    return name + ".exe";
#else
    return name;
#endif
}

}  // namespace pextest
