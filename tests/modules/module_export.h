// How the test modules export their entries: by name, as from a Windows DLL.
#pragma once
#ifdef _WIN32
#define PEX_EXPORT extern "C" __declspec(dllexport)
#else
#define PEX_EXPORT extern "C" __attribute__((visibility("default")))
#endif
