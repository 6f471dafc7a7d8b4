// The content-file loader over any bytes: a downloaded content file is whatever the downloader
// left on the disk. The first byte picks the loader's options; the rest is the file. Every
// accessor and both renderings run over what was loaded, and the table's shape must hold
// together whatever the outcome. A file in the content file's own form (header, commas) goes on,
// when bit 3 asks for it, through the row preparation that follows every load: statuses,
// install folders and every row's dynamic-field text.
#include <cstdint>
#include <cstdlib>
#include <string>

#include "commands/row_preparation.h"
#include "fuzz/fuzz_machine.h"
#include "manifest/content_table.h"
#include "model/upgrade_status.h"

namespace {

void Check(bool condition) {
    if (!condition) std::abort();
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    pexfuzz::UseFreshMachine();
    pexfuzz::PutFile("C:\\App\\a.dll", pexfuzz::ReadHostFile(PEX_FIXTURE_DIR "/versioned.dll"));
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size == 0) return 0;
    const std::uint8_t options = data[0];
    const bool header = (options & 1) == 0;
    const char separators[] = {',', ';', '\t', '|'};
    const char separator = separators[(options >> 1) & 3];
    const std::string bytes(reinterpret_cast<const char*>(data) + 1, size - 1);

    CContentTable table;
    const std::int32_t hr = table.LoadFromText(bytes, header, separator);
    if (hr < 0) {
        Check(table.ColumnCount() == 0 && table.RowCount() == 0);
        return 0;
    }
    Check(table.ColumnCount() > 0);
    if (header && separator == ',' && (options & 8)) {
        const std::uint32_t columns = table.ColumnCount(), rows = table.RowCount();
        NormalizeUpgradeStatus(table);
        ResolveHomeDirs(table, "C:\\Program Files\\Vantric\\Demo");
        EvaluateDynamicFields(table);
        Check(table.ColumnCount() == columns && table.RowCount() == rows);
    }

    table.keyColumn = options >> 4;  // also outside the table: the rendering must cope
    const std::string text = table.ToText();
    const std::string file = table.ToFileText(separator);

    for (std::uint32_t c = 0; c <= table.ColumnCount(); ++c) {
        const int found = table.ColumnIndex(table.ColumnName(c));
        Check(c == table.ColumnCount() || (found >= 0 && static_cast<std::uint32_t>(found) <= c));
    }
    const std::uint32_t rows = table.RowCount();
    for (std::uint32_t r = 0; r <= rows; ++r) {
        for (std::uint32_t c = 0; c <= table.ColumnCount(); ++c) {
            const std::string cell = table.Cell(r, c);
            Check(table.SetCell(r, c, cell + "x") == (r < rows && c < table.ColumnCount()));
        }
    }

    // The table as the system writes it back, read again as the next run would. The format is
    // lossy (a header whose last name is empty, cells that held quotes), so only the load's
    // safety is checked, not its outcome.
    CContentTable again;
    again.LoadFromText(file, true, separator);
    (void)text;
    return 0;
}
