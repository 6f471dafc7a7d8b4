// A test module without version information. Answer stands for an entry point that Windows
// exports under its MSVC-decorated name (?Answer@@YAHXZ); ELF exports it plainly.
#include "module_export.h"

PEX_EXPORT const char* PexModuleName() { return "PexNoVersion"; }

PEX_EXPORT int Answer() { return 42; }
