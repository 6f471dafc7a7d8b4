// CFile_::Rollback and RemoveBackupFile: undoing an Apply without ever losing the previous
// version of the target.
//
// The previous version lives in the backup from the moment the new file reaches the target
// (TargetReplaced) until a restore succeeds. Two rules keep it there:
//   - Rollback undoes every file whose new copy reached the target, also one whose install
//     commands failed (Apply result 4) and so never counted as applied; the not-applied path,
//     which only drops the backup, is left to files that never touched the target.
//   - A restore that fails leaves TargetReplaced set, although Applied is cleared as always. A
//     later Rollback then tries the restore again, RemoveBackupFile keeps the backup and a
//     retried Apply does not back the target (this file's copy) up over it.
#include "diag/trace_log.h"
#include "model/run_journal.h"
#include "model/update_file.h"
#include "platform/errors.h"
#include "platform/files.h"

bool CFile_::Rollback() {
    TRACE(g_TraceLog, "CFile_: Rollback");
    // Once the target is its old self and no backup is left, the journal has nothing more
    // to undo for the row.
    const bool result = Undo() && (!Journal || Journal->RecordUndone(Row));
    TRACE(g_TraceLog, "CFile_: Rollback returning %d", result);
    return result;
}

bool CFile_::Undo() {
    if (!Applied && !TargetReplaced) {
        TRACE(g_TraceLog, "CFile_: file '%s' not applied, no rollback action needed",
              FileName.c_str());
        return RemoveBackupFile();
    }
    if (!Applied) {
        TRACE(g_TraceLog, "CFile_: file '%s' not applied, but its copy is in place, rolling back",
              FileName.c_str());
    }
    Applied = false;
    const std::string target = TargetPath();
    if (BackupFileName.empty()) {
        // Nothing was backed up because there was no target before Apply.
        TRACE(g_TraceLog, "CFile_: No backup file name, removing original");
        ClearReadOnly(target);  // a read-only copy (of a read-only download) must not stay for good
        if (!plat::files::Remove(target)) return false;
        TargetReplaced = false;
        return true;
    }
    return RestoreTarget(target);
}

bool CFile_::RestoreTarget(const std::string& target) {
    TRACE(g_TraceLog, "CFile_: Rolling back...");
    ClearReadOnly(target);
    if (!plat::files::Copy(BackupFileName, target, false)) {
        TRACE(g_TraceLog, "CFile_: Rollback failed, retrying, error code is %d", plat::LastError());
        return false;
    }
    TargetReplaced = false;  // the target is its old self again; the backup may go
    CRunJournal::GiveBack(target, TargetBefore);
    TRACE(g_TraceLog, "CFile_: Rollback filecopy success");
    return RemoveBackupFile();
}

bool CFile_::RemoveBackupFile() {
    TRACE(g_TraceLog, "CFile_: RemoveBackupFile, backup file name is '%s'", BackupFileName.c_str());
    const bool present = !BackupFileName.empty() && plat::files::Exists(BackupFileName);
    bool result = true;
    if (present && TargetReplaced && !Applied) {
        TRACE(g_TraceLog,
              "CFile_: RemoveBackupFile, keeping '%s': it holds the only copy of the previous "
              "version of '%s'",
              BackupFileName.c_str(), FileName.c_str());
        result = false;
    } else if (present) {
        // A backup taken while the target's read-only attribute could not be cleared is
        // read-only too, and would refuse its deletion in every later run.
        ClearReadOnly(BackupFileName);
        result = plat::files::Remove(BackupFileName);
    }
    TRACE(g_TraceLog, "CFile_: RemoveBackupFile, returning %d", result);
    return result;
}
