// Marks what Mendler.dll exports to its hosts. The library's code is built once into static
// libraries that go into Mendler.dll and also straight into pexupdate and the tests, so on
// Windows it always exports; a host that links Mendler.dll's import library defines
// MENDLER_IMPORT before including the headers.
#pragma once
#if defined(_WIN32)
#if defined(MENDLER_IMPORT)
#define MENDLER_API __declspec(dllimport)
#else
#define MENDLER_API __declspec(dllexport)
#endif
#else
#define MENDLER_API __attribute__((visibility("default")))
#endif
