// One run at a time: a host that calls the library again while a run is in progress (from a
// progress callback here; from a window message during a [RUN] wait on Windows) is refused
// without effect, a product run of another process on the same machine is waited for, and the
// trace file lost by one run is tried again by the next.
#include <gtest/gtest.h>

#include <filesystem>
#include <functional>
#include <map>

#include "entry/run_guard.h"
#include "entry/update_all.h"
#include "manifest/manifest_parser.h"
#include "platform/files.h"
#include "platform/machine.h"
#include "platform/paths.h"
#include "tests/pipeline/pipeline_fixture.h"
#include "tests/support/test_registry.h"

#ifndef _WIN32
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>
#endif

using pextest::ContentRow;
using Lines = std::vector<std::string>;

namespace {

const std::string kRefusedProduct =
    "CManifestParser: ProcessUpdateInformation, a run is already in progress in this process, returning 1";
const std::string kRefusedUpdateAll = "UpdateAll, a run is already in progress in this process, returning at once";

// What the host does from its progress callback, once, at the first report whose status text
// starts with g_reenterAt (empty: the first report of all).
std::function<void()> g_reenter;
std::string g_reenterAt;
int g_innerCalls = 0;

bool Outer(CProgressData* progress) {
    if (g_reenter && std::string(progress->StatusText).rfind(g_reenterAt, 0) == 0) {
        const std::function<void()> reenter = std::move(g_reenter);
        g_reenter = nullptr;
        reenter();
    }
    return false;
}

bool Inner(CProgressData*) {
    ++g_innerCalls;
    return false;
}

class RunGuard : public pextest::PipelineTest {
protected:
    void SetUp() override {
        g_innerCalls = 0;
        for (const char* name : {"a.dll", "b.dll"}) machine.WriteFile(std::string(kHome) + "\\" + name, "old");
        Publish({Row("a.dll", "new a", "G"), Row("b.dll", "new b", "G")});
    }
    void TearDown() override {
        g_reenter = nullptr;
        plat::SetMachineLockWaitCap(plat::kNoMachineLockWaitCap);
    }

    // Every file below C:\App and C:\Pex with its bytes, and whether the product's content file
    // entries are in the registry: what a run may change.
    std::map<std::string, std::string> State() const {
        std::map<std::string, std::string> state;
        for (const char* folder : {"App", "Pex"})
            for (const auto& entry : std::filesystem::recursive_directory_iterator(
                     std::filesystem::path(plat::paths::ToHost(std::string("C:\\") + folder))))
                if (entry.is_regular_file())
                    state[entry.path().string()] = pextest::ReadHostFile(entry.path().string());
        state["registry entries"] = ContentEntriesPresent() ? "present" : "gone";
        return state;
    }

    // Called from the middle of a run, both entries trace their one line and return at once:
    // nothing on disk or in the registry changes and the host's callback is not called.
    void ReenterBothEntries(CManifestParser& inner) {
        const auto before = State();
        const std::size_t linesBefore = trace.Lines().size();
        EXPECT_FALSE(UpdateAll(&Inner));
        EXPECT_EQ(inner.ProcessUpdateInformation(_bstr_t(kProduct), &Inner), 1);
        const Lines lines = trace.Lines();
        EXPECT_EQ(Lines(lines.begin() + static_cast<std::ptrdiff_t>(linesBefore), lines.end()),
                  (Lines{kRefusedUpdateAll, kRefusedProduct}));
        EXPECT_EQ(State(), before);
        EXPECT_EQ(g_innerCalls, 0);
    }

    void ExpectApplied() const {
        EXPECT_EQ(Installed("a.dll"), "new a");
        EXPECT_EQ(Installed("b.dll"), "new b");
        EXPECT_FALSE(ContentEntriesPresent());
    }
};

// The outer run is UpdateAll re-entered in a product run (backups made), or a parser that the
// host drives alone (the golden run host_calls_twice re-enters UpdateAll between products).
TEST_F(RunGuard, ANestedCallIsRefusedAndTheRunGoesOn) {
    CManifestParser outer, inner;
    const struct {
        const char* at;
        bool byParser;
    } cases[] = {{"Applying ", false}, {"Applying ", true}};
    for (const auto& c : cases) {
        SCOPED_TRACE(std::string(c.at) + (c.byParser ? "by the parser" : "by UpdateAll"));
        Publish({Row("a.dll", "new a", "G"), Row("b.dll", "new b", "G")});
        g_reenterAt = c.at;
        g_reenter = [&] { ReenterBothEntries(inner); };
        if (c.byParser) {
            EXPECT_EQ(outer.ProcessUpdateInformation(_bstr_t(kProduct), &Outer), 0);
        } else {
            EXPECT_FALSE(UpdateAll(&Outer));
        }
        EXPECT_FALSE(g_reenter) << "the callback did not re-enter";
        ExpectApplied();
    }

    // Runs that follow one another are not nested.
    Publish({Row("a.dll", "newer a")});
    EXPECT_EQ(inner.ProcessUpdateInformation(_bstr_t(kProduct), nullptr), 0);
    EXPECT_EQ(Installed("a.dll"), "newer a");
}

// A trace file that cannot be opened is lost for the rest of that run only.
TEST_F(RunGuard, EachRunTriesALostTraceFileAgain) {
    pextest::TraceCapture later("C:\\Later\\trace.log");
    TRACE(g_TraceLog, "lost: the folder is missing");
    EXPECT_FALSE(g_TraceLog.fileOutput);
    machine.WriteFile("C:\\Later\\other.txt", "");
    UpdateAll(nullptr);
    EXPECT_TRUE(later.Contains("UpdateAll, main key is open"));

    later.Clear();
    plat::files::Remove("C:\\Later\\other.txt");
    ASSERT_TRUE(plat::files::RemoveDirectory("C:\\Later"));
    TRACE(g_TraceLog, "lost again");
    machine.WriteFile("C:\\Later\\other.txt", "");
    CManifestParser parser;  // a host driving a parser alone starts a run too
    parser.ProcessUpdateInformation(_bstr_t(kProduct), nullptr);
    EXPECT_TRUE(later.Contains("CManifestParser: ProcessUpdateInformation"));
}

#ifndef _WIN32
// Another process of the machine that holds the product-run lock until it is killed.
class OtherProcessHoldingTheLock {
public:
    OtherProcessHoldingTheLock() {
        int ready[2];
        if (pipe(ready) != 0) return;
        child_ = fork();
        if (child_ == 0) {
            plat::MachineLock lock(kProductRunLockName);
            const char held = lock.Acquire(0) ? 'y' : 'n';
            while (write(ready[1], &held, 1) == 1) pause();  // until killed
            _exit(1);  // no destructors: the parent's test objects are not the child's
        }
        char held = 'n';
        holding_ = child_ > 0 && read(ready[0], &held, 1) == 1 && held == 'y';
        close(ready[0]);
        close(ready[1]);
    }
    ~OtherProcessHoldingTheLock() { Kill(); }
    bool Holding() const { return holding_; }
    void Kill() {  // as a crash would end it
        if (child_ <= 0) return;
        kill(child_, SIGKILL);
        waitpid(child_, nullptr, 0);
        child_ = -1;
    }

private:
    pid_t child_ = -1;
    bool holding_ = false;
};

// Once another process that held the machine's update lock is gone, even killed while it held
// it, a product run goes ahead (the golden run update_lock_held shows the run given up while the
// lock is held).
TEST_F(RunGuard, ALockLeftByAKilledProcessIsTakenOver) {
    plat::SetMachineLockWaitCap(0);
    OtherProcessHoldingTheLock other;
    ASSERT_TRUE(other.Holding());
    {
        CManifestParser parser;
        EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t(kProduct), nullptr), 1);
    }
    other.Kill();
    CManifestParser parser;
    EXPECT_EQ(parser.ProcessUpdateInformation(_bstr_t(kProduct), nullptr), 0);
    ExpectApplied();
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
            const bool started = read(start[0], &go, 1) == 0;  // the parent closed its end
            g_TraceLog.enabled = false;
            if (started) UpdateAll(nullptr);
            _exit(started ? 0 : 1);
        }
    }
    close(start[0]);
    close(start[1]);  // both children start now
    for (pid_t child : children) {
        int status = -1;
        waitpid(child, &status, 0);
        EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0);
    }
    int old = 0;
    for (int i = 0; i < kFiles; ++i)
        old += Installed("f" + std::to_string(i) + ".dll") != "new " + std::to_string(i) ? 1 : 0;
    EXPECT_EQ(old, 0) << "targets left without their update";
    EXPECT_FALSE(plat::files::Exists(kContent));
    EXPECT_FALSE(ContentEntriesPresent());
}
#endif

}  // namespace
