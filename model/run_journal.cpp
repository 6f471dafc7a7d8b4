// CRunJournal: writing the records, folding them into pending rows, and the recovery.
#include "model/run_journal.h"

#include <algorithm>
#include <cinttypes>
#include <cstdio>
#include <cstdlib>

#include "diag/trace_log.h"
#include "platform/cfile.h"
#include "platform/errors.h"

namespace {

std::string Hex(std::uint64_t value) {
    char text[24];
    std::snprintf(text, sizeof text, "%" PRIx64, value);
    return text;
}

std::vector<std::string> Split(const std::string& line) {
    std::vector<std::string> fields;
    std::size_t start = 0;
    for (std::size_t bar; (bar = line.find('|', start)) != std::string::npos; start = bar + 1)
        fields.push_back(line.substr(start, bar - start));
    fields.push_back(line.substr(start));
    return fields;
}

// How many fields after the row each kind has.
int FieldsOf(char kind) {
    switch (kind) {
        case 'B': return 7;
        case 'R': return 3;
        case 'Q': return 2;
        case 'X': return 1;
        case 'C': case 'U': case 'K': return 0;
        default: return -1;
    }
}

// Parses one complete line into kind, row and fields; false for anything else.
bool Parse(const std::string& line, CRunJournal::Record* record, std::uint32_t* row) {
    std::vector<std::string> fields = Split(line);
    if (fields.size() < 2 || fields[0].size() != 1 || fields[1].empty() ||
        fields[1].find_first_not_of("0123456789") != std::string::npos)
        return false;
    const int extra = FieldsOf(fields[0][0]);
    if (extra < 0 || fields.size() != static_cast<std::size_t>(extra) + 2) return false;
    record->kind = fields[0][0];
    *row = static_cast<std::uint32_t>(std::strtoul(fields[1].c_str(), nullptr, 10));
    record->fields.assign(fields.begin() + 2, fields.end());
    return true;
}

std::string Line(std::uint32_t row, const CRunJournal::Record& record) {
    std::string line(1, record.kind);
    line += "|" + std::to_string(row);
    for (const std::string& field : record.fields) line += "|" + field;
    return line + "\n";
}

}  // namespace

CRunJournal::CRunJournal() = default;
CRunJournal::~CRunJournal() = default;

std::string CRunJournal::NameFor(const std::string& contentFile) { return contentFile + ".$jnl$"; }

void CRunJournal::Open(const std::string& contentFile) {
    file_.reset();
    pending_.clear();
    order_.clear();
    path_ = NameFor(contentFile);
    std::string bytes;
    if (!plat::files::Exists(path_) || !plat::files::ReadAll(path_, &bytes)) return;
    std::size_t start = 0;
    for (std::size_t end; (end = bytes.find('\n', start)) != std::string::npos; start = end + 1) {
        Record record;
        std::uint32_t row = 0;
        if (!Parse(bytes.substr(start, end - start), &record, &row)) continue;
        Fold(row, record);
    }
    TRACE(g_TraceLog, "CRunJournal: '%s' names %d row(s) of an earlier run that did not finish", path_.c_str(),
          static_cast<int>(pending_.size()));
}

bool CRunJournal::IsPending(std::uint32_t row) const { return pending_.count(row) != 0; }

// A U or K record ends the row's pending records; any other joins them.
void CRunJournal::Fold(std::uint32_t row, const Record& record) {
    if (record.kind != 'U' && record.kind != 'K') {
        if (!pending_.count(row)) order_.push_back(row);
        pending_[row].push_back(record);
    } else if (pending_.erase(row)) {
        order_.erase(std::remove(order_.begin(), order_.end(), row), order_.end());
    }
}

bool CRunJournal::Append(const std::vector<Entry>& entries, bool flush) {
    if (path_.empty() || entries.empty()) return true;  // no content file, nothing to recover for
    std::string lines;
    for (const Entry& entry : entries) lines += Line(entry.first, entry.second);
    try {
        if (!file_) {
            auto file = std::make_unique<plat::CFile>();
            constexpr unsigned kAppend = plat::CFile::modeWrite | plat::CFile::modeCreate | plat::CFile::modeNoTruncate |
                                         plat::CFile::shareDenyWrite | plat::CFile::typeBinary;
            plat::CFileException error(0, path_);
            if (!file->Open(path_, kAppend, &error)) throw error;
            file->Seek(0, plat::CFile::end);
            file_ = std::move(file);
        }
        file_->Write(lines.data(), static_cast<std::uint32_t>(lines.size()));
        if (flush) file_->Flush();
    } catch (const plat::CFileException& error) {
        TRACE(g_TraceLog, "CRunJournal: unable to write to '%s', error code is %d; the step is not taken",
              path_.c_str(), static_cast<int>(error.OsError()));
        file_.reset();  // a later record opens it again rather than write after a torn line
        return false;
    }
    for (const Entry& entry : entries) Fold(entry.first, entry.second);
    return true;
}

bool CRunJournal::RecordBackupAndReplace(std::uint32_t row, const std::string& download, const std::string& target,
                                         const std::string& backup, const plat::files::FileStatus& before) {
    const Record b{'B',
                   {download, target, backup, Hex(before.attributes), Hex(before.creation), Hex(before.lastAccess),
                    Hex(before.lastWrite)}};
    return Append({Entry{row, b}, Entry{row, Record{'R', {download, target, backup}}}});
}

bool CRunJournal::RecordReplace(std::uint32_t row, const std::string& download, const std::string& target,
                                const std::string& backup) {
    return Append(row, Record{'R', {download, target, backup}});
}

bool CRunJournal::RecordQueued(std::uint32_t row, const std::string& download, const std::string& target) {
    return Append(row, Record{'Q', {download, target}});
}

bool CRunJournal::RecordExpansion(std::uint32_t row, const std::string& download) {
    return Append(row, Record{'X', {download}});
}

// The records of the pending rows among rows, of one kind, written together.
std::vector<CRunJournal::Entry> CRunJournal::Marks(const std::vector<std::uint32_t>& rows, char kind) const {
    std::vector<Entry> entries;
    for (std::uint32_t row : rows)
        if (IsPending(row)) entries.push_back(Entry{row, Record{kind, {}}});
    return entries;
}

bool CRunJournal::RecordCommitted(const std::vector<std::uint32_t>& rows) { return Append(Marks(rows, 'C'), false); }

bool CRunJournal::RecordUndone(std::uint32_t row) { return !IsPending(row) || Append(row, Record{'U', {}}); }

bool CRunJournal::RecordCleaned(const std::vector<std::uint32_t>& rows) { return Append(Marks(rows, 'K'), false); }

bool CRunJournal::Discard() {
    pending_.clear();
    order_.clear();
    return Close();
}

bool CRunJournal::Close() {
    file_.reset();
    if (path_.empty() || !pending_.empty() || !plat::files::Exists(path_)) return true;
    if (plat::files::Remove(path_)) return true;
    TRACE(g_TraceLog, "CRunJournal: unable to remove '%s', error code is %d", path_.c_str(), plat::LastError());
    return false;
}
