// CFile_: the check of the download against the SHA-256 digest that its row records. Apply makes
// it before the target is touched, so a truncated or damaged download never replaces a working
// file; a digest that cannot be checked counts as a mismatch, never as no digest.
#include <cctype>

#include "commands/item_list.h"
#include "diag/trace_log.h"
#include "model/update_file.h"
#include "platform/digest.h"
#include "platform/errors.h"

namespace {

// The recorded digest in the lower case that the platform gives; false when it is not 64
// hexadecimal digits.
bool ParseDigest(const std::string& recorded, std::string* digest) {
    if (recorded.size() != plat::digest::kSha256HexDigits) return false;
    digest->clear();
    for (char c : recorded) {
        const auto byte = static_cast<unsigned char>(c);
        if (!std::isxdigit(byte)) return false;
        digest->push_back(static_cast<char>(std::tolower(byte)));
    }
    return true;
}

}  // namespace

bool CFile_::DownloadMatchesDigest() const {
    const std::string recorded = TrimItem(ExpectedSha256);
    if (recorded.empty()) return true;  // the row records no digest: installed as it is
    std::string expected;
    if (!ParseDigest(recorded, &expected)) {
        TRACE(g_TraceLog, "CFile_: Sha256 '%s' of file '%s' is not 64 hexadecimal digits, not applying",
              recorded.c_str(), FileName.c_str());
        return false;
    }
    std::string actual;
    if (!plat::digest::Sha256File(DownLoadCacheFile, &actual)) {
        TRACE(g_TraceLog, "CFile_: Unable to read (%s) for its Sha256, GetLastError returns %d",
              DownLoadCacheFile.c_str(), plat::LastError());
        return false;
    }
    if (actual != expected) {
        TRACE(g_TraceLog, "CFile_: Sha256 mismatch for file '%s', expected %s, download (%s) has %s",
              FileName.c_str(), expected.c_str(), DownLoadCacheFile.c_str(), actual.c_str());
        return false;
    }
    TRACE(g_TraceLog, "CFile_: Sha256 of download (%s) matches", DownLoadCacheFile.c_str());
    return true;
}
