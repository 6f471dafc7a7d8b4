// The emulated Windows machine: one host folder (the machine root) that holds the drives and
// the registry, laid out like a Wine prefix:
//   <root>/drive_c/            C:
//   <root>/dosdevices/c: -> ../drive_c
//   <root>/dosdevices/z: -> /  (Z: is the host's root)
//   <root>/registry.db         the registry
// On Windows the machine is the real one and these calls only report it.
#pragma once
#include <string>

namespace plat::machine {

// The root in use: the one set by SetRoot, else $PEX_MACHINE, else
// $XDG_DATA_HOME/pex/machine, else ~/.local/share/pex/machine.
std::string Root();

// Points the platform at another machine root (tests, `pexupdate --machine`). Closes the
// registry of the previous root and resets the current directory to C:\.
void SetRoot(const std::string& hostDir);

// Creates the missing pieces of the root (drive_c with windows\system32 and windows\temp,
// the dosdevices links). An existing drive_c is adopted as it is. Returns false and sets the
// last error when the root cannot be made.
bool Ensure();

// Registers a function that SetRoot calls before it switches to another root, so that state
// kept for the old root (the open registry database) is released. Registering the same
// function again has no effect.
void OnRootChange(void (*callback)());

}  // namespace plat::machine
