// Error injection: every operation of a product run that the platform checks (copy, delete,
// write, rename, registry write, process start) fails in turn, once and for good, with disk full
// (112), access denied (5) and sharing violation (32). Whatever fails, the run must end with
// every group committed or rolled back and nothing lost, its trace must say how it ended, and
// a later run without faults must complete the update.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <vector>

#include "diag/trace_log.h"
#include "entry/update_all.h"
#include "manifest/manifest_parser.h"
#include "platform/cfile.h"
#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "platform/machine.h"
#include "tests/crash/crash_product.h"
#include "tests/crash/machine_copies.h"

namespace {

namespace fault = plat::fault;

constexpr std::uint32_t kCodes[] = {plat::kErrorDiskFull, plat::kErrorAccessDenied, plat::kErrorSharingViolation};

// How a faulted run ended.
struct Outcome {
    std::int32_t failures = 0;
    bool stopped = false;  // the content file could not be saved: the run stopped there
    int operations = 0;  // of the kind of the fault rule, checked by the platform
};

class ErrorInjection : public pextest::CrashProduct {
protected:
    void TearDown() override {
        fault::Clear();
        g_TraceLog.enabled = true;
        plat::machine::SetRoot(machine.Root());
    }

    // One run of the product in this process, as UpdateAll runs it, with the fault plan set.
    static Outcome Run(fault::Op op, int k, std::uint32_t code, bool persistent) {
        fault::Clear();
        if (k > 0) fault::FailNth(op, k, code, persistent);
        Outcome outcome;
        try {
            CManifestParser parser;
            outcome.failures = parser.ProcessUpdateInformation(_bstr_t(kProduct), nullptr);
        } catch (const plat::CFileException&) {
            outcome.stopped = true;
        }
        outcome.operations = fault::OperationCount(op);
        fault::Clear();
        return outcome;
    }

    // The operations of the kind in a run without faults.
    int Count(const std::string& published, fault::Op op) {
        const pextest::MachineCopy copy(published);
        const Outcome clean = Run(op, 0, 0, false);
        EXPECT_EQ(clean.failures, 0);
        return clean.operations;
    }

    // A group that did not commit has been rolled back: its members hold their previous bytes
    // (a new file is gone). Only a restore that failed may leave the new bytes, and then the
    // backup keeps the previous version (ExpectConsistent); with a single failure no restore
    // can fail, since the failure is what made the group roll back.
    void ExpectRolledBack(bool restoresMayFail) const {
        const CContentTable table = Content();
        for (std::uint32_t row = 0; row < files_.size(); ++row) {
            const pextest::ProductFile& file = files_[row];
            if (table.Field(row, "UpgradeStatus") == "AppliedSuccessfully") continue;
            const std::string target = Which(file, Contents(file.Target()));
            if (restoresMayFail && target == "new") continue;
            EXPECT_EQ(target, file.hadTarget ? "old" : "(missing)") << file.name << " not rolled back";
        }
    }

    // From a copy of the published machine: a run with the fault, then one without.
    bool FailAndRecover(const std::string& published, fault::Op op, int k, std::uint32_t code, bool persistent) {
        SCOPED_TRACE("operation " + std::to_string(k) + " fails with " + std::to_string(code) +
                     (persistent ? ", and every later one" : ", once"));
        const int failuresBefore = Failures();
        const pextest::MachineCopy copy(published);
        const Outcome faulted = Run(op, k, code, persistent);
        ++runs_;
        ExpectConsistent();
        if (!faulted.stopped && plat::files::Exists(kContent)) ExpectRolledBack(persistent);
        // A download that a complete success could not remove is left for good: nothing names
        // it once the content file is gone.
        const std::vector<std::string> left =
            plat::files::Exists(kContent) ? std::vector<std::string>{} : Names("C:\\Pex\\cache\\*");
        const Outcome clean = Run(op, 0, 0, false);
        ++runs_;
        EXPECT_FALSE(clean.stopped);
        EXPECT_EQ(clean.failures, 0);
        ExpectComplete(left);
        return Failures() == failuresBefore;
    }

    // The run's last line gives its failure count, or says that the run stopped and why; a
    // run that did not complete the update names what failed, and a content file kept after a
    // complete success is explained.
    void ExpectTraceSaysHowTheRunEnded(const std::vector<std::string>& lines) const {
        const std::string returning = "CManifestParser: ProcessUpdateInformation, returning ";
        const std::string stopped = "UpdateAll, product run stopped, file error ";
        auto last = std::find_if(lines.rbegin(), lines.rend(), [&](const std::string& line) {
            return line.rfind(returning, 0) == 0 || line.rfind(stopped, 0) == 0;
        });
        ASSERT_NE(last, lines.rend()) << "the trace does not say how the run ended";
        if (last->rfind(stopped, 0) == 0) return;  // the line says which file and which error
        const int failures = std::atoi(last->c_str() + returning.size());
        auto has = [&](const char* text) {
            return std::any_of(lines.begin(), lines.end(),
                               [&](const std::string& line) { return line.find(text) != std::string::npos; });
        };
        if (failures > 0) {
            EXPECT_TRUE(has("' not applied") || has("error running install commands") ||
                        has("Decompress failed") || has("Unable to") || has("giving up"))
                << "a run that failed without naming what failed";
        } else if (plat::files::Exists(kContent)) {
            EXPECT_TRUE(has("clean-up incomplete") || has("content file not discarded"))
                << "a content file kept after a complete success without a word";
        }
    }

    int runs_ = 0;
};

TEST_F(ErrorInjection, EveryOperationFailingLeavesGroupsWholeAndALaterRunCompletes) {
    g_TraceLog.enabled = false;  // its writes would be operations of their own
    const std::string published = machine.Root();
    const int n = Count(published, fault::Op::Any);
    ASSERT_GT(n, 20);
    int failing = 0;
    for (const std::uint32_t code : kCodes) {
        for (const bool persistent : {false, true}) {
            for (int k = 1; k <= n && failing < kFailingScenariosShown; ++k) {
                if (!FailAndRecover(published, fault::Op::Any, k, code, persistent)) ++failing;
            }
        }
    }
    RecordProperty("operations", n);
    RecordProperty("runs", runs_);
    std::printf("[  faults  ] %d checked operations in a complete run, %d runs\n", n, runs_);
}

// What the trace must say of a run: how it ended, and when it did not complete the update, why.
// Only operations that the trace log does not perform itself can be counted with the log on
// (its lines are writes); the sweep above covers the writes without it.
TEST_F(ErrorInjection, EveryFailureLeavesATraceThatSaysHowTheRunEnded) {
    const std::string published = machine.Root();
    const fault::Op kinds[] = {fault::Op::Copy, fault::Op::Remove, fault::Op::Rename, fault::Op::RegWrite,
                               fault::Op::ProcessStart};
    int failing = 0, runs = 0;
    for (const fault::Op op : kinds) {
        g_TraceLog.enabled = false;
        const int n = Count(published, op);
        g_TraceLog.enabled = true;
        EXPECT_EQ(Count(published, op), n) << "the trace log performs operations of this kind";
        for (int k = 1; k <= n && failing < kFailingScenariosShown; ++k, ++runs) {
            SCOPED_TRACE("operation " + std::to_string(k) + " of kind " + std::to_string(static_cast<int>(op)));
            const int failuresBefore = Failures();
            const pextest::MachineCopy copy(published);
            trace.Clear();
            fault::FailNth(op, k, kCodes[k % 3]);
            UpdateAll(nullptr);
            fault::Clear();
            ExpectTraceSaysHowTheRunEnded(trace.Lines());
            if (Failures() != failuresBefore) ++failing;
        }
    }
    RecordProperty("runs", runs);
}

}  // namespace
