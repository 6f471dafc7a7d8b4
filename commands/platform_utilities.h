// Small services over the platform that several parts of the library share: the registry-backed
// product profile, process start with a responsive wait, file versions, registry text dumps,
// in-process server lookup, temporary names, directory trees and number parsing. None keeps
// state between calls; none throws; only sGetTempFileName writes to the trace log.
#pragma once
#include <cstdint>
#include <string>

#include "platform/registry.h"

// The product profile: each section is a key below HKLM\software\Vantric\Pex (the empty
// section is that key itself); an entry is a string value of the section key.
class CProfile {
public:
    // The entry's stored bytes as text, or dflt when the section or entry is missing. Creates
    // the section key where access allows.
    std::string ReadProfileEntry(const std::string& section, const std::string& entry,
                                 const std::string& dflt) const;
    // entry null: nothing happens, false. value null: deletes the entry. Otherwise stores value
    // as a string including its terminating zero. True when the store or delete succeeded.
    bool WriteProfileEntry(const std::string& section, const char* entry, const char* value) const;
};

constexpr std::uint32_t kInfinite = 0xFFFFFFFFu;

// Starts the command line in directory; with wait, waits up to timeoutMs (kInfinite: forever).
// False when the process could not be started or was still running at the time-out (it is
// then left running). The exit code is not examined.
bool RunProcess(const std::string& commandLine, const std::string& directory, bool wait,
                std::uint32_t timeoutMs, bool dispatchMessages);

// The file version (not the product version) as its two 32-bit halves; false without version
// information.
bool GetFileVersion(const std::string& path, std::uint32_t* mostSignificant,
                    std::uint32_t* leastSignificant);
// "%hd.%hd.%hd.%hd" of the file version; empty and false without version information.
bool GetFileVersionText(const std::string& path, std::string* text);

// Appends "\" unless the text already ends in one (an empty text becomes "\").
std::string AddTrailingBackslash(const std::string& text);

// One line describing a registry value, as the support snapshot shows it.
std::string RegistryValueText(const std::string& name, std::uint32_t type, const std::uint8_t* data,
                              std::uint32_t size);
// Recursive text dump of rootName\subKey below root. status is 0 on success (a missing key
// included), else the registry error, with an empty text.
std::string RegistryKeyDump(const std::string& rootName, plat::reg::HKey root,
                            const std::string& subKey, long* status);

// The in-process server file of a programmatic identifier; empty when it or its server is
// not registered.
std::string InprocServerPath(const std::string& progId);

// Path merge: rebuilds path from the parts of path and second that flags select.
void ComposePath(std::string& path, const std::string& second, unsigned char flags);

// A new, empty, uniquely named file "pex....tmp" in the temporary folder; empty on failure.
std::string sGetTempFileName();

// Creates the folder and its missing parents, outermost first. False only for an empty path.
bool CreateDirectoryTree(const std::string& path);

// strtoul with automatic base after trimming blanks, tabs and line feeds; 0 for non-numbers.
std::uint32_t NumberFromText(const std::string& text);
