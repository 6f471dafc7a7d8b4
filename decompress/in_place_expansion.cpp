#include "decompress/in_place_expansion.h"

#include "decompress/expansion_record.h"
#include "diag/trace_log.h"
#include "platform/errors.h"
#include "platform/files.h"

namespace {

// A failed close cannot change the outcome any more: the data has been written or the
// expansion has already failed.
void CloseQuietly(plat::CFile& file) {
    try {
        file.Close();
    } catch (const plat::CFileException&) {
    }
}

// Flushed before it is renamed, so that the name never points at data still in the cache.
bool FlushQuietly(plat::CFile& file) {
    try {
        file.Flush();
        return true;
    } catch (const plat::CFileException&) {
        return false;
    }
}

// Expands the download at path into staging; the download itself is only read.
bool ExpandInto(const char* operation, const std::string& path, const std::string& staging, const Expander& expand) {
    plat::CFile source, destination;
    if (!source.Open(path, plat::CFile::modeRead | plat::CFile::shareDenyWrite | plat::CFile::typeBinary)) {
        TRACE(g_TraceLog, "CDecompressionObjects::%s, Unable to open the download for decompress operation.", operation);
        return false;
    }
    TRACE(g_TraceLog, "CDecompressionObjects::%s, open of '%s' successfull", operation, path.c_str());
    if (!destination.Open(staging, plat::CFile::modeCreate | plat::CFile::modeWrite | plat::CFile::shareExclusive |
                                       plat::CFile::typeBinary)) {
        TRACE(g_TraceLog, "CDecompressionObjects::%s, Unable to open target file for decompress operation.", operation);
        CloseQuietly(source);
        return false;
    }
    TRACE(g_TraceLog, "CDecompressionObjects::%s, open of '%s' successfull", operation, staging.c_str());
    const std::int32_t result = expand(source, destination);
    const bool expanded = result >= 0 && FlushQuietly(destination);
    if (expanded)
        TRACE(g_TraceLog, "CDecompressionObjects::%s, Decompress succeeded", operation);
    else
        TRACE(g_TraceLog, "CDecompressionObjects::%s, Decompress failed, return code is 0x%x.", operation,
              static_cast<unsigned>(result));
    CloseQuietly(destination);
    CloseQuietly(source);
    return expanded;
}

// Records the expansion, then lets it take the download's name in one step.
bool PutInPlace(const char* operation, const std::string& path, const std::string& staging) {
    if (!RecordExpansion(path, staging)) {
        TRACE(g_TraceLog, "CDecompressionObjects::%s, Unable to record the expansion of '%s', GetLastError returns %d",
              operation, path.c_str(), static_cast<int>(plat::LastError()));
        return false;
    }
    if (!plat::files::Rename(staging, path, true)) {
        TRACE(g_TraceLog, "CDecompressionObjects::%s, Unable to put the expansion in place of '%s', GetLastError returns %d",
              operation, path.c_str(), static_cast<int>(plat::LastError()));
        DiscardExpansionRecord(path);
        return false;
    }
    TRACE(g_TraceLog, "CDecompressionObjects::%s, '%s' replaced by its expansion", operation, path.c_str());
    return true;
}

}  // namespace

bool ExpandInPlace(const char* operation, const std::string& path, const Expander& expand) {
    if (IsRecordedExpansion(path)) {
        TRACE(g_TraceLog,
              "CDecompressionObjects::%s, '%s' holds the expansion that an earlier run made and did not record, "
              "not expanding it again",
              operation, path.c_str());
        return true;
    }
    DiscardExpansionRecord(path);  // a stale one names other bytes; a new one is written below
    const std::string staging = path + ".$new$";
    const bool expanded = ExpandInto(operation, path, staging, expand) && PutInPlace(operation, path, staging);
    if (!expanded && plat::files::Exists(staging)) plat::files::Remove(staging);
    return expanded;
}
