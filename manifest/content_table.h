// The content table: the in-memory form of a product's content file, a comma-separated text
// table with one header line of column names and one line per update file.
//
// File format read and written here:
// - A UTF-8 byte-order mark at the very start is skipped (editors and spreadsheets write one).
// - Lines end in CR LF, LF or CR; the last line may lack its end. The header is the first line.
//   After it, an empty line that ends in CR LF ends the table (nothing after it is read); an
//   empty line that ends in LF or CR alone is passed over, so that a file edited by hand with
//   such line ends keeps the rows after a blank line. Lines are counted from 1 (the header)
//   in the reasons of a failed load.
// - A line is cut at every separator; quotes protect nothing. A separator at the very end of a
//   line gives no extra cell.
// - Cells and header names are unquoted: an entry of two or more characters is trimmed of white
//   space; nothing left gives an empty entry, a trimmed text between double quotes gives the
//   text inside them; otherwise a cell is exactly its text, while a header name is always
//   trimmed ("FileName", "UpgradeStatus" and FileName, UpgradeStatus name the same columns).
// - A short row is filled up with empty cells; a row longer than the header fails the load.
// - Bounds far above any real product, so that a broken or hostile file fails the load instead
//   of exhausting memory: at most kMaxFileBytes bytes (checked before the file is read), at most
//   kMaxColumns columns and at most kMaxCells cells once the short rows are filled up (checked
//   row by row, before the cells are taken).
// - Writing joins names and cells with the separator, without quotes or escaping, and ends
//   every line with CR LF.
#pragma once
#include <cstdint>
#include <string>
#include <vector>

class CContentTable {
public:
    // Result codes of LoadFromFile/SaveToFile (Windows HRESULT values).
    static constexpr std::int32_t kOk = 0;
    static constexpr std::int32_t kFalse = 1;                          // S_FALSE
    static constexpr std::int32_t kFail = static_cast<std::int32_t>(0x80004005u);  // E_FAIL

    // The bounds of a load (see the format above). A real content file has about a dozen
    // columns and at most a few thousand rows; 4,000,000 cells keep the cell list itself under
    // about 130 MB.
    static constexpr std::uint64_t kMaxFileBytes = 64ull << 20;
    static constexpr std::uint32_t kMaxColumns = 1000;
    static constexpr std::uint64_t kMaxCells = 4000000;

    // Loads the file at path (Windows path). Success: zero or positive. Failure: negative;
    // E_FAIL for a format error or a bound passed, otherwise an HRESULT made from the read's
    // Windows error (0x800700DF for a file larger than kMaxFileBytes). On failure the table is
    // left empty and LoadFailure says why.
    std::int32_t LoadFromFile(const std::string& path, bool header = true, char separator = ',');
    // Loads from bytes already read (the same rules as LoadFromFile). Without header the first
    // line is a row like the others; it sets the column count and the columns have empty names.
    // On failure the table is left empty (no columns, no rows).
    std::int32_t LoadFromText(const std::string& bytes, bool header = true, char separator = ',');
    // Why the last load failed, for the trace log (the line and what was wrong with it, or the
    // read's error); empty after a load that succeeded.
    const std::string& LoadFailure() const { return loadFailure_; }
    // Fails the loaded table for a rule of the caller's (a column it cannot do without): empties
    // it as a failed load does and records the reason. Returns E_FAIL.
    std::int32_t FailLoad(const std::string& reason);

    // Writes the table durably (temporary file beside, flush, rename). 0 when the table has
    // columns, 1 when it has none. Throws plat::CFileException when the file cannot be written;
    // the old file then stays as it was.
    std::int32_t SaveToFile(const std::string& path, bool header = true, char separator = ',') const;
    // The bytes SaveToFile writes (with the header line).
    std::string ToFileText(char separator = ',') const;

    // Index of the first column whose name equals name without regard to case; -1 when none.
    int ColumnIndex(const std::string& name) const;
    // The name of a column; empty text for an index outside the table.
    const std::string& ColumnName(std::uint32_t index) const;
    std::uint32_t ColumnCount() const { return columnCount_; }
    std::uint32_t RowCount() const;

    // Cell access; outside the table a read gives empty text and a write changes nothing
    // (and returns false).
    const std::string& Cell(std::uint32_t row, std::uint32_t column) const;
    bool SetCell(std::uint32_t row, std::uint32_t column, const std::string& value);

    // Cell access by column name (ColumnIndex); a missing column reads as empty text and
    // takes no write.
    const std::string& Field(std::uint32_t row, const std::string& columnName) const;
    bool SetField(std::uint32_t row, const std::string& columnName, const std::string& value);

    // Removes every column and row.
    void Clear();

    // The diagnostic rendering for the trace log: a line feed, the header line (the key
    // column's name followed by "(KEY)"), then one line per row; every entry left-aligned and
    // padded with blanks to its column's width plus one; every line ends with a line feed.
    std::string ToText() const;

    std::uint32_t keyColumn = 0;

private:
    std::int32_t ParseHeader(const std::string& bytes, std::size_t* pos, bool header, char separator);
    std::int32_t ParseRows(const std::string& bytes, std::size_t pos, std::uint32_t firstLine, char separator);
    std::string Render(bool header, char separator) const;

    std::vector<std::string> columns_;
    std::uint32_t columnCount_ = 0;
    std::vector<std::string> cells_;
    std::string loadFailure_;
    // Each row as it was last rendered (empty until it is, or once a cell of it changes), with
    // the separator used: the pipeline saves the table after every group and changes only that
    // group's rows in between, so most rows are rendered once per run instead of once per save.
    mutable std::vector<std::string> rowText_;
    mutable char rowSeparator_ = 0;
};
