// Loading Rivzip.dll on demand and unloading it after each decompression step, so the file can
// itself be updated between steps.
#include "decompress/decompression_objects.h"
#include "decompress/decompressor_state.h"
#include "diag/trace_log.h"
#include "platform/errors.h"

namespace {

// The entry's name as the library's Windows build exports it; the loader finds the plain
// name on platforms whose modules cannot hold a decorated one.
constexpr char kExpandEntryName[] = "?LZSS_ExpandFile@@YGJAAVCFile@@0P6GXAAUSCompressPerformance@@@ZK@Z";

using Candidate = std::string (CDecompressionObjects::*)();

}  // namespace

bool CDecompressionObjects::Load() {
    DecompressorState& state = Decompressor();
    if (state.library) return true;
    TRACE(g_TraceLog, "CDecompressionObjects::Load, Initializing");
    static constexpr Candidate kCandidates[] = {
        &CDecompressionObjects::GetRegistryPath, &CDecompressionObjects::GetDefaultPath1,
        &CDecompressionObjects::GetDefaultPath2, &CDecompressionObjects::GetDefaultPath3,
        &CDecompressionObjects::GetDLL};
    for (Candidate candidate : kCandidates) {
        std::string name;
        try {
            name = (this->*candidate)();
        } catch (...) {
            continue;  // a candidate that cannot be built is simply not tried
        }
        state.library = plat::lib::Load(name);
        if (state.library) {
            state.loadedFrom = name;
            break;
        }
    }
    if (!state.library) {
        TRACE(g_TraceLog, "CDecompressionObjects::Load, Unable to load %s", GetDLL().c_str());
        return true;
    }
    state.expandEntry = reinterpret_cast<LzssExpandFn>(plat::lib::FindExport(state.library, kExpandEntryName));
    if (state.expandEntry)
        TRACE(g_TraceLog, "CDecompressionObjects::Load, decompress function found for LZW");
    else
        TRACE(g_TraceLog, "CDecompressionObjects::Load, no decompress function found for LZW");
    return true;
}

bool CDecompressionObjects::Unload() {
    DecompressorState& state = Decompressor();
    TRACE(g_TraceLog, "CDecompressionObjects::Unload");
    if (state.expandEntry) {
        TRACE(g_TraceLog, "CDecompressionObjects::Unload, nulling function pointer");
        state.expandEntry = nullptr;
    }
    if (state.library) {
        if (plat::lib::Free(state.library))
            TRACE(g_TraceLog, "CDecompressionObjects::Unload, FreeLibrary succeeded");
        else
            TRACE(g_TraceLog, "CDecompressionObjects::Unload, FreeLibrary failed, GetLastError returns %d",
                  static_cast<int>(plat::LastError()));
        state.library = nullptr;
        state.loadedFrom.clear();
    }
    return true;
}

bool CDecompressionObjects::IsLoaded() { return Decompressor().library != nullptr; }

std::string CDecompressionObjects::LoadedFrom() { return Decompressor().loadedFrom; }
