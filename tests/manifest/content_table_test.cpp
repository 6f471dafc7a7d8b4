#include "manifest/content_table.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "platform/cfile.h"
#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "tests/support/test_machine.h"

namespace {

using Rows = std::vector<std::vector<std::string>>;

Rows AllRows(const CContentTable& table) {
    Rows rows;
    for (std::uint32_t r = 0; r < table.RowCount(); ++r) {
        rows.emplace_back();
        for (std::uint32_t c = 0; c < table.ColumnCount(); ++c) rows.back().push_back(table.Cell(r, c));
    }
    return rows;
}

std::vector<std::string> Columns(const CContentTable& table) {
    std::vector<std::string> names;
    for (std::uint32_t c = 0; c < table.ColumnCount(); ++c) names.push_back(table.ColumnName(c));
    return names;
}

CContentTable Loaded(const std::string& bytes) {
    CContentTable table;
    EXPECT_EQ(CContentTable::kOk, table.LoadFromText(bytes)) << bytes;
    return table;
}

TEST(ContentTableLines, EveryLineEndStyleGivesTheSameRows) {
    const Rows expected = {{"1", "2"}, {"3", "4"}};
    for (const char* text : {"A,B\r\n1,2\r\n3,4\r\n", "A,B\n1,2\n3,4\n", "A,B\r1,2\r3,4\r",
                             "A,B\r\n1,2\n3,4", "A,B\r1,2\r\n3,4\n"}) {
        const CContentTable table = Loaded(text);
        EXPECT_EQ((std::vector<std::string>{"A", "B"}), Columns(table)) << text;
        EXPECT_EQ(expected, AllRows(table)) << text;
    }
}

// The table ends at the first empty line, whatever its line end; nothing after it is read,
// not even a row that would fail the load.
TEST(ContentTableLines, FirstEmptyLineEndsTheTable) {
    for (const char* text : {"A,B\r\n1,2\r\n\r\n3,4\r\n", "A,B\n1,2\n\n3,4\n", "A,B\r1,2\r\r3,4\r",
                             "A,B\r\n1,2\r\n\n3,4\r\n", "A,B\r\n1,2\r\n\r3,4\r\n"}) {
        EXPECT_EQ((Rows{{"1", "2"}}), AllRows(Loaded(text))) << text;
    }
    const CContentTable table = Loaded("A,B,C\r\n\r\nx,y,z,too,many\r\n");
    EXPECT_EQ(3u, table.ColumnCount());
    EXPECT_EQ(0u, table.RowCount());
}

TEST(ContentTableLines, MissingOrEmptyHeaderFails) {
    CContentTable table;
    EXPECT_EQ(CContentTable::kFail, table.LoadFromText(""));
    EXPECT_EQ(CContentTable::kFail, table.LoadFromText("\r\nA,B\r\n"));
    EXPECT_EQ(CContentTable::kFail, table.LoadFromText("\nA,B\n"));
    EXPECT_EQ(0u, table.ColumnCount());
    EXPECT_EQ(CContentTable::kOk, table.LoadFromText("A,B"));
    EXPECT_EQ(2u, table.ColumnCount());
    EXPECT_EQ(0u, table.RowCount());
}

TEST(ContentTableCells, EveryCommaSplitsAndATrailingCommaAddsNoCell) {
    const CContentTable header = Loaded("FileName,UpgradeStatus,\r\n");
    EXPECT_EQ((std::vector<std::string>{"FileName", "UpgradeStatus"}), Columns(header));

    const CContentTable table = Loaded("A,B,C\r\n\"x,y\",z\r\np,q,r,\r\n,\r\nm,,\r\n");
    EXPECT_EQ((Rows{{"\"x", "y\"", "z"}, {"p", "q", "r"}, {"", "", ""}, {"m", "", ""}}),
              AllRows(table));
}

TEST(ContentTableCells, QuotesAndBlanksFollowTheUnquotingRule) {
    const CContentTable table =
        Loaded("A,B,C,D,E,F,G,H\r\n a,  \"x y\"  ,\"q\", ,  ,\"\",\", b c \r\n");
    EXPECT_EQ((Rows{{" a", "x y", "q", " ", "", "", "\"", " b c "}}), AllRows(table));
}

TEST(ContentTableCells, ShortRowsFillUpAndLongRowsFailTheLoad) {
    EXPECT_EQ((Rows{{"a", "b", ""}, {"", "", ""}}), AllRows(Loaded("A,B,C\r\na,b\r\n,\r\n")));

    CContentTable table;
    EXPECT_EQ(CContentTable::kFail, table.LoadFromText("A,B,C\r\n1,2,3\r\na,b,c,d\r\n"));
    EXPECT_EQ(0u, table.ColumnCount());
    EXPECT_EQ(0u, table.RowCount());
}

TEST(ContentTableCells, WithoutHeaderTheFirstLineIsARow) {
    CContentTable table;
    ASSERT_EQ(CContentTable::kOk, table.LoadFromText("a,b\r\nc\r\n", false));
    EXPECT_EQ((std::vector<std::string>{"", ""}), Columns(table));
    EXPECT_EQ((Rows{{"a", "b"}, {"c", ""}}), AllRows(table));
}

TEST(ContentTableAccess, ColumnsMatchWithoutRegardToCaseFirstMatchWins) {
    const CContentTable table = Loaded("FileName,UpgradeStatus,FILENAME\r\nf,s,g\r\n");
    EXPECT_EQ(0, table.ColumnIndex("filename"));
    EXPECT_EQ(1, table.ColumnIndex("UPGRADESTATUS"));
    EXPECT_EQ(-1, table.ColumnIndex("File"));
    EXPECT_EQ("f", table.Field(0, "FILEname"));
    EXPECT_EQ("", table.ColumnName(3));
}

TEST(ContentTableAccess, OutsideTheTableReadsEmptyAndWritesNothing) {
    CContentTable table = Loaded("A,B\r\n1,2\r\n");
    EXPECT_EQ("", table.Cell(1, 0));
    EXPECT_EQ("", table.Cell(0, 2));
    EXPECT_EQ("", table.Field(0, "C"));
    EXPECT_FALSE(table.SetCell(1, 0, "x"));
    EXPECT_FALSE(table.SetCell(0, 2, "x"));
    EXPECT_FALSE(table.SetField(0, "C", "x"));
    EXPECT_TRUE(table.SetField(0, "b", "y"));
    EXPECT_EQ((Rows{{"1", "y"}}), AllRows(table));
}

TEST(ContentTableText, RenderingPadsEachColumnToItsWidestEntry) {
    CContentTable table = Loaded("Name,Status\r\nlongfilename.dll,OK\r\na,Downloaded\r\n");
    EXPECT_EQ("\n"
              "Name(KEY)        Status     \n"
              "longfilename.dll OK         \n"
              "a                Downloaded \n",
              table.ToText());
    table.keyColumn = 1;
    EXPECT_EQ("\n"
              "Name             Status(KEY) \n"
              "longfilename.dll OK          \n"
              "a                Downloaded  \n",
              table.ToText());
    EXPECT_EQ("\n\n", CContentTable().ToText());
}

TEST(ContentTableText, WritingEndsEveryLineInCrLfWithoutQuotes) {
    CContentTable table = Loaded("A,B\n\"q\", x\n\"x,y\"\n");
    EXPECT_EQ("A,B\r\nq, x\r\n\"x,y\"\r\n", table.ToFileText());
    table.SetCell(0, 1, "two\nlines\r\n");
    EXPECT_EQ("A,B\r\nq,two\r\nlines\r\n\r\n\"x,y\"\r\n", table.ToFileText());
}

class ContentTableFile : public ::testing::Test {
protected:
    void TearDown() override { plat::fault::Clear(); }
    pextest::TestMachine machine_;
};

TEST_F(ContentTableFile, LoadsAFileAndWritesItBackWithCrLf) {
    machine_.WriteFile("C:\\Pex\\content.csv",
                       "FileName,UpgradeStatus,Command\n\"a.dll\",Downloaded, run\nb.dll\n");
    CContentTable table;
    ASSERT_EQ(CContentTable::kOk, table.LoadFromFile("c:\\pex\\CONTENT.csv"));
    EXPECT_EQ((Rows{{"a.dll", "Downloaded", " run"}, {"b.dll", "", ""}}), AllRows(table));

    EXPECT_EQ(CContentTable::kOk, table.SaveToFile("C:\\Pex\\content.csv"));
    EXPECT_EQ("FileName,UpgradeStatus,Command\r\na.dll,Downloaded, run\r\nb.dll,,\r\n",
              machine_.ReadFile("C:\\Pex\\content.csv"));
}

TEST_F(ContentTableFile, ATableWithoutColumnsSavesAnEmptyHeaderLine) {
    EXPECT_EQ(CContentTable::kFalse, CContentTable().SaveToFile("C:\\empty.csv"));
    EXPECT_EQ("\r\n", machine_.ReadFile("C:\\empty.csv"));
}

TEST_F(ContentTableFile, AFileThatCannotBeOpenedGivesItsWindowsError) {
    CContentTable table;
    EXPECT_EQ(static_cast<std::int32_t>(0x80070002u), table.LoadFromFile("C:\\missing.csv"));
    EXPECT_EQ(static_cast<std::int32_t>(0x80070003u), table.LoadFromFile("C:\\no\\such.csv"));
}

// A save that the platform refuses leaves the previous file byte for byte, no temporary file
// beside it, and reports the Windows error to the caller.
TEST_F(ContentTableFile, AFailedSaveKeepsTheOldFile) {
    const std::string path = "C:\\Pex\\content.csv";
    const std::string old = "A,B\n1,2\n";
    machine_.WriteFile(path, old);
    const CContentTable table = Loaded("A,B\r\n3,4\r\n5,6\r\n");
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

    ASSERT_TRUE(plat::files::SetAttributes(path, plat::files::kAttrReadOnly));
    expectRefused(plat::kErrorAccessDenied);
}

}  // namespace
