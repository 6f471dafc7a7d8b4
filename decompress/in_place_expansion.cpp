#include "decompress/in_place_expansion.h"

#include "commands/platform_utilities.h"
#include "diag/trace_log.h"
#include "platform/errors.h"
#include "platform/files.h"

namespace {

constexpr int kTempNameAttempts = 3;

std::string TempName() {
    for (int attempt = 0; attempt < kTempNameAttempts; ++attempt) {
        std::string name = sGetTempFileName();
        if (!name.empty()) return name;
    }
    return std::string();
}

// A failed close cannot change the outcome any more: the data has been written or the
// expansion has already failed.
void CloseQuietly(plat::CFile& file) {
    try {
        file.Close();
    } catch (const plat::CFileException&) {
    }
}

// Opens both files and expands temp into path. *truncated tells whether path was opened for
// writing, and so no longer holds the download.
bool ExpandCopy(const char* operation, const std::string& path, const std::string& temp,
                const Expander& expand, bool* truncated) {
    plat::CFile source, destination;
    if (!source.Open(temp, plat::CFile::modeRead | plat::CFile::shareDenyWrite | plat::CFile::typeBinary)) {
        TRACE(g_TraceLog, "CDecompressionObjects::%s, Unable to open temp file for decompress operation.", operation);
        return false;
    }
    TRACE(g_TraceLog, "CDecompressionObjects::%s, open of '%s' successfull", operation, temp.c_str());
    if (!destination.Open(path, plat::CFile::modeCreate | plat::CFile::modeWrite | plat::CFile::shareExclusive |
                                    plat::CFile::typeBinary)) {
        TRACE(g_TraceLog, "CDecompressionObjects::%s, Unable to open target file for decompress operation.", operation);
        CloseQuietly(source);
        return false;
    }
    TRACE(g_TraceLog, "CDecompressionObjects::%s, open of '%s' successfull", operation, path.c_str());
    *truncated = true;
    const std::int32_t result = expand(source, destination);
    if (result >= 0)
        TRACE(g_TraceLog, "CDecompressionObjects::%s, Decompress succeeded", operation);
    else
        TRACE(g_TraceLog, "CDecompressionObjects::%s, Decompress failed, return code is 0x%x.", operation,
              static_cast<unsigned>(result));
    CloseQuietly(destination);
    CloseQuietly(source);
    return result >= 0;
}

// Puts the compressed download back after a failed expansion, so a later run can try again
// instead of installing a partly written file. False when the copy back failed.
bool Restore(const char* operation, const std::string& path, const std::string& temp) {
    if (plat::files::Copy(temp, path, false)) {
        TRACE(g_TraceLog, "CDecompressionObjects::%s, restored the compressed file '%s' from '%s'", operation,
              path.c_str(), temp.c_str());
        return true;
    }
    TRACE(g_TraceLog,
          "CDecompressionObjects::%s, Unable to restore the compressed file '%s' from '%s', GetLastError returns %d, "
          "'%s' is kept",
          operation, path.c_str(), temp.c_str(), static_cast<int>(plat::LastError()), temp.c_str());
    return false;
}

}  // namespace

bool ExpandInPlace(const char* operation, const std::string& path, const Expander& expand) {
    const std::string temp = TempName();
    if (temp.empty()) {
        TRACE(g_TraceLog, "CDecompressionObjects::%s, unable to get Temp file name", operation);
        return false;
    }
    bool expanded = false, truncated = false;
    if (!plat::files::Copy(path, temp, false)) {
        TRACE(g_TraceLog, "CDecompressionObjects::%s, Unable to copy file for decompress operation.", operation);
    } else {
        TRACE(g_TraceLog, "CDecompressionObjects::%s, rename from '%s' to '%s' successfull", operation, path.c_str(),
              temp.c_str());
        expanded = ExpandCopy(operation, path, temp, expand, &truncated);
    }
    const bool keepTemp = !expanded && truncated && !Restore(operation, path, temp);
    if (!keepTemp) plat::files::Remove(temp);
    return expanded;
}
