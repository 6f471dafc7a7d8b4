// CManifestParser: the apply pipeline: decompression, group application in dependency order with
// bounded retries and group rollback, status recording in the content file, and cleanup.
#include <set>
#include <vector>

#include "decompress/expansion_record.h"
#include "diag/trace_log.h"
#include "manifest/manifest_parser.h"
#include "manifest/name_normalise.h"
#include "model/upgrade_status.h"
#include "platform/files.h"

namespace {

void Report(ProgressCallback callback, const std::string& status) {
    if (!callback) return;
    g_ProgressData.SetStatusText(status);
    callback(&g_ProgressData);
}

void Step(ProgressCallback callback) {
    if (!callback) return;
    g_ProgressData.IncrementCurrentStep();
    callback(&g_ProgressData);
}

// The expansion records (paths as NormaliseName makes them) in the folders of the master list's downloads:
// one listing per folder instead of a lookup per download, since a lookup of a name that is
// missing, as nearly all records are, reads the whole folder on the emulated machine.
std::set<std::string> ExpansionRecordsBeside(CMasterList& masterList) {
    std::set<std::string> folders, records;
    for (auto& [key, group] : masterList)
        for (const CFile_& file : group.GetFiles()) {
            const std::string& download = file.GetDownLoadCacheFile();
            const std::size_t cut = download.find_last_of("\\/");
            if (cut != std::string::npos) folders.insert(download.substr(0, cut + 1));
        }
    for (const std::string& folder : folders)
        for (const plat::files::FindEntry& entry : plat::files::Find(ExpansionRecordName(folder + "*")))
            records.insert(NormaliseName(folder + entry.name));
    return records;
}

}  // namespace

std::int32_t CManifestParser::iProcessUpdateInformation(std::int32_t& result, ProgressCallback callback) {
    TRACE(g_TraceLog, "CManifestParser: iProcessUpdateInformation");
    DecompressFiles(result, callback);
    ApplyGroups(result, callback);
    CleanUp(result, callback);
    TRACE(g_TraceLog, "CManifestParser: ProcessUpdateInformation, returning %d", result);
    return result;
}

void CManifestParser::DecompressFiles(std::int32_t& result, ProgressCallback callback) {
    TRACE(g_TraceLog, "%s", "");
    TRACE(g_TraceLog, "CManifestParser:  Decompression step.....");
    TRACE(g_TraceLog, "%s", "");
    Report(callback, "Decompressing...");
    const std::set<std::string> records = ExpansionRecordsBeside(masterList_);
    for (auto& [key, group] : masterList_) {
        TRACE(g_TraceLog, "%s", "");
        TRACE(g_TraceLog, "CManifestParser: Examining group '%s' for files needing decompressing...", key.c_str());
        for (CFile_& file : group.GetFiles()) {
            TRACE(g_TraceLog, "CManifestParser: Examining file '%s' to see if it needs decompressing ( %d, %d, %d )",
                  file.GetFileName().c_str(), mandatoryOnly_ ? 1 : 0, file.IsMandatory() ? 1 : 0,
                  file.IsDecompressionNeeded() ? 1 : 0);
            // The row says the download is expanded: a record left by a run that ended before
            // it could remove it (below) has done its work.
            if (!file.IsDecompressionNeeded()) {
                if (records.count(NormaliseName(ExpansionRecordName(file.GetDownLoadCacheFile())))) {
                    file.ExpansionRecorded();
                } else {
                    file.NoExpansionRecord();
                }
            }
            if ((mandatoryOnly_ && !file.IsMandatory()) || !file.IsDecompressionNeeded()) continue;
            Report(callback, "Decompressing " + file.GetFileName());
            if (file.Decompress(callback)) {
                SetField(static_cast<std::int32_t>(file.GetRow()), "NeedsDecompression", "0");
                WriteManifest();
                file.ExpansionRecorded();
            } else {
                ++result;
            }
            Step(callback);
        }
    }
    WriteManifest();
    CFile_::UnloadDecompressor();
    Report(callback, "Applying...");
}

void CManifestParser::ApplyGroups(std::int32_t& result, ProgressCallback callback) {
    for (bool anotherPass = true; anotherPass;) {
        TRACE(g_TraceLog, "%s", "");
        TRACE(g_TraceLog, "CManifestParser:  Application loop.....");
        TRACE(g_TraceLog, "%s", "");
        anotherPass = false;
        for (auto it = masterList_.begin(); it != masterList_.end(); ++it) {
            CFileGroup& group = it->second;
            const char* name = it->first.c_str();
            TRACE(g_TraceLog, "%s", "");
            TRACE(g_TraceLog, "CManifestParser: Applying group '%s'...", name);
            if (!group.IsGroupDecompressed()) {
                TRACE(g_TraceLog, "CManifestParser: group is not decompressed, application of this group will not occur");
                continue;
            }
            if (group.IsGroupApplied()) {
                TRACE(g_TraceLog, "CManifestParser: group '%s' applied already", name);
                continue;
            }
            TRACE(g_TraceLog, "CManifestParser: group is not applied");
            TRACE(g_TraceLog, "CManifestParser: Items dependant: %d", static_cast<int>(group.GetDependancies().size()));
            for (const std::string& dependancy : group.GetDependancies()) TRACE(g_TraceLog, "\t%s", dependancy.c_str());
            TRACE(g_TraceLog, "%s", "");
            if (masterList_.DependedOnItemsApplied(it)) {
                ApplyGroup(group, result, callback);
                continue;
            }
            TRACE(g_TraceLog, "CManifestParser: group '%s' reports dependancy not applied, moving on", name);
            if (group.GetRetries() > masterList_.GetFilesAdded() - 1) {
                TRACE(g_TraceLog, "retry threshold exceeded, giving up on '%s'", name);
                // A group left out is not a success: counting it keeps the content file, so its
                // rows are offered again by the next run instead of being discarded unapplied.
                ++result;
                TRACE(g_TraceLog, "CManifestParser: group '%s' not applied in this run, counted as a failure", name);
            } else {
                TRACE(g_TraceLog, "allowing retry...");
                anotherPass = true;
                group.IncrementRetries();
            }
        }
    }
    TRACE(g_TraceLog, "Application loop complete...");
    TRACE(g_TraceLog, "---------------------------------------------------");
    TRACE(g_TraceLog, "After application, the manifest contents are:\r\n%s", table_.ToText().c_str());
}

void CManifestParser::ApplyGroup(CFileGroup& group, std::int32_t& result, ProgressCallback callback) {
    TRACE(g_TraceLog, "CManifestParser: Dependancies are applied");
    std::vector<std::uint32_t> appliedRows;  // rows marked applied by this attempt
    bool groupError = false;
    {
        // The copies' folders are flushed once each when the batch ends, before a rollback or the
        // save that commits them.
        plat::files::FolderFlushBatch copies;
        for (CFile_& file : group.GetFiles())
            if ((groupError = !ApplyMember(file, result, callback, &appliedRows))) break;
    }
    if (groupError) {
        TRACE(g_TraceLog, "CManifestParser: Error detected applying a member of a file group, rolling back group.");
        for (CFile_& file : group.GetFiles()) {
            TRACE(g_TraceLog, "CManifestParser: attempting roll back of '%s'", file.GetFileName().c_str());
            file.Rollback();
        }
        // The members that were in place are undone with the group: the next run must install
        // them again, so they must not read as applied.
        for (std::uint32_t row : appliedRows)
            SetField(static_cast<std::int32_t>(row), "UpgradeStatus", UpgradeStatus[kDownloaded]);
    }
    // The saved statuses are the commit; the journal learns of it after them, so a run that
    // ends in between is told by the content file (RecoverEarlierRun).
    if (WriteManifest() && !groupError) journal_.RecordCommitted(appliedRows);
    TRACE(g_TraceLog, "CManifestParser: b.o.l., Manifest written");
}

// One file of a group whose dependencies are applied; false when it failed (the group error).
bool CManifestParser::ApplyMember(CFile_& file, std::int32_t& result, ProgressCallback callback,
                                  std::vector<std::uint32_t>* appliedRows) {
    const std::string fileName = file.GetFileName();
    const auto row = static_cast<std::int32_t>(file.GetRow());
    TRACE(g_TraceLog, "CManifestParser: considering applying file '%s'", fileName.c_str());
    if (mandatoryOnly_ && !file.IsMandatory()) {
        TRACE(g_TraceLog, "CManifestParser: not applying file, not part of this package");
        return true;
    }
    if (file.IsApplied()) {
        TRACE(g_TraceLog, "CManifestParser: file already applied");
        return true;
    }
    TRACE(g_TraceLog, "CManifestParser: file not applied yet");
    if (!file.IsDownloaded()) {
        TRACE(g_TraceLog, "CManifestParser: File isn't downloaded properly, not applying");
        return true;
    }
    Report(callback, "Applying " + fileName);
    const std::int32_t applied = file.Apply();
    if (applied == CFile_::kApplied) {
        TRACE(g_TraceLog, "CManifestParser: file '%s' applied", fileName.c_str());
        SetField(row, "UpgradeStatus", UpgradeStatus[kAppliedSuccessfully]);
        appliedRows->push_back(file.GetRow());
        Step(callback);
        return true;
    }
    if (applied == CFile_::kCommandsFailed)
        TRACE(g_TraceLog, "CManifestParser: error running install commands for ( '%s' )", fileName.c_str());
    else
        TRACE(g_TraceLog, "CManifestParser: file '%s' not applied", fileName.c_str());
    SetField(row, "UpgradeStatus", UpgradeStatus[kApplicationFailed]);
    ++result;
    return false;
}

void CManifestParser::CleanUp(std::int32_t result, ProgressCallback callback) {
    if (result == 0) {
        Report(callback, "Cleaning up");
        TRACE(g_TraceLog,
              "CManifestParser: ProcessUpdateInformation, success, deleting content file '%s', removing reg key "
              "entry, removing backup files, removing temp files.",
              contentFilePath_.c_str());
    } else {
        TRACE(g_TraceLog, "CManifestParser: ProcessUpdateInformation,  not a complete success, performing needed cleanup");
        WriteManifest();
    }
    // Backups and downloads go while the content file still names them and the journal still
    // holds their rows; what is left (a run that ends in here, a deletion that fails) the next
    // run's recovery removes, as the journal names it.
    bool cleaned = true;
    std::vector<std::uint32_t> cleanedRows;
    {
        // The deletions' folders are flushed once each, and before the journal is told.
        plat::files::FolderFlushBatch removals;
        for (auto& [key, group] : masterList_)
            for (CFile_& file : group.GetFiles()) CleanUpFile(file, &cleaned, &cleanedRows);
        removals.Flush();
    }
    cleaned = journal_.RecordCleaned(cleanedRows) && cleaned;
    // After a complete clean-up all the journal may still hold are downloads that could not be
    // removed, which no later run would look for once the content file is gone. It goes before
    // the content file (a run that ends in between discards that again), and keeps it while it
    // is there, since a later content file of the same name would find it.
    if (result == 0 && cleaned) {
        cleaned = journal_.Discard();
    } else {
        journal_.Close();  // kept while a row waits for the next run
    }
    if (result != 0) return;
    if (!cleaned) {
        TRACE(g_TraceLog,
              "CManifestParser: ProcessUpdateInformation, clean-up incomplete, content file kept for the next run to "
              "finish it");
        return;
    }
    if (!DiscardContentFile()) {
        TRACE(g_TraceLog, "CManifestParser: ProcessUpdateInformation, content file not discarded, the next run "
                          "discards it");
    }
    Step(callback);
}

void CManifestParser::CleanUpFile(CFile_& file, bool* cleaned, std::vector<std::uint32_t>* cleanedRows) {
    TRACE(g_TraceLog, "CManifestParser: ProcessUpdateInformation, removing backup file for '%s'",
          file.GetFileName().c_str());
    const bool noBackup = file.RemoveBackupFile();
    // The download stays while a backup does: the row's journal records name both.
    if (!file.IsApplied()) return;
    if (!noBackup || !file.ExpansionRecorded()) {
        *cleaned = false;
        return;
    }
    // A download that cannot be removed costs disk space, not the update: it does not keep the
    // content file. While the content file stays, the journal still names it for the next run.
    if (!file.Remove()) {
        TRACE(g_TraceLog, "CManifestParser: ProcessUpdateInformation, unable to remove download '%s', left in place",
              file.GetDownLoadCacheFile().c_str());
        return;
    }
    cleanedRows->push_back(file.GetRow());
}

std::uint32_t CManifestParser::RecoverEarlierRun(const CContentTable* table) {
    journal_.Open(contentFilePath_);
    const auto committed = [table](std::uint32_t row, const std::string& download) {
        return table && row < table->RowCount() &&
               NormaliseName(table->Field(row, "DownLoadCacheFile")) == NormaliseName(download) &&
               table->Field(row, "UpgradeStatus") == UpgradeStatus[kAppliedSuccessfully];
    };
    return journal_.Recover(committed);
}
