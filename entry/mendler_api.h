// Marks what Mendler.dll exports to its hosts.
#pragma once
#if defined(_WIN32)
#if defined(MENDLER_BUILDING_DLL)
#define MENDLER_API __declspec(dllexport)
#else
#define MENDLER_API __declspec(dllimport)
#endif
#else
#define MENDLER_API __attribute__((visibility("default")))
#endif
