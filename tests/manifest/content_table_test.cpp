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

std::string Load(const std::string& bytes, bool header = true) {
    CContentTable table;
    const std::int32_t hr = table.LoadFromText(bytes, header);
    return hr == CContentTable::kOk ? Dump(table) : "failed " + std::to_string(hr);
}

const std::string kFailed = "failed " + std::to_string(CContentTable::kFail);

// Any line end. An empty line ends the table when it ends in CR LF, and nothing after it is
// read, not even a row that would fail the load; one that ends in LF or CR alone is passed over.
TEST(ContentTableLoad, LineEndsAndEmptyLines) {
    for (const char* text : {"A,B\r\n1,2\r\n3,4\r\n", "A,B\n1,2\n3,4\n", "A,B\r1,2\r3,4\r",
                             "A,B\r\n1,2\n3,4", "A,B\r1,2\r\n3,4\n", "A,B\n1,2\n\n3,4\n",
                             "A,B\r1,2\r\r3,4\r", "A,B\r\n1,2\r\n\n3,4\r\n", "A,B\r\n1,2\r\n\r3,4\r\n",
                             "A,B\n\n\r1,2\n\r3,4\n"}) {
        EXPECT_EQ("A|B;1|2;3|4", Load(text)) << text;
    }
    EXPECT_EQ("A|B;1|2", Load("A,B\r\n1,2\r\n\r\n3,4\r\n"));
    EXPECT_EQ("A|B;1|2", Load("A,B\n1,2\n\r\n3,4\n"));
    EXPECT_EQ("A|B|C", Load("A,B,C\r\n\r\nx,y,z,too,many\r\n"));
    EXPECT_EQ("A|B", Load("A,B"));
    EXPECT_EQ("A|B", Load("A,B\n\n"));
    for (const char* text : {"", "\r\nA,B\r\n", "\nA,B\n"}) EXPECT_EQ(kFailed, Load(text)) << text;
}

// What ordinary tools write: a byte-order mark, quoted names, blanks after the commas. The
// names are written back plain.
TEST(ContentTableLoad, HeaderNamesAreUnquotedAndTrimmed) {
    CContentTable table;
    ASSERT_EQ(CContentTable::kOk,
              table.LoadFromText("\xEF\xBB\xBF\"FileName\",\"UpgradeStatus\", Force Download ,\" A \",\t\r\n"
                                 "f.dll,Downloaded, 1\r\n"));
    EXPECT_EQ("FileName|UpgradeStatus|Force Download| A |;f.dll|Downloaded| 1||", Dump(table));
    EXPECT_EQ(2, table.ColumnIndex("force download"));
    EXPECT_EQ("FileName,UpgradeStatus,Force Download, A ,\r\nf.dll,Downloaded, 1,,\r\n", table.ToFileText());
    // Only the file's first bytes can be a byte-order mark.
    EXPECT_EQ("A|B;\xEF\xBB\xBFx|y", Load("\xEF\xBB\xBF" "A,B\r\n\xEF\xBB\xBFx,y\r\n"));
    EXPECT_EQ("|;a|b", Load("\xEF\xBB\xBF" "a,b\r\n", false));
}

TEST(ContentTableLoad, CommasAndQuotes) {
    EXPECT_EQ("FileName|UpgradeStatus", Load("FileName,UpgradeStatus,\r\n"));
    EXPECT_EQ("A|B|C;\"x|y\"|z;p|q|r;||;m||", Load("A,B,C\r\n\"x,y\",z\r\np,q,r,\r\n,\r\nm,,\r\n"));
    EXPECT_EQ("A|B|C|D|E|F|G|H; a|x y|q| |||\"| b c ",
              Load("A,B,C,D,E,F,G,H\r\n a,  \"x y\"  ,\"q\", ,  ,\"\",\", b c \r\n"));
}

TEST(ContentTableLoad, ShortRowsFillUpLongRowsFail) {
    EXPECT_EQ("A|B|C;a|b|", Load("A,B,C\r\na,b\r\n"));
    EXPECT_EQ("|;a|b;c|", Load("a,b\r\nc\r\n", false));
    CContentTable table;
    EXPECT_EQ(CContentTable::kFail, table.LoadFromText("A,B,C\r\n1,2,3\r\na,b,c,d\r\n"));
    EXPECT_EQ(0u, table.RowCount());
}

// The reason names the line, counted from the header as line 1, blank lines included; a load
// that succeeds has none.
TEST(ContentTableLoad, AFailedLoadSaysWhy) {
    CContentTable table;
    EXPECT_EQ(CContentTable::kFail, table.LoadFromText("FileName,UpgradeStatus\na,b\n\na,\"Dec 31, 2003\"\n"));
    EXPECT_EQ("line 4 has more cells than the 2 columns of the header", table.LoadFailure());
    EXPECT_EQ(CContentTable::kFail, table.LoadFromText("\xEF\xBB\xBF\r\nA\r\n"));
    EXPECT_EQ("line 1 is empty, there is no header", table.LoadFailure());
    EXPECT_EQ(CContentTable::kOk, table.LoadFromText("A\r\n"));
    EXPECT_EQ("", table.LoadFailure());
    EXPECT_EQ(CContentTable::kFail, table.FailLoad("no column X"));
    EXPECT_EQ(0u, table.ColumnCount());
    EXPECT_EQ("no column X", table.LoadFailure());
}

std::string Repeat(const std::string& text, std::size_t times) {
    std::string out;
    out.reserve(text.size() * times);
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

TEST(ContentTableAccess, ColumnsByNameAndCellsOutsideTheTable) {
    CContentTable table;
    table.LoadFromText("FileName,UpgradeStatus,FILENAME\r\nf,s,g\r\n");
    EXPECT_EQ(0, table.ColumnIndex("filename"));
    EXPECT_EQ(-1, table.ColumnIndex("File"));
    EXPECT_EQ(-1, table.ColumnIndex("Fxxxxxxx"));
    EXPECT_EQ("", table.Cell(1, 0));
    EXPECT_EQ("", table.Field(0, "Command"));
    EXPECT_FALSE(table.SetCell(1, 0, "x"));
    EXPECT_FALSE(table.SetField(0, "Command", "x"));
    EXPECT_TRUE(table.SetField(0, "upgradeSTATUS", "y"));
    EXPECT_EQ("FileName|UpgradeStatus|FILENAME;f|y|g", Dump(table));
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

// A save that the platform refuses leaves the previous file byte for byte, no temporary file
// beside it, and reports the Windows error to the caller.
TEST_F(ContentTableFile, AFailedSaveKeepsTheOldFile) {
    const std::string path = "C:\\Pex\\content.csv";
    const std::string old = "A,B\n1,2\n";
    machine_.WriteFile(path, old);
    CContentTable table;
    table.LoadFromText("A,B\r\n3,4\r\n5,6\r\n");
    const auto expectRefused = [&](std::uint32_t code) {
        try {
            table.SaveToFile(path);
            ADD_FAILURE() << "the save did not fail";
        } catch (const plat::CFileException& e) {
            EXPECT_EQ(code, e.OsError());
        }
        EXPECT_EQ(old, machine_.ReadFile(path));
        EXPECT_EQ(1u, plat::files::Find("C:\\Pex\\*").size());
    };
    plat::fault::FailNth(plat::fault::Op::Write, 1, plat::kErrorDiskFull);
    expectRefused(plat::kErrorDiskFull);
    plat::fault::Clear();
    // Written and flushed, then stopped before it replaces the file: the old file stays whole.
    plat::fault::FailNth(plat::fault::Op::Rename, 1, plat::kErrorSharingViolation);
    expectRefused(plat::kErrorSharingViolation);
    plat::fault::Clear();

    ASSERT_TRUE(plat::files::SetAttributes(path, plat::files::kAttrReadOnly));
    expectRefused(plat::kErrorAccessDenied);
}

}  // namespace
