// CFile_: construction, queries, the target path and the small file services that Apply and
// Rollback build on.
#include "model/update_file.h"

#include "commands/platform_utilities.h"
#include "diag/trace_log.h"
#include "manifest/name_normalise.h"
#include "platform/errors.h"
#include "platform/files.h"

CFile_::CFile_(std::uint32_t row, bool downloaded, bool applied, const std::string& homeDir,
               const std::string& fileName, const std::string& downLoadCacheFile,
               const std::string& command, const std::string& updateDate,
               bool needsDecompression, std::uint32_t compressionType)
    : Row(row),
      FileName(fileName),
      DownLoadCacheFile(downLoadCacheFile),
      CompressionType(compressionType),
      Downloaded(downloaded),
      // Only a file that is here can have been put in place.
      Applied(downloaded && applied),
      Command(command),
      HomeDir(homeDir),
      NeedsDecompression(needsDecompression),
      UpdateDate(updateDate) {
    TRACE(g_TraceLog, "CFile_: Standard Application constructor complete for item @ %d", Row);
}

CFile_::CFile_(const CFile_& other)
    : Row(other.Row),
      FileName(other.FileName),
      DownLoadCacheFile(other.DownLoadCacheFile),
      CompressionType(other.CompressionType),
      Downloaded(other.Downloaded),
      Applied(other.Applied),
      BackupFileName(other.BackupFileName),
      Command(other.Command),
      HomeDir(other.HomeDir),
      NeedsDecompression(other.NeedsDecompression),
      UpdateDate(other.UpdateDate),
      TargetReplaced(other.TargetReplaced),
      TargetBefore(other.TargetBefore),
      Journal(other.Journal),
      ExpectedSha256(other.ExpectedSha256) {
    TRACE(g_TraceLog, "CFile_: STL constructor complete for item @ %d", Row);
}

bool CFile_::IsDownloaded() const {
    TRACE(g_TraceLog, "CFile_: IsDownloaded %d for file '%s', row %d", Downloaded,
          FileName.c_str(), Row);
    return Downloaded;
}

bool CFile_::IsApplied() const {
    TRACE(g_TraceLog, "File '%s' %s applied", FileName.c_str(), Applied ? "is" : "is not");
    return Applied;
}

std::string CFile_::TargetDirectory() const {
    return HomeDir.empty() ? HomeDir : AddTrailingBackslash(HomeDir);
}

std::string CFile_::TargetPath() const {
    // Drive and directory from the install directory, name and extension from FileName.
    constexpr unsigned char kDirectoryPartsOfFirst = 0x0C;
    constexpr unsigned char kNamePartsOfSecond = 0x30;
    std::string target = TargetDirectory();
    ComposePath(target, FileName, kDirectoryPartsOfFirst | kNamePartsOfSecond);
    return target;
}

std::string CFile_::MakeBackupFileName(std::string path) const {
    std::string candidate = path + ".$bak$";
    plat::files::FileStatus status;
    while (plat::files::GetStatus(candidate, &status)) {
        candidate += "x";
        TRACE(g_TraceLog, "CFile_: MakeBackupFileName, about to try '%s'", candidate.c_str());
    }
    return candidate;
}

bool CFile_::ClearReadOnly(std::string path) const {
    if (!plat::files::Exists(path)) return true;
    const std::uint32_t attributes = plat::files::GetAttributes(path);
    if (attributes == plat::files::kInvalidAttributes) {
        TRACE(g_TraceLog, "CFile_: Unable to read attributes for '%s', GetLastError returns %d",
              path.c_str(), plat::LastError());
        return false;
    }
    if (!(attributes & plat::files::kAttrReadOnly)) return true;
    if (!plat::files::SetAttributes(path, attributes & ~plat::files::kAttrReadOnly)) {
        TRACE(g_TraceLog, "CFile_: Unable to turn read only off for '%s', GetLastError returns %d",
              path.c_str(), plat::LastError());
        return false;
    }
    return true;
}

bool CFile_::Remove() {
    TRACE(g_TraceLog, "CFile_: Remove, file name is '%s'", DownLoadCacheFile.c_str());
    bool removed = false;
    if (NormaliseName(DownLoadCacheFile) == NormaliseName(TargetPath())) {
        TRACE(g_TraceLog, "CFile_: Remove, the download is the installed file itself, keeping it");
    } else {
        ClearReadOnly(DownLoadCacheFile);  // a read-only download would refuse every later run
        removed = plat::files::Remove(DownLoadCacheFile);
    }
    TRACE(g_TraceLog, "CFile_: Remove, returning %d", removed);
    return removed;
}
