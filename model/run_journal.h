// The run journal: what a product run is about to create or replace, written down durably
// before it does so. After an interrupted run (a crash, a power cut, a killed host) the next run
// finishes or undoes exactly what the journal names, and nothing else: a file the journal does
// not name is never deleted, adopted or restored, whatever its bytes.
//
// The file: "<content file>.$jnl$", text, one record a line ending in LF, fields separated by
// "|" (no Windows path holds one). Each record is flushed to the disk before the step it
// announces begins; records written together go out with one flush:
//   - a target that is backed up has its B and its R record written together, before the
//     backup: a backup is made whole or not at all (a second name of the target, or a copy
//     renamed into place), and an R whose backup does not exist finds the target untouched.
// C and K records announce no step and are not flushed (the next flush of the journal carries
// them): without its C record a row is still found committed by the content file, saved and
// flushed before the C records are written; without its K record a row's clean-up is done once
// more, which finds nothing left to remove. The K records of a clean-up are written after its
// deletions were made durable (their folders flushed), so a K never hides a file that came back.
//   B|row|download|target|backup|attributes|created|accessed|written
//                                  the target is about to be backed up under backup; the
//                                  attributes and times it has (hexadecimal), to give back
//   R|row|download|target|backup   the target is about to be replaced by the download; an empty
//                                  backup: there was no target, the file is new to the machine
//   Q|row|download|target          the download is about to go to the restart queue
//   X|row|download                 the download is about to be expanded in place
//   C|row                          the content file now says the row is applied
//   U|row                          the row's target is its previous self and its backups are gone
//   K|row                          the row's clean-up is done: backups, expansion record, download
// A line that lacks its LF (an append that was cut short) or does not parse is passed over.
//
// A row is pending from its first record after its last U or K. Recovery, per pending row, the
// rows taken newest first (so that rows replacing the same target unwind in reverse):
//   - committed (a C record, or the content file still names the row's download in that row and
//     reads it as applied: the run ended between the save and the C record): the backups that
//     its B records name, its download's expansion record and its download are removed, as the
//     clean-up would have done;
//   - otherwise its target gets its previous version back: from the backup of its first R
//     record (with the attributes and times of its B record), or, when that R names no backup,
//     by removing the file that the run put there; a backup already gone means the restore was
//     done. Then every backup its B records name is removed. Without an R record the target was
//     never touched and only the backups go;
//   - X and Q records need nothing: the expansion record beside a download says whether it is
//     expanded, and what the restart queue staged is the queue's.
// A recovered row is marked U or K. A row whose recovery fails stays pending, is not applied by
// this run and counts as a failure; the next run tries again. The journal is deleted once no row
// is pending.
#pragma once
#include <cstdint>
#include <functional>
#include <map>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "platform/files.h"

namespace plat {
class CFile;
}

class CRunJournal {
public:
    CRunJournal();
    ~CRunJournal();
    CRunJournal(const CRunJournal&) = delete;
    CRunJournal& operator=(const CRunJournal&) = delete;

    // "<contentFile>.$jnl$".
    static std::string NameFor(const std::string& contentFile);

    // Points the journal at the file for a content file and reads what an earlier run left in it.
    // Forgets whatever it held before (a parser runs one product after another).
    void Open(const std::string& contentFile);
    const std::string& Path() const { return path_; }

    // Whether the content file says that row is applied, and still names the download in it.
    using CommittedTest = std::function<bool(std::uint32_t row, const std::string& download)>;
    // Finishes or undoes what the earlier run left (the rules above). The number of rows that
    // stay pending.
    std::uint32_t Recover(const CommittedTest& committed);
    // True when the row waits for the recovery of an earlier run.
    bool IsPending(std::uint32_t row) const;

    // The records, flushed before it returns (but C and K). False, with a trace line, when they
    // could not be written: the step they announce must not happen.
    // B and R together: target is about to be backed up under backup, then replaced.
    bool RecordBackupAndReplace(std::uint32_t row, const std::string& download, const std::string& target,
                                const std::string& backup, const plat::files::FileStatus& before);
    bool RecordReplace(std::uint32_t row, const std::string& download, const std::string& target,
                       const std::string& backup);
    bool RecordQueued(std::uint32_t row, const std::string& download, const std::string& target);
    bool RecordExpansion(std::uint32_t row, const std::string& download);
    bool RecordCommitted(const std::vector<std::uint32_t>& rows);
    bool RecordUndone(std::uint32_t row);
    bool RecordCleaned(const std::vector<std::uint32_t>& rows);

    // Gives a restored target the read-only attribute and the times it had before (a copy
    // brings neither back).
    static void GiveBack(const std::string& target, const plat::files::FileStatus& before);

    // Ends the run's use of the file: deleted when no row is pending, kept otherwise. False when
    // it should go and could not.
    bool Close();
    // Ends the run's use of the file and deletes it, whatever it still holds (the content file
    // is about to go, and with it every row the journal could name).
    bool Discard();

    // One record of a row; fields after the kind, as written.
    struct Record {
        char kind = 0;
        std::vector<std::string> fields;
    };

    // The rows that an earlier run left pending, with their records since their last U or K, as
    // Open read them (for reports; a run goes through Recover).
    const std::map<std::uint32_t, std::vector<Record>>& PendingRecords() const { return pending_; }

private:
    using Entry = std::pair<std::uint32_t, Record>;
    bool Append(std::uint32_t row, const Record& record) { return Append({Entry{row, record}}); }
    bool Append(const std::vector<Entry>& entries, bool flush = true);  // one write, one flush
    std::vector<Entry> Marks(const std::vector<std::uint32_t>& rows, char kind) const;
    void Fold(std::uint32_t row, const Record& record);
    bool RecoverRow(std::uint32_t row, const CommittedTest& committed);
    bool RemoveBackups(std::uint32_t row) const;

    std::string path_;
    std::unique_ptr<plat::CFile> file_;
    // Pending rows and their records since their last U or K, in order.
    std::map<std::uint32_t, std::vector<Record>> pending_;
    // Pending rows in the order of their first record.
    std::vector<std::uint32_t> order_;
};
