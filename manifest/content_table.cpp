#include "manifest/content_table.h"

#include <algorithm>
#include <cstring>

#include "platform/cfile.h"
#include "platform/errors.h"
#include "platform/files.h"

namespace {

const std::string kEmpty;

// A piece of the loaded bytes; cells are copied out of the buffer only once, into the table.
struct Span {
    const char* begin;
    const char* end;
    std::size_t size() const { return static_cast<std::size_t>(end - begin); }
};

bool IsWhite(char c) {
    return c == ' ' || c == '\t' || c == '\r' || c == '\n' || c == '\v' || c == '\f';
}

Span Trim(Span text) {
    while (text.begin < text.end && IsWhite(*text.begin)) ++text.begin;
    while (text.end > text.begin && IsWhite(text.end[-1])) --text.end;
    return text;
}

bool Quoted(Span text) { return text.size() >= 2 && *text.begin == '"' && text.end[-1] == '"'; }

// The cell's value: short cells are kept as they are, so that a lone blank survives; longer
// ones lose surrounding white space and then one pair of enclosing double quotes. A cell
// with inner text is kept exactly, blanks included.
Span Unquote(Span cell) {
    if (cell.size() < 2) return cell;
    const Span t = Trim(cell);
    if (t.begin == t.end) return t;
    if (Quoted(t)) return Span{t.begin + 1, t.end - 1};
    return cell;
}

// A column name: unquoted like a cell, but always trimmed, since a blank after a comma in a
// header written by hand would otherwise make the name unusable.
Span HeaderName(Span name) {
    const Span t = Trim(name);
    return Quoted(t) ? Span{t.begin + 1, t.end - 1} : t;
}

// Scans one line starting at pos in a single pass, handing each cell to onCell (which may
// stop the scan by returning false). A separator right before the line end gives no cell.
// Returns the position after the line end, or npos when onCell stopped the scan; *empty
// tells whether the line had no character at all.
template <class OnCell>
std::size_t ScanLine(const std::string& bytes, std::size_t pos, char separator, bool* empty,
                     OnCell onCell) {
    const char* const lineBegin = bytes.data() + pos;
    const char* const stop = bytes.data() + bytes.size();
    const char* cellBegin = lineBegin;
    const char* p = lineBegin;
    for (; p < stop; ++p) {
        const char c = *p;
        if (c == separator) {
            if (!onCell(Span{cellBegin, p})) return std::string::npos;
            cellBegin = p + 1;
        } else if (c == '\r' || c == '\n') {
            break;
        }
    }
    *empty = (p == lineBegin);
    const bool afterSeparator = (p == cellBegin && p != lineBegin);
    if (!*empty && !afterSeparator && !onCell(Span{cellBegin, p})) return std::string::npos;
    if (p == stop) return bytes.size();
    if (*p == '\r' && p + 1 < stop && p[1] == '\n') ++p;
    return static_cast<std::size_t>(p + 1 - bytes.data());
}

// A rough row count, so that the cell list is allocated once for typical files.
std::size_t EstimateLines(const std::string& bytes) {
    const auto lf = std::count(bytes.begin(), bytes.end(), '\n');
    if (lf > 0) return static_cast<std::size_t>(lf) + 1;
    return static_cast<std::size_t>(std::count(bytes.begin(), bytes.end(), '\r')) + 1;
}

bool EqualNoCase(const std::string& a, const std::string& b) {
    if (a.size() != b.size()) return false;
    for (std::size_t i = 0; i < a.size(); ++i) {
        char x = a[i], y = b[i];
        if (x >= 'A' && x <= 'Z') x = static_cast<char>(x - 'A' + 'a');
        if (y >= 'A' && y <= 'Z') y = static_cast<char>(y - 'A' + 'a');
        if (x != y) return false;
    }
    return true;
}

// HRESULT_FROM_WIN32: a Windows error in the Win32 facility; no error at all still fails.
std::int32_t HResultFromWin32(std::uint32_t code) {
    if (code == 0) return CContentTable::kFail;
    return static_cast<std::int32_t>(0x80070000u | (code & 0xFFFFu));
}

}  // namespace

std::int32_t CContentTable::LoadFromFile(const std::string& path, bool header, char separator) {
    Clear();
    loadFailure_.clear();
    std::string bytes;
    if (!plat::files::ReadAll(path, &bytes, kMaxFileBytes)) {
        const std::uint32_t error = plat::LastError();
        FailLoad(error == plat::kErrorFileTooLarge
                     ? "the file is larger than " + std::to_string(kMaxFileBytes) + " bytes"
                     : "cannot read the file (error " + std::to_string(error) + ")");
        return HResultFromWin32(error);
    }
    return LoadFromText(bytes, header, separator);
}

std::int32_t CContentTable::LoadFromText(const std::string& bytes, bool header, char separator) {
    Clear();
    loadFailure_.clear();
    std::size_t pos = bytes.compare(0, 3, "\xEF\xBB\xBF") == 0 ? 3 : 0;
    const std::int32_t hr = ParseHeader(bytes, &pos, header, separator);
    return hr < 0 ? hr : ParseRows(bytes, pos, header ? 2 : 1, separator);
}

std::int32_t CContentTable::FailLoad(const std::string& reason) {
    Clear();
    loadFailure_ = reason;
    return kFail;
}

// The column names from the first line, or without header only their number (the line is then
// read again as the first row). *pos moves past the header line.
std::int32_t CContentTable::ParseHeader(const std::string& bytes, std::size_t* pos, bool header,
                                        char separator) {
    bool empty = false;
    const std::size_t next = ScanLine(bytes, *pos, separator, &empty, [this, header](Span name) {
        if (columns_.size() == kMaxColumns) return false;
        const Span text = header ? HeaderName(name) : Span{name.end, name.end};
        columns_.emplace_back(text.begin, text.size());
        return true;
    });
    if (next == std::string::npos) {
        return FailLoad("line 1 has more than " + std::to_string(kMaxColumns) + " columns");
    }
    columnCount_ = static_cast<std::uint32_t>(columns_.size());
    if (columnCount_ == 0) return FailLoad("line 1 is empty, there is no header");
    if (header) *pos = next;
    return kOk;
}

// The rows from pos on, the first of them on line firstLine. An empty line ends the table when
// it ends in CR LF, the line end the system writes, and is passed over when it ends in LF or CR
// alone; either way the next line is read from its first character or not at all.
std::int32_t CContentTable::ParseRows(const std::string& bytes, std::size_t pos, std::uint32_t firstLine,
                                      char separator) {
    const std::uint64_t estimate = static_cast<std::uint64_t>(EstimateLines(bytes)) * columnCount_;
    cells_.reserve(static_cast<std::size_t>(std::min(estimate, kMaxCells)));
    std::uint64_t rows = 0;
    for (std::uint32_t line = firstLine; pos < bytes.size(); ++line) {
        const std::size_t start = pos;
        std::uint32_t inRow = 0;
        bool empty = false;
        pos = ScanLine(bytes, pos, separator, &empty, [this, &inRow](Span cell) {
            if (inRow == columnCount_) return false;
            const Span value = Unquote(cell);
            cells_.emplace_back(value.begin, value.size());
            ++inRow;
            return true;
        });
        if (pos == std::string::npos) {
            return FailLoad("line " + std::to_string(line) + " has more cells than the " +
                            std::to_string(columnCount_) + " columns of the header");
        }
        if (empty && pos - start == 2) break;  // CR LF
        if (empty) continue;
        // Checked before the row is filled up: the cells are what a short row costs.
        if (++rows * columnCount_ > kMaxCells) {
            return FailLoad("line " + std::to_string(line) + " takes the table past " +
                            std::to_string(kMaxCells) + " cells");
        }
        cells_.resize(cells_.size() + (columnCount_ - inRow));
    }
    keyColumn = 0;
    return kOk;
}

std::int32_t CContentTable::SaveToFile(const std::string& path, bool header, char separator) const {
    if (!plat::files::WriteAllDurably(path, Render(header, separator))) {
        throw plat::CFileException(plat::LastError(), path);
    }
    return columnCount_ == 0 ? kFalse : kOk;
}

std::string CContentTable::ToFileText(char separator) const { return Render(true, separator); }

int CContentTable::ColumnIndex(const std::string& name) const {
    for (std::size_t i = 0; i < columns_.size(); ++i) {
        if (EqualNoCase(columns_[i], name)) return static_cast<int>(i);
    }
    return -1;
}

const std::string& CContentTable::ColumnName(std::uint32_t index) const {
    return index < columns_.size() ? columns_[index] : kEmpty;
}

std::uint32_t CContentTable::RowCount() const {
    return columnCount_ == 0 ? 0 : static_cast<std::uint32_t>(cells_.size() / columnCount_);
}

const std::string& CContentTable::Cell(std::uint32_t row, std::uint32_t column) const {
    if (column >= columnCount_ || row >= RowCount()) return kEmpty;
    return cells_[static_cast<std::size_t>(row) * columnCount_ + column];
}

bool CContentTable::SetCell(std::uint32_t row, std::uint32_t column, const std::string& value) {
    if (column >= columnCount_ || row >= RowCount()) return false;
    cells_[static_cast<std::size_t>(row) * columnCount_ + column] = value;
    if (row < rowText_.size()) rowText_[row].clear();
    return true;
}

const std::string& CContentTable::Field(std::uint32_t row, const std::string& columnName) const {
    const int column = ColumnIndex(columnName);
    return column < 0 ? kEmpty : Cell(row, static_cast<std::uint32_t>(column));
}

bool CContentTable::SetField(std::uint32_t row, const std::string& columnName,
                             const std::string& value) {
    const int column = ColumnIndex(columnName);
    return column >= 0 && SetCell(row, static_cast<std::uint32_t>(column), value);
}

void CContentTable::Clear() {
    columns_.clear();
    cells_.clear();
    columnCount_ = 0;
    rowText_.clear();
}

namespace {

// The line writer's rule: a CR goes before every LF that does not already follow one, so
// every line, and any line break inside a cell, ends in CR LF.
void AppendLineText(std::string& out, std::size_t lineStart, const std::string& text) {
    if (std::memchr(text.data(), '\n', text.size()) == nullptr) {
        out += text;
        return;
    }
    for (const char c : text) {
        if (c == '\n' && (out.size() == lineStart || out.back() != '\r')) out += '\r';
        out += c;
    }
}

void AppendLine(std::string& out, const std::string* entries, std::size_t count, char separator) {
    const std::size_t lineStart = out.size();
    for (std::size_t i = 0; i < count; ++i) {
        if (i > 0) out += separator;
        AppendLineText(out, lineStart, entries[i]);
    }
    AppendLineText(out, lineStart, "\n");
}

void AppendPadded(std::string& out, const std::string& text, std::size_t width) {
    out += text;
    out.append(width + 1 - text.size(), ' ');
}

}  // namespace

std::string CContentTable::Render(bool header, char separator) const {
    if (separator != rowSeparator_) rowText_.clear();
    rowSeparator_ = separator;
    rowText_.resize(RowCount());
    std::size_t total = 2;
    for (const std::string& name : columns_) total += name.size() + 1;
    for (std::uint32_t row = 0; row < RowCount(); ++row) {
        // A rendered row is never empty: it ends in CR LF.
        if (rowText_[row].empty()) {
            AppendLine(rowText_[row], &cells_[static_cast<std::size_t>(row) * columnCount_], columnCount_,
                       separator);
        }
        total += rowText_[row].size();
    }
    std::string out;
    out.reserve(total);
    if (header) AppendLine(out, columns_.data(), columns_.size(), separator);
    for (const std::string& text : rowText_) out += text;
    return out;
}

std::string CContentTable::ToText() const {
    static const std::string kKey = "(KEY)";
    std::vector<std::size_t> width(columnCount_);
    for (std::uint32_t c = 0; c < columnCount_; ++c) {
        width[c] = columns_[c].size() + (c == keyColumn ? kKey.size() : 0);
    }
    for (std::size_t i = 0; i < cells_.size(); ++i) {
        std::size_t& w = width[i % columnCount_];
        w = std::max(w, cells_[i].size());
    }
    std::string out = "\n";
    for (std::uint32_t c = 0; c < columnCount_; ++c) {
        AppendPadded(out, c == keyColumn ? columns_[c] + kKey : columns_[c], width[c]);
    }
    out += '\n';
    for (std::size_t i = 0; i < cells_.size(); ++i) {
        AppendPadded(out, cells_[i], width[i % columnCount_]);
        if ((i + 1) % columnCount_ == 0) out += '\n';
    }
    return out;
}
