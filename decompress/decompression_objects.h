// CDecompressionObjects: expands a downloaded file in place according to its compression code.
// LZW files are expanded by the external library Rivzip.dll, loaded on demand; the state is
// process-wide and shared by every instance.
#pragma once
#include <cstdint>
#include <string>

#include "entry/progress_data.h"

// Compression codes; a higher code is a better download type.
enum CompressionCode : std::uint32_t {
    kCompressionNone = 0,
    kCompressionLZW = 1,
    kCompressionZLIB = 2,
    kCompressionRTPatch = 3,
};

// The record through which Rivzip.dll reports progress; only these four fields are read here.
struct SCompressPerformance;

class CDecompressionObjects {
public:
    CDecompressionObjects();  // calls Load

    // True when the file at path is ready to use (expanded, or needing no expansion).
    bool Decompress(std::uint32_t type, const std::string& path, ProgressCallback callback);
    bool DecompressNone(const std::string& path, ProgressCallback callback);
    bool DecompressLZW(const std::string& path, ProgressCallback callback);
    bool DecompressZLib(const std::string& path, ProgressCallback callback);
    bool DecompressRTPatch(const std::string& path, ProgressCallback callback);

    // Both always report success; the outcome shows in whether the expand entry is set.
    bool Load();
    bool Unload();
    static bool IsLoaded();

    // Candidates for the library's location, tried in this order.
    std::string GetRegistryPath();
    std::string GetDefaultPath1();
    std::string GetDefaultPath2();
    std::string GetDefaultPath3();
    std::string GetDLL();

    // The progress function handed to the library.
    static void ExpandProgress(SCompressPerformance& performance);
};
