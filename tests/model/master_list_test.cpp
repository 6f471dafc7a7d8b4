// CMasterList: where files go, the order of a walk over the groups, the files-added count and
// the dependency check that holds a group back.
#include "model/master_list.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

using Lines = std::vector<std::string>;

CFile_ Row(std::uint32_t row) {
    return CFile_(row, true, false, "C:\\App", "f" + std::to_string(row) + ".dll",
                  "C:\\Cache\\f" + std::to_string(row) + ".dll", "", "", false, 0);
}

// "key:name:rows" for every group, in walk order.
std::vector<std::string> Walk(const CMasterList& list) {
    std::vector<std::string> out;
    for (const auto& [key, group] : list) {
        std::string entry = key + ":" + group.GetName() + ":";
        for (const CFile_& file : group.GetFiles()) entry += std::to_string(file.GetRow());
        out.push_back(entry);
    }
    return out;
}

CMasterList::iterator Group(CMasterList& list, const std::string& name) {
    for (auto it = list.begin(); it != list.end(); ++it)
        if (it->second.GetName() == name) return it;
    return list.end();
}

TEST(MasterList, UnnamedFilesComeFirstInRowOrderThenGroupsByUpperCasedName) {
    CMasterList list;
    EXPECT_TRUE(list.AddFile("", Row(0), ""));
    EXPECT_TRUE(list.AddFile("zeta", Row(1), ""));
    EXPECT_TRUE(list.AddFile("", Row(2), ""));
    EXPECT_TRUE(list.AddFile("Core", Row(3), ""));
    EXPECT_TRUE(list.AddFile("CORE", Row(4), ""));
    EXPECT_TRUE(list.AddFile("_tools", Row(5), ""));
    EXPECT_TRUE(list.AddFile("", Row(6), ""));
    EXPECT_EQ(Walk(list), (Lines{"::0", "::2", "::6", "CORE:Core:34", "ZETA:zeta:1",
                                 "_TOOLS:_tools:5"}));
    EXPECT_EQ(7, list.GetFilesAdded());
}

TEST(MasterList, KeysUpperCaseOnlyAsciiLettersAndEqualKeysKeepTheirOrder) {
    EXPECT_EQ(" CORE-\xC3\xA9" "1", CMasterList::GroupKey(" core-\xC3\xA9" "1"));
    CMasterList list;
    list.AddNewFileGroup("Base");
    list.AddNewFileGroup("base");
    list.AddFile("BASE", Row(1), "");  // the first group of the key takes it
    list.AddFile(" base", Row(2), "");  // no trimming: another key
    EXPECT_EQ(Walk(list), (Lines{" BASE: base:2", "BASE:Base:1", "BASE:base:"}));
}

TEST(MasterList, ARepeatedDependancyKeepsTheFileButNotItsCount) {
    CMasterList list;
    EXPECT_TRUE(list.AddFile("G", Row(1), "A"));
    EXPECT_FALSE(list.AddFile("g", Row(2), "A"));
    EXPECT_EQ(Walk(list), (Lines{"G:G:12"}));
    EXPECT_EQ(1, list.GetFilesAdded());
}

TEST(MasterList, AddFileTracesWhereTheFileWent) {
    pextest::TestMachine machine;
    CMasterList list;
    const CFile_ file = Row(1);
    pextest::TraceCapture trace;
    list.AddFile("Core", file, "Base");
    EXPECT_EQ(trace.Lines(), (Lines{
        "CMasterList AddFile, group name is 'Core', dependancy data is 'Base'",
        "CMasterList Named Group section...",
        "CMasterList adding group as group was not found",
        "CMasterList AddNewFileGroup, group name is 'Core'",
        "CFileGroup: Empty group constructor complete.  Group name is 'Core'",
        "CFileGroup: STL constructor complete",
        "CMasterList adding file to group, file is 'f1.dll', depending on 'Base'",
        "CFile_: STL constructor complete for item @ 1",
        "CFileGroup: AddFileToGroup, before was 0, now is 1",
        "CFileGroup: AddDependancies, input is 'Base'",
        "CFileGroup: AddDependancy, input is 'Base'",
        "CFileGroup: AddDependancy, before was 0 now is 1",
        "CFileGroup: AddDependancies, return value is 1",
        "CMasterList AddFile returning 1",
    }));
    trace.Clear();
    list.AddFile("CORE", file, "");
    EXPECT_TRUE(trace.Contains("CMasterList found group..."));
}

// Members become applied through the copies that the groups hold, as in the apply pipeline.
class Dependancies : public ::testing::Test {
protected:
    void SetUp() override {
        for (const char* name : {"C:\\Cache\\f1.dll", "C:\\Cache\\f2.dll"}) machine.WriteFile(name, "x");
    }
    static void ApplyAll(CFileGroup& group) {
        for (CFile_& file : group.GetFiles()) ASSERT_EQ(1, file.Apply());
    }

    pextest::TestMachine machine;
    pextest::TraceCapture trace;
};

TEST_F(Dependancies, AGroupWaitsUntilEveryMemberOfItsDependancyIsApplied) {
    CMasterList list;
    list.AddFile("App", Row(3), "base;Missing");
    list.AddFile("BASE", Row(1), "");
    list.AddFile("Base", Row(2), "");
    const auto app = Group(list, "App");
    trace.Clear();
    EXPECT_FALSE(list.DependedOnItemsApplied(app));
    // The names are taken in byte order, so the missing one is never reached.
    EXPECT_EQ(trace.Lines(), (Lines{
        "CMasterList DependedOnItemsApplied",
        "CMasterList checking dependancies, 2 to check",
        "CMasterList examining dependancy 'Missing'",
        "Searching CMasterList for 'MISSING'",
        "Did not find item in master list, setting leaving all ready set to true.",
        "CMasterList examining dependancy 'base'",
        "Searching CMasterList for 'BASE'",
        "CMasterList found dependancy 'base'",
        "File 'f1.dll' is not applied",
        "CFileGroup: IsGroupApplied complete 0",
        "CMasterList DependedOnItemsApplied, returning 0",
    }));

    ApplyAll(Group(list, "BASE")->second);
    EXPECT_TRUE(list.DependedOnItemsApplied(app));
}

TEST_F(Dependancies, EmptyMissingAndOwnGroups) {
    CMasterList list;
    list.AddNewFileGroup("Empty");
    list.AddFile("Waits", Row(1), "EMPTY;gone");
    list.AddFile("Self", Row(2), "self");
    EXPECT_TRUE(list.DependedOnItemsApplied(Group(list, "Waits")));
    EXPECT_FALSE(list.DependedOnItemsApplied(Group(list, "Self")));
    ApplyAll(Group(list, "Self")->second);
    EXPECT_TRUE(list.DependedOnItemsApplied(Group(list, "Self")));
}

TEST_F(Dependancies, UnnamedGroupsAreNeverCheckedButTheEmptyNameFindsThem) {
    CMasterList list;
    list.AddFile("", Row(1), "Missing;Waits");
    list.AddFile("Waits", Row(2), "A;;B");
    trace.Clear();
    EXPECT_TRUE(list.DependedOnItemsApplied(list.begin()));
    EXPECT_EQ(trace.Lines(), (Lines{
        "CMasterList DependedOnItemsApplied",
        "CMasterList vacuously true condition",
        "CMasterList DependedOnItemsApplied, returning 1",
    }));
    // "" sorts first and finds the unnamed group, whose member is not applied.
    EXPECT_FALSE(list.DependedOnItemsApplied(Group(list, "Waits")));
    EXPECT_TRUE(trace.Contains("CMasterList found dependancy ''"));
    ApplyAll(list.begin()->second);
    EXPECT_TRUE(list.DependedOnItemsApplied(Group(list, "Waits")));
}

}  // namespace
