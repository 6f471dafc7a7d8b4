// CManifestParser: a content file that cannot be loaded. Its entries are removed as for any
// discarded content file, but the file itself is moved aside, not deleted: it lists updates
// that were downloaded and never installed, and only the file shows support staff what was
// wrong with it. The product counts as failed.
#include "diag/trace_log.h"
#include "manifest/manifest_parser.h"
#include "platform/errors.h"
#include "platform/files.h"

namespace {

const char* const kRejectedSuffix = ".rejected";

bool Missing(std::uint32_t attributes) {
    if (attributes != plat::files::kInvalidAttributes) return false;
    const std::uint32_t error = plat::LastError();
    return error == plat::kErrorFileNotFound || error == plat::kErrorPathNotFound;
}

}  // namespace

std::int32_t CManifestParser::RejectContentFile() {
    const std::uint32_t attributes = plat::files::GetAttributes(contentFilePath_);
    if (Missing(attributes)) {
        // Nothing to keep: only the entries that name the missing file go.
        DiscardContentFile();
        return 0;
    }
    TRACE(g_TraceLog, "CManifestParser: ProcessUpdateInformation, content file '%s' rejected: %s",
          contentFilePath_.c_str(), table_.LoadFailure().c_str());
    const std::string kept = contentFilePath_ + kRejectedSuffix;
    // One rename, replacing an older rejected file: the content file is at one of the two names
    // at every moment. A folder (or a path whose attributes cannot be read) is never moved.
    const bool plainFile = (attributes & plat::files::kAttrDirectory) == 0;
    if (!plainFile || !plat::files::Rename(contentFilePath_, kept, true)) {
        // The entries stay with the file, so the next run meets it again and retries.
        TRACE(g_TraceLog,
              "CManifestParser: ProcessUpdateInformation, rejected content file not moved to '%s' (error %u), "
              "left in place",
              kept.c_str(), plainFile ? plat::LastError() : plat::kErrorAccessDenied);
        return 1;
    }
    TRACE(g_TraceLog, "CManifestParser: ProcessUpdateInformation, rejected content file kept as '%s'", kept.c_str());
    if (!RemoveContentFileEntries()) {
        TRACE(g_TraceLog, "CManifestParser: ProcessUpdateInformation, content file entries not removed, the next run "
                          "removes them");
    }
    return 1;
}
