// The content table: loading CSV text, access by column name, saving, and the
// upgrade statuses recorded in it.
#include "manifest/content_table.h"

#include <gtest/gtest.h>

#include <string>

#include "model/upgrade_status.h"
#include "platform/cfile.h"
#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "tests/support/case_file.h"
#include "tests/support/test_machine.h"

namespace {

// The table as one text: column names, then each row after a ';', entries split by '|'.
std::string Dump(const CContentTable& table) {
    std::string out;
    for (std::uint32_t c = 0; c < table.ColumnCount(); ++c) out += (c ? "|" : "") + table.ColumnName(c);
    for (std::uint32_t r = 0; r < table.RowCount(); ++r) {
        for (std::uint32_t c = 0; c < table.ColumnCount(); ++c) out += (c ? "|" : ";") + table.Cell(r, c);
    }
    return out;
}

// Each case: the first line a header or a row, the bytes, the table (Dump) or "failed", and the
// reason a failed load gives ("-": none). A failed load leaves no rows.
TEST(ContentTableLoad, TextsOfTheCaseFile) {
    for (const pextest::Case& c : pextest::ReadCases("manifest/cases/content_table_load.txt")) {
        SCOPED_TRACE(c.where);
        CContentTable table;
        const std::int32_t hr = table.LoadFromText(pextest::Unescape(c[1]), c[0] == "header");
        EXPECT_EQ(hr == CContentTable::kOk ? Dump(table) : "failed", pextest::Unescape(c[2]));
        EXPECT_EQ(table.LoadFailure(), c[3] == "-" ? "" : c[3]);
        if (hr != CContentTable::kOk) {
            EXPECT_EQ(hr, CContentTable::kFail);
            EXPECT_EQ(table.RowCount(), 0u);
        }
    }
}

std::string Repeat(const std::string& text, std::size_t times) {
    std::string out;
    for (std::size_t i = 0; i < times; ++i) out += text;
    return out;
}

// Files far beyond any product fail instead of exhausting memory. 5,000 columns and 200,000
// short rows (about 1 MB) would otherwise ask for 10^9 cells.
TEST(ContentTableLoad, BoundsOnColumnsAndCells) {
    const std::uint32_t maxColumns = CContentTable::kMaxColumns;
    const std::uint64_t rowsAtBound = CContentTable::kMaxCells / maxColumns;
    CContentTable table;
    EXPECT_EQ(CContentTable::kFail, table.LoadFromText(Repeat("c,", 5000) + "\r\n" + Repeat("x\r\n", 200000)));
    EXPECT_EQ("line 1 has more than 1000 columns", table.LoadFailure());
    EXPECT_EQ(CContentTable::kFail, table.LoadFromText(Repeat("x,", maxColumns + 1), false));

    const std::string header = Repeat("c,", maxColumns) + "\r\n";
    EXPECT_EQ(CContentTable::kOk, table.LoadFromText(header + Repeat("x\r\n", rowsAtBound)));
    EXPECT_EQ(rowsAtBound, table.RowCount());
    EXPECT_EQ(CContentTable::kFail, table.LoadFromText(header + Repeat("x\r\n", rowsAtBound + 1)));
    EXPECT_EQ("line " + std::to_string(rowsAtBound + 2) + " takes the table past 4000000 cells", table.LoadFailure());
    EXPECT_EQ(0u, table.RowCount());
}

// Names are found without regard to case, the first of equal ones, and written back plain;
// cells outside the table read empty and cannot be set.
TEST(ContentTableAccess, ColumnsByNameAndCellsOutsideTheTable) {
    CContentTable table;
    table.LoadFromText("\xEF\xBB\xBF\"FileName\",\"UpgradeStatus\", Force Download ,\" A \",FILENAME\r\nf,s, 1\r\n");
    EXPECT_EQ(0, table.ColumnIndex("filename"));
    EXPECT_EQ(2, table.ColumnIndex("force download"));
    EXPECT_EQ(-1, table.ColumnIndex("File"));
    EXPECT_EQ(-1, table.ColumnIndex("Fxxxxxxx"));
    EXPECT_EQ("", table.Cell(1, 0));
    EXPECT_EQ("", table.Field(0, "Command"));
    EXPECT_FALSE(table.SetCell(1, 0, "x"));
    EXPECT_FALSE(table.SetField(0, "Command", "x"));
    EXPECT_TRUE(table.SetField(0, "upgradeSTATUS", "y"));
    EXPECT_EQ("FileName,UpgradeStatus,Force Download, A ,FILENAME\r\nf,y, 1,,\r\n", table.ToFileText());
    EXPECT_EQ(CContentTable::kFail, table.FailLoad("no column X"));
    EXPECT_EQ(0u, table.ColumnCount());
    EXPECT_EQ("no column X", table.LoadFailure());
}

TEST(UpgradeStatusCodes, TextsAndCodesConvertExactly) {
    for (int code = 0; code < kUpgradeStatusCount; ++code) {
        EXPECT_EQ(code, UpgradeStatusCodeOf(UpgradeStatusText(code)));
    }
    EXPECT_EQ(nullptr, UpgradeStatusText(9));
    for (const char* text : {"downloaded", "Downloaded ", "Skipped", "MissingDependancySkipped"}) {
        EXPECT_EQ(-1, UpgradeStatusCodeOf(text)) << text;
    }
}

// Only the two transient texts, written exactly, change; the column is found without regard to
// case, and a table without it is left alone.
TEST(UpgradeStatusCodes, NormalizingReplacesTheTransientTextsOnly) {
    CContentTable table, other;
    table.LoadFromText("FileName,upgradestatus\r\na,Skipped\r\nb,MissingDependancySkipped\r\n"
                       "c,skipped\r\nd,Skipped \r\ne,Downloaded\r\nf\r\n");
    NormalizeUpgradeStatus(table);
    EXPECT_EQ("FileName,upgradestatus\r\na,AppliedSuccessfully\r\nb,ApplicationFailed\r\n"
              "c,skipped\r\nd,Skipped \r\ne,Downloaded\r\nf,\r\n",
              table.ToFileText());
    other.LoadFromText("FileName,Status\r\nSkipped,Skipped\r\n");
    NormalizeUpgradeStatus(other);
    EXPECT_EQ("FileName,Status\r\nSkipped,Skipped\r\n", other.ToFileText());
}

class ContentTableFile : public ::testing::Test {
protected:
    void TearDown() override { plat::fault::Clear(); }
    pextest::TestMachine machine_;
};

// Read by any case of its name; written back with CR LF line ends and without quotes, a cell's
// own line ends as they are.
TEST_F(ContentTableFile, LoadsAndWritesBack) {
    machine_.WriteFile("C:\\Pex\\content.csv", "FileName,Command\n\"a.dll\", run\n\"x,y\"\nb.dll\n");
    CContentTable table;
    ASSERT_EQ(CContentTable::kOk, table.LoadFromFile("c:\\pex\\CONTENT.csv"));
    table.SetCell(2, 1, "two\nlines\r\n");
    EXPECT_EQ(CContentTable::kOk, table.SaveToFile("C:\\Pex\\content.csv"));
    EXPECT_EQ("FileName,Command\r\na.dll, run\r\n\"x,y\"\r\nb.dll,two\r\nlines\r\n\r\n",
              machine_.ReadFile("C:\\Pex\\content.csv"));

    EXPECT_EQ(CContentTable::kFalse, CContentTable().SaveToFile("C:\\empty.csv"));
    EXPECT_EQ("\r\n", machine_.ReadFile("C:\\empty.csv"));

    EXPECT_EQ(static_cast<std::int32_t>(0x80070002u), table.LoadFromFile("C:\\missing.csv"));
    EXPECT_EQ("cannot read the file (error 2)", table.LoadFailure());
    EXPECT_EQ(static_cast<std::int32_t>(0x80070003u), table.LoadFromFile("C:\\no\\such.csv"));
}

// The size decides before anything is read: a sparse file one byte past the bound is refused
// at once.
TEST_F(ContentTableFile, AFileLargerThanTheBoundIsNotRead) {
    const std::string path = "C:\\Pex\\huge.csv";
    machine_.WriteFile(path, "");
    {
        plat::CFile file;
        ASSERT_TRUE(file.Open(path, plat::CFile::modeWrite | plat::CFile::modeNoTruncate));
        file.Seek(static_cast<std::int64_t>(CContentTable::kMaxFileBytes), plat::CFile::begin);
        file.Write("x", 1);
    }
    CContentTable table;
    EXPECT_EQ(static_cast<std::int32_t>(0x800700DFu), table.LoadFromFile(path));
    EXPECT_EQ("the file is larger than 67108864 bytes", table.LoadFailure());
}

// A save whose write the platform refuses leaves the previous file byte for byte, no temporary
// file beside it, and reports the Windows error to the caller. A rename refused after the new
// version was written (as over a read-only file) is content_file_not_saved.
TEST_F(ContentTableFile, AFailedSaveKeepsTheOldFile) {
    const std::string path = "C:\\Pex\\content.csv";
    machine_.WriteFile(path, "A,B\n1,2\n");
    CContentTable table;
    table.LoadFromText("A,B\r\n3,4\r\n5,6\r\n");
    plat::fault::FailNth(plat::fault::Op::Write, 1, plat::kErrorDiskFull);
    try {
        table.SaveToFile(path);
        ADD_FAILURE() << "the save did not fail";
    } catch (const plat::CFileException& e) {
        EXPECT_EQ(plat::kErrorDiskFull, e.OsError());
    }
    EXPECT_EQ("A,B\n1,2\n", machine_.ReadFile(path));
    EXPECT_EQ(1u, plat::files::Find("C:\\Pex\\*").size());
}

}  // namespace
