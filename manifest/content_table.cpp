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

// The cell's value: short cells are kept as they are, so that a lone blank survives; longer
// ones lose surrounding white space and then one pair of enclosing double quotes. A cell
// with inner text is kept exactly, blanks included.
Span Unquote(Span cell) {
    if (cell.size() < 2) return cell;
    Span t = cell;
    while (t.begin < t.end && IsWhite(*t.begin)) ++t.begin;
    while (t.end > t.begin && IsWhite(t.end[-1])) --t.end;
    if (t.begin == t.end) return t;
    if (t.size() >= 2 && *t.begin == '"' && t.end[-1] == '"') return Span{t.begin + 1, t.end - 1};
    return cell;
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
    std::string bytes;
    if (!plat::files::ReadAll(path, &bytes)) return HResultFromWin32(plat::LastError());
    return LoadFromText(bytes, header, separator);
}

std::int32_t CContentTable::LoadFromText(const std::string& bytes, bool header, char separator) {
    Clear();
    if (!header) {
        // The first row defines the column count; its cells are read like any other row's.
        bool empty = false;
        ScanLine(bytes, 0, separator, &empty, [this](Span) { ++columnCount_; return true; });
        if (columnCount_ == 0) return kFail;
        columns_.assign(columnCount_, std::string());
        return ParseRows(bytes, 0, separator);
    }
    bool empty = false;
    const std::size_t next = ScanLine(bytes, 0, separator, &empty, [this](Span name) {
        columns_.emplace_back(name.begin, name.size());
        return true;
    });
    columnCount_ = static_cast<std::uint32_t>(columns_.size());
    if (columnCount_ == 0) return kFail;
    return ParseRows(bytes, next, separator);
}

// The rows from pos on. The table ends at the first empty line, whatever ends it: a file whose
// line ends were converted to LF or CR alone then holds the same rows as its CR LF original,
// and the line after the empty one is never read at all.
std::int32_t CContentTable::ParseRows(const std::string& bytes, std::size_t pos, char separator) {
    cells_.reserve(EstimateLines(bytes) * columnCount_);
    while (pos < bytes.size()) {
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
            Clear();
            return kFail;
        }
        if (empty) break;
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
