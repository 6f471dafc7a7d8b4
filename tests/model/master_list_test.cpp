// CFileGroup and CMasterList: dependency lists, where files go, the order of a walk over the
// groups, the files-added count and the dependency check that holds a group back. A group's
// members in the order added, and its applied and decompressed states, which the first member
// not yet so decides, show in every golden run (group_rollback_and_statuses, decompress_failures).
#include "model/master_list.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "tests/support/case_file.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

using Lines = std::vector<std::string>;

CFile_ Row(std::uint32_t row) {
    const std::string name = "f" + std::to_string(row) + ".dll";
    return CFile_(row, true, false, "C:\\App", name, "C:\\Cache\\" + name, "", "", false, 0);
}

TEST(FileGroup, DependancyListsOfTheCaseFile) {
    for (const pextest::Case& c : pextest::ReadCases("model/cases/dependancy_lists.txt")) {
        SCOPED_TRACE(c.where);
        CFileGroup group("G");
        EXPECT_EQ(c[1] == "true", group.AddDependancies(pextest::Unescape(c[0])));
        std::string names;
        for (const std::string& name : group.GetDependancies()) names += "[" + name + "]";
        EXPECT_EQ(pextest::Unescape(c[2]), names.empty() ? "none" : names);
    }
}

// "key:name:rows" for every group, in walk order.
Lines Walk(const CMasterList& list) {
    Lines out;
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

// Unnamed files first, in row order; then groups by upper-cased name (no trimming, other bytes
// as they are), equal keys in the order made, each file in the first group of its key.
TEST(MasterList, GroupsAreWalkedByKeyAndFilesJoinTheFirstGroupOfTheirKey) {
    CMasterList list;
    list.AddNewFileGroup("base");
    EXPECT_TRUE(list.AddFile("", Row(0), ""));
    EXPECT_TRUE(list.AddFile("Zeta", Row(1), "A"));
    EXPECT_TRUE(list.AddFile("", Row(2), ""));
    EXPECT_TRUE(list.AddFile(" base", Row(3), ""));
    list.AddNewFileGroup("BASE");
    EXPECT_TRUE(list.AddFile("BaSe", Row(4), ""));
    EXPECT_FALSE(list.AddFile("ZETA", Row(5), "A"));  // a repeated dependency: not counted
    EXPECT_TRUE(list.AddFile("_\xC3\xA9t\xC3\xA9", Row(6), ""));
    EXPECT_EQ(Walk(list), (Lines{"::0", "::2", " BASE: base:3", "BASE:base:4", "BASE:BASE:",
                                 "ZETA:Zeta:15", "_\xC3\xA9T\xC3\xA9:_\xC3\xA9t\xC3\xA9:6"}));
    EXPECT_EQ(6, list.GetFilesAdded());
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

// A missing group and an empty one count as applied; an unnamed group is never checked, but
// the empty name, which sorts first, finds it.
TEST_F(Dependancies, AGroupWaitsUntilEveryMemberOfItsDependancyIsApplied) {
    CMasterList list;
    list.AddFile("", Row(1), "Missing;Waits");
    list.AddFile("App", Row(3), "base;Missing");
    list.AddFile("BASE", Row(1), "");
    list.AddFile("Base", Row(2), "");
    list.AddNewFileGroup("Empty");
    list.AddFile("Waits", Row(4), "EMPTY;gone");
    list.AddFile("Unnamed", Row(5), "A;;B");
    EXPECT_TRUE(list.DependedOnItemsApplied(Group(list, "Waits")));
    EXPECT_TRUE(list.DependedOnItemsApplied(list.begin()));
    EXPECT_FALSE(trace.Contains("CMasterList examining dependancy 'Waits'"));
    // The trace of each step is the golden runs' (group_rollback_and_statuses, failed_restore).
    const auto app = Group(list, "App");
    EXPECT_FALSE(list.DependedOnItemsApplied(app));
    ApplyAll(Group(list, "BASE")->second);
    EXPECT_TRUE(list.DependedOnItemsApplied(app));

    EXPECT_FALSE(list.DependedOnItemsApplied(Group(list, "Unnamed")));
    EXPECT_TRUE(trace.Contains("CMasterList found dependancy ''"));
    ApplyAll(list.begin()->second);
    EXPECT_TRUE(list.DependedOnItemsApplied(Group(list, "Unnamed")));
}

}  // namespace
