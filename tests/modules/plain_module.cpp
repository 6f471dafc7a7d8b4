// A test module without version information. Answer stands for an entry point that Windows
// exports under its MSVC-decorated name (?Answer@@YAHXZ); ELF exports it plainly.
#define PEX_EXPORT extern "C" __attribute__((visibility("default")))

PEX_EXPORT const char* PexModuleName() { return "PexNoVersion"; }

PEX_EXPORT int Answer() { return 42; }
