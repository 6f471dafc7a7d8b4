// The support snapshot written at the top of every fresh trace log: the library's version, the
// working directory, the versions of the suite's components and a dump of its registry keys.
#pragma once
#include <string>

// Writes the banner and the snapshot; libraryPath is where the library search finds
// "Mendler.dll" (empty when it finds none).
void WriteStartupSnapshot(const std::string& libraryPath);

// The snapshot's parts, for tests.
void LogComponentVersions();
void LogRegistryKeys(const std::string& keyList);
