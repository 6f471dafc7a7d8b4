// The parameter parser of [REGISTRY] install commands over any text (the commands come from
// content files), and the DWORD reading of the data. An accepted parameter is fully formed.
#include <cstdint>
#include <cstdlib>
#include <string>

#include "commands/registry_command.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string parameter(reinterpret_cast<const char*>(data), size);
    RegistryAssignment assignment;
    if (ParseRegistryAssignment(parameter, &assignment) == nullptr) {
        if (assignment.data.empty() || assignment.data.find('/') != std::string::npos ||
            assignment.subKey.find('/') != std::string::npos)
            std::abort();
    }
    RegistryDwordFromText(parameter);
    return 0;
}
