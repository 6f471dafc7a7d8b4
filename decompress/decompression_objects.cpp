// The dispatcher: one expansion per compression code.
#include "decompress/decompression_objects.h"

#include "decompress/decompressor_state.h"
#include "decompress/in_place_expansion.h"
#include "decompress/zlib_expand.h"
#include "diag/trace_log.h"

CDecompressionObjects::CDecompressionObjects() { Load(); }

bool CDecompressionObjects::Decompress(std::uint32_t type, const std::string& path, ProgressCallback callback) {
    TRACE(g_TraceLog, "CDecompressionObjects::Decompress, file is %s", path.c_str());
    bool result = false;
    switch (type) {
        case kCompressionNone: result = DecompressNone(path, callback); break;
        case kCompressionLZW: result = DecompressLZW(path, callback); break;
        case kCompressionZLIB: result = DecompressZLib(path, callback); break;
        case kCompressionRTPatch: result = DecompressRTPatch(path, callback); break;
        default:
            TRACE(g_TraceLog, "CDecompressionObjects::Decompress, Unknown compression type %d", static_cast<int>(type));
            break;
    }
    TRACE(g_TraceLog, "CDecompressionObjects::Decompress, returning %d", result);
    return result;
}

bool CDecompressionObjects::DecompressNone(const std::string& path, ProgressCallback) {
    TRACE(g_TraceLog, "CDecompressionObjects::DecompressNone, file is %s", path.c_str());
    // Only a download that needs decompression comes here: its interested parties left no
    // compressed type to expand it by, and its compressed bytes must not be installed.
    TRACE(g_TraceLog,
          "CDecompressionObjects::DecompressNone, the file needs decompression but its download type is None, "
          "so it cannot be expanded");
    return false;
}

bool CDecompressionObjects::DecompressRTPatch(const std::string& path, ProgressCallback) {
    TRACE(g_TraceLog, "CDecompressionObjects::DecompressRTPatch, file is %s THIS FUNCTION NOT IMPLEMENTED YET",
          path.c_str());
    return false;  // the patch itself must never be installed as the file
}

bool CDecompressionObjects::DecompressLZW(const std::string& path, ProgressCallback callback) {
    TRACE(g_TraceLog, "CDecompressionObjects::DecompressLZW, file is %s", path.c_str());
    SetProgressCallback(callback);
    DecompressorState& state = Decompressor();
    if (!state.expandEntry) Load();
    bool result = false;
    if (!state.expandEntry) {
        TRACE(g_TraceLog, "CDecompressionObjects::DecompressLZW, no function pointer for this decompress type");
    } else {
        const LzssExpandFn expand = state.expandEntry;
        result = ExpandInPlace("DecompressLZW", path, [expand](plat::CFile& source, plat::CFile& destination) {
            return expand(source, destination, &CDecompressionObjects::ExpandProgress, 0);
        });
    }
    TRACE(g_TraceLog, "CDecompressionObjects::DecompressLZW, returning %d", result);
    return result;
}

bool CDecompressionObjects::DecompressZLib(const std::string& path, ProgressCallback callback) {
    TRACE(g_TraceLog, "CDecompressionObjects::DecompressZLib, file is %s", path.c_str());
    SetProgressCallback(callback);
    const bool result = ExpandInPlace("DecompressZLib", path, [](plat::CFile& source, plat::CFile& destination) {
        std::string why;
        const std::int32_t inflated = InflateFile(source, destination, &CDecompressionObjects::ExpandProgress, &why);
        if (inflated < 0) TRACE(g_TraceLog, "CDecompressionObjects::DecompressZLib, zlib reports: %s", why.c_str());
        return inflated;
    });
    TRACE(g_TraceLog, "CDecompressionObjects::DecompressZLib, returning %d", result);
    return result;
}
