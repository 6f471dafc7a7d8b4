// CFile_::Decompress and the decompressor that every update file shares. It lives in a file of
// its own so that users of CFile_ that never decompress do not pull in the dispatcher.
#include <memory>
#include <new>

#include "decompress/decompression_objects.h"
#include "decompress/expansion_record.h"
#include "diag/trace_log.h"
#include "model/run_journal.h"
#include "model/update_file.h"

namespace {

// One dispatcher for the whole process, made on first use and kept for the life of the
// library: its loading state is process-wide anyway.
std::unique_ptr<CDecompressionObjects>& SharedDecompressor() {
    static std::unique_ptr<CDecompressionObjects> decompressor;
    return decompressor;
}

}  // namespace

bool CFile_::Decompress(ProgressCallback callback) {
    TRACE(g_TraceLog, "CFile_::Decompress");
    std::unique_ptr<CDecompressionObjects>& decompressor = SharedDecompressor();
    if (!decompressor) {
        TRACE(g_TraceLog, "CFile_::Decompress, creating Decompressor");
        decompressor.reset(new (std::nothrow) CDecompressionObjects());
        if (!decompressor) {
            TRACE(g_TraceLog, "CFile_::Decompress unable to create decompressor");
            TRACE(g_TraceLog, "CFile_::Decompress return value is %d", 0);
            return false;
        }
    }
    if (Journal && !Journal->RecordExpansion(Row, DownLoadCacheFile)) {
        TRACE(g_TraceLog, "CFile_::Decompress return value is %d", 0);
        return false;
    }
    const bool decompressed = decompressor->Decompress(CompressionType, DownLoadCacheFile, callback);
    if (decompressed) {
        NeedsDecompression = false;
        ExpansionRecordGone = false;  // the expansion wrote one
    }
    TRACE(g_TraceLog, "CFile_::Decompress return value is %d", decompressed);
    return decompressed;
}

void CFile_::UnloadDecompressor() {
    // Without a decompressor no file has loaded the library, so there is nothing to unload.
    if (std::unique_ptr<CDecompressionObjects>& decompressor = SharedDecompressor()) decompressor->Unload();
}

// Asked again at the clean-up: a record already removed is not looked for again (a lookup of a
// missing name reads the whole download folder on the emulated machine).
bool CFile_::ExpansionRecorded() {
    if (!ExpansionRecordGone) ExpansionRecordGone = DiscardExpansionRecord(DownLoadCacheFile);
    return ExpansionRecordGone;
}
