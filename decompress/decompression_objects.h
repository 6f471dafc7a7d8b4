// CDecompressionObjects: expands a downloaded file in place according to its compression code.
// LZW files are expanded by the external library Rivzip.dll, loaded on demand; ZLIB files by
// zlib, linked in. The state is process-wide and shared by every instance, unguarded: one run
// at a time, on the caller's thread.
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

// The record through which Rivzip.dll reports progress (rivzip/compress_performance.h); only its
// starting flag, processed amount, ending flag and total amount are read here.
struct SCompressPerformance;

class CDecompressionObjects {
public:
    CDecompressionObjects();  // calls Load

    // True when the file at path is expanded in place and ready to use. Only a download that
    // needs decompression is given here. False for None, an unknown code and every failed
    // expansion; the file at path then still holds the download as it was (see DecompressLZW).
    bool Decompress(std::uint32_t type, const std::string& path, ProgressCallback callback);
    // False, the file left as it is: a download that needs decompression whose download type
    // came out as None (its interested parties share no compressed type) has no expansion, and
    // installing its compressed bytes would break the target.
    bool DecompressNone(const std::string& path, ProgressCallback callback);
    // Expands the SZDD file at path in place through Rivzip.dll, by way of a temporary copy;
    // progress goes to callback. On failure the download is left as it was: a failure before the
    // file is opened for writing does not touch it, and after a failed expansion the compressed
    // data is copied back from the temporary copy (which is kept, and named in the log, only
    // when that copy back fails). No temporary file remains otherwise.
    bool DecompressLZW(const std::string& path, ProgressCallback callback);
    // As DecompressLZW for a zlib or gzip stream (concatenated gzip members included), expanded
    // with zlib; data that is corrupt, truncated or followed by anything else fails.
    bool DecompressZLib(const std::string& path, ProgressCallback callback);
    // False: there is no patch engine, so a patch is never installed as the file itself.
    bool DecompressRTPatch(const std::string& path, ProgressCallback callback);

    // Both always report success; the outcome shows in whether the expand entry is set.
    // Load does nothing while a library is loaded, even one without the expand entry.
    bool Load();
    bool Unload();
    // True while a library is loaded (with or without its expand entry).
    static bool IsLoaded();
    // The candidate text that loaded the current library; empty when none is loaded.
    static std::string LoadedFrom();

    // Candidates for the library's location, tried in this order. Each gives the text handed to
    // the library loader; an empty text (GetRegistryPath's failures) never loads.
    std::string GetRegistryPath();
    std::string GetDefaultPath1();
    std::string GetDefaultPath2();
    std::string GetDefaultPath3();
    std::string GetDLL();

    // The progress function handed to the library: forwards a thinned-out selection of the
    // reports to the stored callback through g_ProgressData, amounts shifted right by 3. A
    // starting report gives two calls (item total, then item done); counted from it, every
    // 2500th report gives one; an ending report gives one, with the total as the amount done.
    static void ExpandProgress(SCompressPerformance& performance);
    // Stores the callback that ExpandProgress reports to (null: none). DecompressLZW and
    // DecompressZLib store theirs.
    static void SetProgressCallback(ProgressCallback callback);
};
