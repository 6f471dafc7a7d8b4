// CFile_::Apply: back up the target, copy the download into place (through the setup service
// when the plain copy fails), date it and run its install commands.
#include "commands/command_string.h"
#include "commands/platform_utilities.h"
#include "diag/trace_log.h"
#include "model/run_journal.h"
#include "model/update_file.h"
#include "platform/errors.h"
#include "platform/files.h"
#include "platform/setup_install.h"

std::int32_t CFile_::Apply() {
    TRACE(g_TraceLog, "CFile_: Apply");
    const std::int32_t result = Install();
    TRACE(g_TraceLog, "CFile_: return value is %d", result);
    return result;
}

std::int32_t CFile_::Install() {
    if (Applied) {
        TRACE(g_TraceLog, "CFile_: File '%s' already applied, no action taken", FileName.c_str());
        return kApplied;
    }
    TRACE(g_TraceLog, "CFile_: Applying file '%s'", FileName.c_str());
    if (!DownloadMatchesDigest()) return kNotApplied;  // before anything is touched
    // A folder that cannot be made shows as the copy's failure below.
    CreateDirectoryTree(TargetDirectory());
    const std::string target = TargetPath();
    bool announced = false;
    if (!PreserveTarget(target, &announced)) return kNotApplied;
    if (Journal && !announced && !Journal->RecordReplace(Row, DownLoadCacheFile, target, BackupFileName))
        return kNotApplied;
    if (!plat::files::Copy(DownLoadCacheFile, target, false)) {
        InstallThroughSetup(target);
        return kNotApplied;
    }
    TargetReplaced = true;
    TRACE(g_TraceLog, "CFile_: Copy successful, source is (%s), target is (%s)",
          DownLoadCacheFile.c_str(), target.c_str());
    SetFileDateTime(target);  // a file with the copy's date still works
    return RunCommands();
}

// Makes sure the target's present state can be restored; false stops Apply before the target
// is touched.
bool CFile_::PreserveTarget(const std::string& target, bool* announced) {
    if (!plat::files::Exists(target)) {
        TRACE(g_TraceLog,
              "CFile_: Backup not needed, no instance of target file on system to back up...");
        return true;
    }
    if (TargetReplaced) {
        ClearReadOnly(target);  // a read-only target fails the copy, which reports it
        // The target holds this file's own copy from an earlier attempt; backing it up now would
        // overwrite the only copy of the previous version with it.
        if (BackupFileName.empty()) {
            TRACE(g_TraceLog, "CFile_: Backup not taken, the target is this file's earlier copy "
                              "and had no previous version");
        } else {
            TRACE(g_TraceLog, "CFile_: Backup not taken, the target is this file's earlier copy; "
                              "its previous version stays in '%s'", BackupFileName.c_str());
        }
        return true;
    }
    return BackUp(target, announced);
}

// A backup always takes a name that was free, so it can only ever be this run's own file: a
// file found under a backup's name is left alone, whatever it holds. A retried group backs up
// into the name made the first time (its rollback removed that backup). The replacement is
// announced with the backup, in one flush of the journal: the backup is made whole or not at
// all, so a run that ends before it finds the target untouched.
bool CFile_::BackUp(const std::string& target, bool* announced) {
    const bool retried = !BackupFileName.empty();
    if (!retried) BackupFileName = MakeBackupFileName(target);
    plat::files::GetStatus(target, &TargetBefore);  // what a restore gives back
    ClearReadOnly(target);  // a read-only target fails the copy, which reports it
    if (retried) ClearReadOnly(BackupFileName);  // a backup of a read-only target is read-only too
    if (Journal && !Journal->RecordBackupAndReplace(Row, DownLoadCacheFile, target, BackupFileName, TargetBefore))
        return false;
    *announced = Journal != nullptr;
    if (!plat::files::CopyToKeep(target, BackupFileName)) {
        TRACE(g_TraceLog, "CFile_: Backup of file %s to %s failed, reason code is %d",
              FileName.c_str(), BackupFileName.c_str(), plat::LastError());
        return false;
    }
    TRACE(g_TraceLog, "CFile_: Backup successful...");
    return true;
}

// The setup service replaces a target in use at the next restart. Whatever it does, Apply
// reports the file as not applied: the new version is not (or not yet) what runs, and its
// install commands have not run.
void CFile_::InstallThroughSetup(const std::string& target) {
    TRACE(g_TraceLog,
          "CFile_: Copy not successfull, reason code is %d, source was (%s), target was (%s), "
          "retrying with SetupAPI",
          plat::LastError(), DownLoadCacheFile.c_str(), target.c_str());
    if (Journal && !Journal->RecordQueued(Row, DownLoadCacheFile, target)) return;
    bool inUse = false;
    constexpr std::uint32_t kStyle =
        plat::setup::kCopySourceAbsolute | plat::setup::kCopyInUseNeedsReboot;
    if (!plat::setup::InstallFile(DownLoadCacheFile, target, kStyle, &inUse)) {
        TRACE(g_TraceLog, "CFile_: SetupInstallFileEx failed, error code is %d", plat::LastError());
    } else if (inUse) {
        TRACE(g_TraceLog,
              "CFile_: SetupInstallFileEx succeeded, but the file was in use.  It has been queued "
              "to be installed on the next system reboot.");
    } else {
        TargetReplaced = true;  // installed at once: Rollback must undo it like a copy
        TRACE(g_TraceLog, "CFile_: SetupInstallFileEx succeeded.");
    }
}

std::int32_t CFile_::RunCommands() {
    if (Command.empty()) {
        TRACE(g_TraceLog, "CFile_: No Commands found");
        Applied = true;
        return kApplied;
    }
    TRACE(g_TraceLog, "CFile_: Command(s) found: %s", Command.c_str());
    bool succeeded = false;
    try {
        CommandString commands(HomeDir);  // it adds its own backslash
        succeeded = commands.Execute(Command);
    } catch (...) {
        TRACE(g_TraceLog, "CFile_: Command execution threw error");
        return kCommandsFailed;
    }
    if (!succeeded) return kCommandsFailed;
    Applied = true;
    return kApplied;
}
