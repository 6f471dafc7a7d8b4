// CFile_: what a run finds of an earlier run that ended before it was done (a crash, a power
// cut, a killed process). Such a run leaves backups beside targets (".$bak$", ".$bak$x", ...),
// targets that already hold their new version while the content file still offers the row,
// and, for rows it committed, backups and downloads that its clean-up never deleted.
//
// The rule throughout: a leftover backup is used or deleted only when the bytes on disk prove
// what it is; any other leftover is kept, since it may hold the only copy of an earlier version.
#include <cstring>
#include <memory>
#include <new>
#include <vector>

#include "diag/trace_log.h"
#include "model/update_file.h"
#include "platform/cfile.h"
#include "platform/files.h"

namespace {

bool ReadBlock(plat::CFile& file, unsigned char* buffer, std::uint32_t size, std::uint32_t* got) {
    try {
        *got = file.Read(buffer, size);
        return true;
    } catch (const plat::CFileException&) {
        return false;
    }
}

// True only when both files can be read and hold the same bytes.
bool SameBytes(const std::string& a, const std::string& b) {
    plat::files::FileStatus sa, sb;
    if (!plat::files::GetStatus(a, &sa) || !plat::files::GetStatus(b, &sb) || sa.size != sb.size) return false;
    constexpr std::uint32_t kBlock = 64 * 1024;
    std::unique_ptr<unsigned char[]> bufferA(new (std::nothrow) unsigned char[kBlock]);
    std::unique_ptr<unsigned char[]> bufferB(new (std::nothrow) unsigned char[kBlock]);
    plat::CFile fa, fb;
    constexpr unsigned kRead = plat::CFile::modeRead | plat::CFile::shareDenyWrite | plat::CFile::typeBinary;
    if (!bufferA || !bufferB || !fa.Open(a, kRead) || !fb.Open(b, kRead)) return false;
    for (;;) {
        std::uint32_t gotA = 0, gotB = 0;
        if (!ReadBlock(fa, bufferA.get(), kBlock, &gotA) || !ReadBlock(fb, bufferB.get(), kBlock, &gotB)) return false;
        if (gotA != gotB || std::memcmp(bufferA.get(), bufferB.get(), gotA) != 0) return false;
        if (gotA == 0) return true;
    }
}

}  // namespace

// The backups that exist for a target, oldest first: target.$bak$, then each with one more
// "x", up to the first name that is free (where MakeBackupFileName would put a new one).
std::vector<std::string> CFile_::ExistingBackups(const std::string& target) {
    std::vector<std::string> backups;
    plat::files::FileStatus status;
    for (std::string name = target + ".$bak$"; plat::files::GetStatus(name, &status); name += "x")
        backups.push_back(name);
    return backups;
}

// The target already holds exactly the downloaded bytes while backups of it exist: an earlier
// run backed the target up and copied this file over it, then ended before the content file
// said so. The most recent backup holds the previous version; it becomes this file's backup,
// as if this run had taken it, and the target (this file's own bytes) is not backed up over
// it. A target that holds the new bytes with no backup beside it is backed up as usual: it
// may have been that way before the update, so deleting it on rollback could lose it.
bool CFile_::AdoptEarlierCopy(const std::string& target, const std::vector<std::string>& backups) {
    if (backups.empty() || !SameBytes(target, DownLoadCacheFile)) return false;
    BackupFileName = backups.back();
    TargetReplaced = true;
    TRACE(g_TraceLog,
          "CFile_: '%s' already holds this update, copied by an earlier run that did not finish; "
          "its previous version stays in '%s'",
          target.c_str(), BackupFileName.c_str());
    return true;
}

// Where to back the target up: a leftover backup that holds exactly the target's bytes (an
// earlier run backed it up and ended before replacing it) is taken again rather than left
// beside a new one (*reused); otherwise a new name.
std::string CFile_::ReusableBackup(const std::string& target, const std::vector<std::string>& backups,
                                   bool* reused) const {
    *reused = true;
    for (auto it = backups.rbegin(); it != backups.rend(); ++it) {
        if (SameBytes(*it, target)) {
            TRACE(g_TraceLog, "CFile_: '%s' already holds the target as it is, left by an earlier run; reusing it",
                  it->c_str());
            return *it;
        }
    }
    *reused = false;
    // With no backup at all the first name was just found free; asking again would read the
    // whole folder once more on the emulated machine.
    return backups.empty() ? target + ".$bak$" : MakeBackupFileName(target);
}

bool CFile_::RemoveLeftovers() {
    const std::string target = TargetPath();
    if (!plat::files::Exists(DownLoadCacheFile) || !SameBytes(target, DownLoadCacheFile)) return true;
    TRACE(g_TraceLog, "CFile_: '%s' was applied by an earlier run that did not clean up, removing its leftovers",
          FileName.c_str());
    // Newest first, stopping at a failure, so that what is left is still a chain that
    // ExistingBackups finds; the download goes last, so that a later run can still tell
    // that the target holds it.
    const std::vector<std::string> backups = ExistingBackups(target);
    for (auto it = backups.rbegin(); it != backups.rend(); ++it) {
        ClearReadOnly(*it);
        if (!plat::files::Remove(*it)) return false;
    }
    return ExpansionRecorded() && Remove();
}
