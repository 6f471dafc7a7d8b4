// A test module without version information. Answer stands for an entry point that Windows
// exports under its MSVC-decorated name (?Answer@@YAHXZ); ELF exports it plainly.
#ifdef _WIN32
#define PEX_EXPORT extern "C" __declspec(dllexport)
#else
#define PEX_EXPORT extern "C" __attribute__((visibility("default")))
#endif

PEX_EXPORT const char* PexModuleName() { return "PexNoVersion"; }

PEX_EXPORT int Answer() { return 42; }
