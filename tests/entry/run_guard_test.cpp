// One run at a time on the machine: a lock left by a killed process is taken over, two hosts
// started at once apply each file once, and the trace file lost by one run is tried again by
// the next. A host that calls again while a run is in progress is the golden runs'
// (nested_while_applying, nested_in_product_run, host_calls_twice).
#include <gtest/gtest.h>

#include "entry/run_guard.h"
#include "entry/update_all.h"
#include "manifest/manifest_parser.h"
#include "platform/files.h"
#include "platform/machine.h"
#include "tests/pipeline/pipeline_fixture.h"

#ifndef _WIN32
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>
#endif

using pextest::ContentRow;

namespace {

class RunGuard : public pextest::PipelineTest {
protected:
    void SetUp() override {
        for (const char* name : {"a.dll", "b.dll"}) machine.WriteFile(std::string(kHome) + "\\" + name, "old");
        Publish({Row("a.dll", "new a", "G"), Row("b.dll", "new b", "G")});
    }
    void TearDown() override { plat::SetMachineLockWaitCap(plat::kNoMachineLockWaitCap); }
};

// A trace file that cannot be opened is lost for the rest of that run only.
TEST_F(RunGuard, EachRunTriesALostTraceFileAgain) {
    pextest::TraceCapture later("C:\\Later\\trace.log");
    TRACE(g_TraceLog, "lost: the folder is missing");
    EXPECT_FALSE(g_TraceLog.fileOutput);
    ASSERT_TRUE(plat::files::MakeDirectory("C:\\Later"));
    UpdateAll(nullptr);
    EXPECT_TRUE(later.Contains("UpdateAll, main key is open"));

    later.Clear();
    ASSERT_TRUE(plat::files::RemoveDirectory("C:\\Later"));
    TRACE(g_TraceLog, "lost again");
    ASSERT_TRUE(plat::files::MakeDirectory("C:\\Later"));
    CManifestParser parser;  // a host driving a parser alone starts a run too
    parser.ProcessUpdateInformation(_bstr_t(kProduct), nullptr);
    EXPECT_TRUE(later.Contains("CManifestParser: ProcessUpdateInformation"));
}

#ifndef _WIN32
// Once another process that held the machine's update lock is gone, even killed while it held
// it, a product run goes ahead (the golden run update_lock_held shows the run given up while the
// lock is held).
TEST_F(RunGuard, ALockLeftByAKilledProcessIsTakenOver) {
    plat::SetMachineLockWaitCap(0);
    int ready[2];
    ASSERT_EQ(pipe(ready), 0);
    const pid_t other = fork();
    if (other == 0) {
        plat::MachineLock lock(kProductRunLockName);
        if (lock.Acquire(0) && write(ready[1], "y", 1) == 1) pause();  // until killed
        _exit(1);  // no destructors: the parent's test objects are not the child's
    }
    close(ready[1]);
    char held = 'n';
    ASSERT_EQ(read(ready[0], &held, 1), 1) << "the other process did not take the lock";
    close(ready[0]);
    {
        CManifestParser parser;
        EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t(kProduct), nullptr), 1);
    }
    kill(other, SIGKILL);  // as a crash would end it
    waitpid(other, nullptr, 0);
    CManifestParser parser;
    EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t(kProduct), nullptr), 0);
    EXPECT_EQ(Installed("a.dll"), "new a");
    EXPECT_EQ(Installed("b.dll"), "new b");
    EXPECT_FALSE(ContentEntriesPresent());
}

// Two hosts started at once on one machine, each updating every product: each file is applied
// once, by whichever run comes first, and the other finds nothing left to do.
TEST_F(RunGuard, TwoProcessesStartedAtOnceApplyEveryFile) {
    constexpr int kFiles = 120;
    std::vector<ContentRow> rows;
    for (int i = 0; i < kFiles; ++i) {
        const std::string name = "f" + std::to_string(i) + ".dll";
        machine.WriteFile(std::string(kHome) + "\\" + name, "old");
        rows.push_back(Row(name, "new " + std::to_string(i), "G" + std::to_string(i % 7)));
    }
    Publish(rows);
    plat::machine::SetRoot(machine.Root());  // each child opens the registry for itself
    int start[2];
    ASSERT_EQ(pipe(start), 0);
    pid_t children[2];
    for (pid_t& child : children) {
        child = fork();
        if (child == 0) {
            close(start[1]);
            char go;
            if (read(start[0], &go, 1) != 0) _exit(1);  // goes on when the parent closes its end
            g_TraceLog.enabled = false;
            UpdateAll(nullptr);
            _exit(0);
        }
    }
    close(start[0]);
    close(start[1]);  // both children start now
    for (pid_t child : children) {
        int status = -1;
        waitpid(child, &status, 0);
        EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0);
    }
    for (int i = 0; i < kFiles; ++i)
        EXPECT_EQ(Installed("f" + std::to_string(i) + ".dll"), "new " + std::to_string(i));
    EXPECT_FALSE(plat::files::Exists(kContent));
    EXPECT_FALSE(ContentEntriesPresent());
}
#endif

}  // namespace
