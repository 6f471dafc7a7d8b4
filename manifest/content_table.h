// The content table: the in-memory form of a product's content file, a comma-separated text
// table with one header line of column names and one line per update file.
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

    // Loads the file at path (Windows path). Success: zero or positive. Failure: negative;
    // E_FAIL for a format error, otherwise an HRESULT made from the open's Windows error.
    // On failure the table is not usable.
    std::int32_t LoadFromFile(const std::string& path, bool header = true, char separator = ',');
    // Loads from bytes already read (the same rules as LoadFromFile).
    std::int32_t LoadFromText(const std::string& bytes, bool header = true, char separator = ',');

    // Writes the table durably (temporary file beside, flush, rename). 0 when the table has
    // columns, 1 when it has none. Throws plat::CFileException when the file cannot be written;
    // the old file then stays as it was.
    std::int32_t SaveToFile(const std::string& path, bool header = true, char separator = ',') const;
    // The bytes SaveToFile writes.
    std::string ToFileText(char separator = ',') const;

    // Index of the first column whose name equals name without regard to case; -1 when none.
    int ColumnIndex(const std::string& name) const;
    const std::string& ColumnName(std::uint32_t index) const;
    std::uint32_t ColumnCount() const { return columnCount_; }
    std::uint32_t RowCount() const;

    // Cell access; outside the table a read gives empty text and a write changes nothing
    // (and returns false).
    const std::string& Cell(std::uint32_t row, std::uint32_t column) const;
    bool SetCell(std::uint32_t row, std::uint32_t column, const std::string& value);

    // The diagnostic rendering for the trace log.
    std::string ToText() const;

    std::uint32_t keyColumn = 0;

private:
    std::vector<std::string> columns_;
    std::uint32_t columnCount_ = 0;
    std::vector<std::string> cells_;
};
