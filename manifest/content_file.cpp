// CManifestParser: locating, loading, storing and discarding the product's content file, and
// the row cursor over its table.
#include "commands/row_preparation.h"
#include "diag/trace_log.h"
#include "manifest/manifest_parser.h"
#include "platform/files.h"

bool CManifestParser::LoadManifest(const std::string& project, bool* present) {
    TRACE(g_TraceLog, "CManifestParser: LoadManifest, Project name is '%s'", project.c_str());
    Init(project);
    bool result = true;
    const std::string fileName = profile_.ReadProfileEntry(projectSection_, "ContentFileName", "");
    if (fileName.empty()) {
        TRACE(g_TraceLog,
              "CManifestParser: LoadManifest, update portion, no available manifest file found for "
              "processing");
        *present = false;
    } else {
        mandatoryOnly_ =
            profile_.ReadProfileEntry(projectSection_, "ContentFileMode", "") == "MandatoryOnly";
        contentFileTarget_ = profile_.ReadProfileEntry(projectSection_, "ContentFileTarget", "");
        *present = true;
        contentFilePath_ = fileName;
        TRACE(g_TraceLog, "CManifestParser: LoadManifest, about to load content file");
        const std::int32_t hr = LoadContentRows(table_, contentFilePath_, defaultDirectory_);
        if (hr >= 0) {
            TRACE(g_TraceLog, "CManifestParser: LoadManifest load from file success");
        } else {
            TRACE(g_TraceLog, "CManifestParser: LoadManifest load from file failure, return hr is 0x%08x",
                  static_cast<unsigned>(hr));
            result = false;
        }
    }
    TRACE(g_TraceLog, "CManifestParser: LoadManifest, return value is %d", result ? 1 : 0);
    return result;
}

bool CManifestParser::WriteManifest() {
    TRACE(g_TraceLog, "CManifestParser: WriteManifest to file: %s", contentFilePath_.c_str());
    // A file that cannot be written raises the file exception to the caller, as intended: the
    // product run stops rather than go on with statuses it cannot record.
    const bool stored = table_.SaveToFile(contentFilePath_, true, ',') == 0;
    TRACE(g_TraceLog, "CManifestParser: WriteManifest, return value is %d", stored ? 1 : 0);
    return stored;
}

bool CManifestParser::NextRow() {
    ++cursor_;
    return cursor_ >= 0 && static_cast<std::uint32_t>(cursor_) < table_.RowCount();
}

bool CManifestParser::MoveToRow(std::int32_t index) {
    cursor_ = index;
    return index >= 0 && static_cast<std::uint32_t>(index) < table_.RowCount();
}

std::string CManifestParser::GetField(const std::string& column) const {
    const int index = table_.ColumnIndex(column);
    if (index < 0 || cursor_ < 0 || static_cast<std::uint32_t>(cursor_) >= table_.RowCount())
        return std::string();
    return table_.Cell(static_cast<std::uint32_t>(cursor_), static_cast<std::uint32_t>(index));
}

bool CManifestParser::SetField(std::int32_t row, const std::string& column, const std::string& value) {
    if (!MoveToRow(row)) return false;
    const int index = table_.ColumnIndex(column);
    if (index < 0) return false;
    return table_.SetCell(static_cast<std::uint32_t>(row), static_cast<std::uint32_t>(index), value);
}

namespace {

// Removes one entry of the product's section; true when it is gone, also when it never was.
bool RemoveEntry(const CProfile& profile, const std::string& section, const char* entry) {
    if (profile.WriteProfileEntry(section, entry, nullptr)) return true;
    static const std::string kAbsent("\x01(absent)");
    return profile.ReadProfileEntry(section, entry, kAbsent) == kAbsent;
}

}  // namespace

bool CManifestParser::DiscardContentFile() {
    // The file goes first and "ContentFileName", by which a run finds the file, goes last, and
    // each step only once the one before it succeeded. A discard that fails or a run that ends
    // on the way then leaves that entry naming a file that the next run loads, or fails to load,
    // and discards again; never a file or entries that nothing names and nothing would remove.
    const bool removed = plat::files::Remove(contentFilePath_) || !plat::files::Exists(contentFilePath_);
    return removed && RemoveContentFileEntries();
}

bool CManifestParser::RemoveContentFileEntries() {
    const bool mode = RemoveEntry(profile_, projectSection_, "ContentFileMode");
    const bool target = RemoveEntry(profile_, projectSection_, "ContentFileTarget");
    return mode && target && RemoveEntry(profile_, projectSection_, "ContentFileName");
}
