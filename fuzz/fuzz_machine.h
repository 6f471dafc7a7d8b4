// A machine root of its own for one fuzzing process, so that the targets that map paths or look
// at files never touch a developer's machine and never wander over the host: Z: (normally the
// host's root) points at an empty folder inside the root.
#pragma once
#include <string>

namespace pexfuzz {

// Creates the root on the first call (later calls return the same one) and removes it when the
// process exits normally; roots left by ended processes go at the next start. The current
// directory is C:\ afterwards.
const std::string& UseFreshMachine();

// Writes a file into the machine by Windows path, creating its folders.
void PutFile(const std::string& winPath, const std::string& bytes);

// The bytes of a host file; empty when it cannot be read.
std::string ReadHostFile(const std::string& hostPath);

}  // namespace pexfuzz
