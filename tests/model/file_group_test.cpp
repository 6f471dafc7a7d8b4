// CFileGroup: the dependency-list rules, the order of members and names, and the group's
// decompressed and applied states.
#include "model/file_group.h"

#include <gtest/gtest.h>

#include <set>
#include <string>
#include <vector>

#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

using Lines = std::vector<std::string>;
using Names = std::set<std::string>;

CFile_ Member(std::uint32_t row, bool applied, bool needsDecompression) {
    return CFile_(row, true, applied, "C:\\App", "f" + std::to_string(row) + ".dll",
                  "C:\\Cache\\f.dll", "", "", needsDecompression, 1);
}

TEST(FileGroupDependancies, ListsSplitAtSemicolonsWithTrimmedItems) {
    struct Case {
        const char* text;
        bool result;
        Names names;
    };
    const Case cases[] = {
        {"A; B", true, {"A", "B"}},
        {"A;  \t", true, {"A"}},
        {"", true, {}},
        {" \n ", true, {}},
        {"A;;B", true, {"", "A", "B"}},
        {";A", true, {"", "A"}},
        {"A;a; A", false, {"A", "a"}},
        {"b\r;A", true, {"A", "b\r"}},  // carriage returns are kept
    };
    for (const Case& c : cases) {
        CFileGroup group("G");
        EXPECT_EQ(c.result, group.AddDependancies(c.text)) << c.text;
        EXPECT_EQ(c.names, group.GetDependancies()) << c.text;
    }
}

TEST(FileGroupDependancies, NamesKeepTheirCaseInByteOrder) {
    CFileGroup group("G");
    group.AddDependancies("core;\xC3\xA9t\xC3\xA9;CORE;_x;Base");
    const std::vector<std::string> order(group.GetDependancies().begin(),
                                         group.GetDependancies().end());
    EXPECT_EQ(order, (std::vector<std::string>{"Base", "CORE", "_x", "core", "\xC3\xA9t\xC3\xA9"}));
}

TEST(FileGroupDependancies, ARepeatedNameIsTracedAndReportedButTheFileStays) {
    pextest::TestMachine machine;
    CFileGroup group("G");
    const CFile_ file = Member(1, false, false);
    pextest::TraceCapture trace;
    EXPECT_FALSE(group.AddFileAndDependancies(file, "A;A"));
    EXPECT_EQ(1u, group.GetFiles().size());
    EXPECT_EQ(trace.Lines(), (Lines{
        "CFile_: STL constructor complete for item @ 1",
        "CFileGroup: AddFileToGroup, before was 0, now is 1",
        "CFileGroup: AddDependancies, input is 'A;A'",
        "CFileGroup: AddDependancy, input is 'A'",
        "CFileGroup: AddDependancy, before was 0 now is 1",
        "CFileGroup: AddDependancy, input is 'A'",
        "CFileGroup: AddDependancy, before was 1 now is 1",
        "CFileGroup: AddDependancies, return value is 0",
    }));
}

TEST(FileGroupStates, AnEmptyGroupIsDecompressedAndApplied) {
    const CFileGroup group("G");
    EXPECT_TRUE(group.IsGroupDecompressed());
    EXPECT_TRUE(group.IsGroupApplied());
}

TEST(FileGroupStates, MembersKeepTheirOrderAndTheFirstUnappliedOneDecides) {
    pextest::TestMachine machine;
    CFileGroup group("G");
    group.AddFileToGroup(Member(3, true, false));
    group.AddFileToGroup(Member(1, false, true));
    group.AddFileToGroup(Member(2, false, false));
    std::vector<std::uint32_t> rows;
    for (const CFile_& file : group.GetFiles()) rows.push_back(file.GetRow());
    EXPECT_EQ(rows, (std::vector<std::uint32_t>{3, 1, 2}));

    pextest::TraceCapture trace;
    EXPECT_FALSE(group.IsGroupApplied());
    EXPECT_FALSE(group.IsGroupDecompressed());
    EXPECT_EQ(trace.Lines(), (Lines{
        "File 'f3.dll' is applied",
        "File 'f1.dll' is not applied",
        "CFileGroup: IsGroupApplied complete 0",
        "CFileGroup: IsGroupDecompressed complete 0",
    }));
}

TEST(FileGroupStates, ACopyCarriesMembersNamesAndRetries) {
    CFileGroup group("Core");
    group.AddFileAndDependancies(Member(1, true, false), "Base");
    EXPECT_TRUE(group.IncrementRetries());
    group.IncrementRetries();
    const CFileGroup copy(group);
    EXPECT_EQ("Core", copy.GetName());
    EXPECT_EQ(2, copy.GetRetries());
    EXPECT_EQ(Names{"Base"}, copy.GetDependancies());
    EXPECT_EQ(1u, copy.GetFiles().size());
    EXPECT_TRUE(copy.IsGroupApplied());
}

}  // namespace
