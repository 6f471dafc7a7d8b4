// A row's dynamic-field text through everything the row preparation does with it: scanner and
// grammar, validation, then execution against services bound to a row of a small table. The
// text comes from a content file, so it may be anything. The first byte picks the row's cells,
// so that typed reads meet well-formed and malformed cells alike; the rest is the text.
//
// The machine holds C:\App\a.dll, a real Windows module with version information, so the file
// built-ins reach their version comparison when the text names it.
#include <cstdint>
#include <cstdlib>
#include <string>

#include "commands/update_services.h"
#include "expr/execution_plan.h"
#include "fuzz/fuzz_machine.h"
#include "manifest/content_table.h"

namespace {

const char* const kHeader = "Force Download,HomeDir,FileName,AVAR,BVAR,CVAR,DOWNLOAD_FILE";

// Cells for the typed columns: boolean texts, numbers, blanks and plain words.
const char* const kBoolCells[] = {"0", "1", "TRUE", "", "x"};
const char* const kTextCells[] = {"C:\\App", "C:\\App\\a.dll", "", "\"quoted\""};

std::string Row(std::uint8_t pick) {
    std::string row;
    row += kBoolCells[pick % 5];
    row += ",";
    row += kTextCells[(pick >> 3) % 4];
    row += ",a.dll,";
    row += kBoolCells[(pick >> 5) % 5];
    row += ",1,";
    row += kTextCells[(pick >> 1) % 4];
    row += ",0\r\n";
    return row;
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    pexfuzz::UseFreshMachine();
    pexfuzz::PutFile("C:\\App\\a.dll", pexfuzz::ReadHostFile(PEX_FIXTURE_DIR "/versioned.dll"));
    pexfuzz::PutFile("C:\\App\\plain.txt", "no version information here");
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size == 0) return 0;
    CContentTable table;
    if (table.LoadFromText(std::string(kHeader) + "\r\n" + Row(data[0])) < 0) std::abort();
    const std::string text(reinterpret_cast<const char*>(data) + 1, size - 1);

    ExecutionPlan plan;
    if (!plan.Parse(text) || !plan.Validate()) return 0;
    RowReference row{table, 0};
    UpdateServices services(row);
    plan.Execute(services);
    // Scripts write only cells of their own row; the table keeps its shape.
    if (table.RowCount() != 1 || table.ColumnCount() != 7) std::abort();
    return 0;
}
