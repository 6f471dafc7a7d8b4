// CFileGroup: the dependency-list rules and the group's decompressed and applied states.
#include "model/file_group.h"

#include <gtest/gtest.h>

#include <set>
#include <string>
#include <vector>

#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

using Names = std::set<std::string>;

CFile_ Member(std::uint32_t row, bool applied, bool needsDecompression) {
    return CFile_(row, true, applied, "C:\\App", "f" + std::to_string(row) + ".dll",
                  "C:\\Cache\\f.dll", "", "", needsDecompression, 1);
}

TEST(FileGroup, DependancyListsSplitAtSemicolonsIntoTrimmedNamesKeptAsWritten) {
    struct Case {
        const char* text;
        bool result;
        Names names;
    };
    const Case cases[] = {
        {"A; B", true, {"A", "B"}},
        {"A;  \t", true, {"A"}},
        {" \n ", true, {}},
        {"A;;B", true, {"", "A", "B"}},
        {";A", true, {"", "A"}},
        {"A;a; A", false, {"A", "a"}},  // the repeat is reported and kept once
        {"b\r;A", true, {"A", "b\r"}},  // carriage returns are kept
    };
    for (const Case& c : cases) {
        CFileGroup group("G");
        EXPECT_EQ(c.result, group.AddDependancies(c.text)) << c.text;
        EXPECT_EQ(c.names, group.GetDependancies()) << c.text;
    }
}

TEST(FileGroup, MembersKeepTheirOrderAndTheFirstUnappliedOneDecides) {
    pextest::TestMachine machine;
    CFileGroup group("G");
    EXPECT_TRUE(group.IsGroupApplied());
    EXPECT_TRUE(group.IsGroupDecompressed());
    group.AddFileToGroup(Member(3, true, false));
    group.AddFileToGroup(Member(1, false, true));
    EXPECT_TRUE(group.AddFileAndDependancies(Member(2, false, false), ""));
    std::vector<std::uint32_t> rows;
    for (const CFile_& file : group.GetFiles()) rows.push_back(file.GetRow());
    EXPECT_EQ(rows, (std::vector<std::uint32_t>{3, 1, 2}));

    pextest::TraceCapture trace;
    EXPECT_FALSE(group.IsGroupApplied());
    EXPECT_FALSE(group.IsGroupDecompressed());
    EXPECT_EQ(trace.Lines(), (std::vector<std::string>{
        "File 'f3.dll' is applied",
        "File 'f1.dll' is not applied",
        "CFileGroup: IsGroupApplied complete 0",
        "CFileGroup: IsGroupDecompressed complete 0",
    }));
}

}  // namespace
