// CFile_: one update file of a product run, made from a content-file row that the analysis
// admitted. It decompresses its downloaded copy, backs up the file it replaces, copies itself
// into place (queueing the copy for the next restart when the target is in use), stamps the
// target's date, runs its install commands and can undo all of that. Every operation reports
// by its result and by trace lines; none throws.
//
// The target is HomeDir (with a backslash added) joined with the name and extension of
// FileName; a directory inside FileName is ignored.
#pragma once
#include <cstdint>
#include <string>
#include <vector>

#include "entry/progress_data.h"
#include "platform/files.h"

class CRunJournal;

class CFile_ {
public:
    // Apply's results.
    static constexpr std::int32_t kApplied = 1;
    static constexpr std::int32_t kNotApplied = 0;
    static constexpr std::int32_t kCommandsFailed = 4;

    // Stores the row's values; applied counts only for a downloaded file. No backup yet.
    CFile_(std::uint32_t row, bool downloaded, bool applied, const std::string& homeDir,
           const std::string& fileName, const std::string& downLoadCacheFile,
           const std::string& command, const std::string& updateDate, bool needsDecompression,
           std::uint32_t compressionType);
    CFile_(const CFile_& other);  // every field, traced: groups hold copies
    CFile_& operator=(const CFile_& other) = default;

    std::uint32_t GetRow() const { return Row; }
    std::string GetFileName() const { return FileName; }
    const std::string& GetDownLoadCacheFile() const { return DownLoadCacheFile; }
    bool IsDownloaded() const;
    bool IsApplied() const;
    bool IsDecompressionNeeded() const { return NeedsDecompression; }
    bool IsMandatory() const { return true; }  // no row makes a file optional
    // The SHA-256 digest (hexadecimal, either case) that the download must have, after any
    // expansion, for Apply to install it; empty: no check.
    void SetExpectedSha256(const std::string& digest) { ExpectedSha256 = digest; }

    // Expands the downloaded copy in place through the process-wide decompressor, created on
    // first use. True when the copy is ready; then no further decompression is needed.
    bool Decompress(ProgressCallback callback);
    // Unloads the decompression library that Decompress loaded, if any (after each
    // decompression step of a run).
    static void UnloadDecompressor();
    // Called once the content file says that the download needs no decompressing: the record
    // by which a later run would recognise the expansion has done its work and is removed.
    // True when none is left.
    bool ExpansionRecorded();
    // Tells the file that a listing of its download's folder found no expansion record.
    void NoExpansionRecord() { ExpansionRecordGone = true; }

    // The product run's journal, in which every step that creates or replaces a file is
    // recorded before it is taken (run_journal.h). Without one nothing is recorded.
    void SetJournal(CRunJournal* journal) { Journal = journal; }

    // path + ".$bak$", with "x" appended until no file or folder has that name.
    std::string MakeBackupFileName(std::string path) const;

    // Backs up an existing target, copies the download over it, dates it and runs the install
    // commands. kApplied: in place and the commands succeeded (also when already applied).
    // kNotApplied: nothing new is in place, the backup failed, or the copy had to go through
    // the setup service (installed there, queued for restart, or failed). kCommandsFailed: the
    // new file is in place but the commands failed or threw; Rollback undoes it.
    std::int32_t Apply();

    // Stamps creation, access and write time of the file with UpdateDate, read as universal
    // time after cutting UpdateDate at its first "." (the field keeps the cut text). False, with
    // a trace line, when the text is no date or the file cannot be opened or stamped.
    bool SetFileDateTime(std::string path);

    // True when the file is absent or writable afterwards.
    bool ClearReadOnly(std::string path) const;

    // Restores the state before Apply: the backup copied back (then removed), or the installed
    // file deleted when there was no previous target. A file whose new copy never reached the
    // target only loses its backup. Clears Applied. False when the restore or deletion failed;
    // the backup is then kept and a later Rollback tries again.
    bool Rollback();

    // Deletes the backup; true when none is left behind. A backup that holds the only copy of
    // the target's previous version (the new file is in place but not applied) is kept: false.
    bool RemoveBackupFile();

    // Deletes the downloaded copy, read-only or not; true when the deletion succeeded. A
    // download that is the target itself is never deleted (false).
    bool Remove();

private:
    std::string TargetDirectory() const;
    std::string TargetPath() const;
    std::int32_t Install();
    // *announced: the journal already holds the replacement's record (written with the backup's).
    bool PreserveTarget(const std::string& target, bool* announced);
    bool BackUp(const std::string& target, bool* announced);
    void InstallThroughSetup(const std::string& target);
    std::int32_t RunCommands();
    bool Undo();
    bool RestoreTarget(const std::string& target);
    bool DownloadMatchesDigest() const;

    std::uint32_t Row;
    std::string FileName;
    std::string DownLoadCacheFile;
    std::uint32_t CompressionType;
    bool Downloaded;
    bool Applied;
    std::string BackupFileName;
    std::string Command;
    std::string HomeDir;
    bool NeedsDecompression;
    std::string UpdateDate;
    // The new file has reached the target and has not been rolled back yet, whether or not it
    // counts as applied (its commands may have failed). While this holds, the target's previous
    // state is recorded once and for all: in BackupFileName, or, when that is empty, as "there
    // was no target". So no later Apply backs the target up again (that would put this file's
    // own copy into the backup) and no RemoveBackupFile of an unapplied file deletes the backup.
    bool TargetReplaced = false;
    // The target's attributes and times when it was backed up, given back by a restore.
    plat::files::FileStatus TargetBefore;
    CRunJournal* Journal = nullptr;
    // No expansion record of the download is left: ExpansionRecorded removed it or found none,
    // and Decompress has not written one since.
    bool ExpansionRecordGone = false;
    std::string ExpectedSha256;  // as the row gives it, untrimmed
};
