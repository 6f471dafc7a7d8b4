// CRunJournal: the recovery of what an interrupted run left, row by row, from the records alone.
#include <cstdlib>

#include "decompress/expansion_record.h"
#include "diag/trace_log.h"
#include "manifest/name_normalise.h"
#include "model/run_journal.h"
#include "platform/errors.h"

namespace {

using Records = std::vector<CRunJournal::Record>;

const CRunJournal::Record* First(const Records& records, char kind) {
    for (const CRunJournal::Record& record : records)
        if (record.kind == kind) return &record;
    return nullptr;
}

// The download the row's records name (every kind that names files names it first).
std::string DownloadOf(const Records& records) {
    for (const CRunJournal::Record& record : records)
        if (!record.fields.empty()) return record.fields[0];
    return std::string();
}

bool MakeWritable(const std::string& path) {
    const std::uint32_t attributes = plat::files::GetAttributes(path);
    return attributes == plat::files::kInvalidAttributes || !(attributes & plat::files::kAttrReadOnly) ||
           plat::files::SetAttributes(path, attributes & ~plat::files::kAttrReadOnly);
}

// Removes a file the journal names; true when it is gone, also when it never was.
bool RemoveNamed(const std::string& path) {
    if (!plat::files::Exists(path)) return true;
    MakeWritable(path);
    if (plat::files::Remove(path)) return true;
    TRACE(g_TraceLog, "CRunJournal: unable to remove '%s', error code is %d", path.c_str(), plat::LastError());
    return false;
}

bool IsTargetOf(const Records& records, const std::string& path) {
    for (const CRunJournal::Record& record : records)
        if (record.fields.size() > 1 && NormaliseName(record.fields[1]) == NormaliseName(path)) return true;
    return false;
}

// The status a B record kept of the target it backed up under backup.
bool StatusBefore(const Records& records, const std::string& backup, plat::files::FileStatus* status) {
    for (const CRunJournal::Record& record : records) {
        if (record.kind != 'B' || record.fields[2] != backup) continue;
        status->attributes = static_cast<std::uint32_t>(std::strtoul(record.fields[3].c_str(), nullptr, 16));
        status->creation = std::strtoull(record.fields[4].c_str(), nullptr, 16);
        status->lastAccess = std::strtoull(record.fields[5].c_str(), nullptr, 16);
        status->lastWrite = std::strtoull(record.fields[6].c_str(), nullptr, 16);
        return true;
    }
    return false;
}

// Puts the target's previous version back as the first R record says it was.
bool RestoreTarget(const Records& records, const CRunJournal::Record& replace) {
    const std::string& target = replace.fields[1];
    const std::string& backup = replace.fields[2];
    if (backup.empty()) {
        TRACE(g_TraceLog, "CRunJournal: '%s' was new to the machine, removing it", target.c_str());
        return RemoveNamed(target);
    }
    // The backup is gone only once it has been restored.
    if (!plat::files::Exists(backup)) return true;
    TRACE(g_TraceLog, "CRunJournal: restoring '%s' from '%s'", target.c_str(), backup.c_str());
    MakeWritable(target);
    // Moved, not copied: the backup may be a second name of the target itself (the run ended
    // before the target was replaced), which a rename over it leaves as it is.
    if (!plat::files::Rename(backup, target, true)) {
        TRACE(g_TraceLog, "CRunJournal: restore of '%s' failed, error code is %d", target.c_str(), plat::LastError());
        return false;
    }
    plat::files::FileStatus before;
    if (StatusBefore(records, backup, &before)) CRunJournal::GiveBack(target, before);
    return true;
}

}  // namespace

void CRunJournal::GiveBack(const std::string& target, const plat::files::FileStatus& before) {
    plat::files::SetTimes(target, before.creation, before.lastAccess, before.lastWrite);
    if (before.attributes & plat::files::kAttrReadOnly)
        plat::files::SetAttributes(target, plat::files::GetAttributes(target) | plat::files::kAttrReadOnly);
}

bool CRunJournal::RemoveBackups(std::uint32_t row) const {
    bool removed = true;
    for (const Record& record : pending_.at(row))
        if (record.kind == 'B') removed = RemoveNamed(record.fields[2]) && removed;
    return removed;
}

bool CRunJournal::RecoverRow(std::uint32_t row, const CommittedTest& committed) {
    const Records& records = pending_.at(row);
    const std::string download = DownloadOf(records);
    if (First(records, 'C') || (!download.empty() && committed(row, download))) {
        TRACE(g_TraceLog, "CRunJournal: row %d was applied by a run that did not clean up, removing what it left",
              static_cast<int>(row));
        if (!RemoveBackups(row) || (!download.empty() && !DiscardExpansionRecord(download))) return false;
        // As in the clean-up, a download that cannot be removed is left, and one that is the
        // installed file itself stays.
        if (!download.empty() && !IsTargetOf(records, download)) RemoveNamed(download);
        return RecordCleaned({row});
    }
    TRACE(g_TraceLog, "CRunJournal: row %d was not applied by a run that did not finish, undoing what it did",
          static_cast<int>(row));
    const Record* replace = First(records, 'R');
    return (!replace || RestoreTarget(records, *replace)) && RemoveBackups(row) && RecordUndone(row);
}

std::uint32_t CRunJournal::Recover(const CommittedTest& committed) {
    // Newest first: of two rows that replaced one target, the later one's backup holds the
    // earlier one's file.
    const std::vector<std::uint32_t> rows(order_.rbegin(), order_.rend());
    for (std::uint32_t row : rows) {
        if (!RecoverRow(row, committed))
            TRACE(g_TraceLog, "CRunJournal: row %d could not be recovered, it waits for the next run",
                  static_cast<int>(row));
    }
    const auto left = static_cast<std::uint32_t>(pending_.size());
    Close();
    return left;
}
