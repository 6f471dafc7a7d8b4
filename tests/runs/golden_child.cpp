#include "tests/runs/golden_child.h"

#include <cstdlib>
#include <future>
#include <thread>

#ifndef _WIN32
#include <sys/wait.h>
#include <cerrno>
#endif

#include "diag/trace_log.h"
#include "entry/library_startup.h"
#include "entry/run_guard.h"
#include "entry/update_all.h"
#include "manifest/manifest_parser.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "platform/machine.h"
#include "platform/machine_lock.h"
#include "platform/process.h"
#include "tests/support/environment.h"

namespace golden {

namespace {

const char* const kChildVariable = "PEX_GOLDEN_CHILD";  // "<crashAt> [product]"
const char* const kScenarioVariable = "PEX_GOLDEN_SCENARIO";
std::string* g_progress = nullptr;
Run g_run;  // the run in progress

bool Record(CProgressData* p) {
    if (!g_progress) return false;
    if (g_run.nested && std::string(p->StatusText).rfind(g_run.nestAt, 0) == 0) {  // a host calls again
        g_run.nested = false;
        *g_progress += "  nested UpdateAll returned " + std::string(UpdateAll(nullptr) ? "true" : "false") + "\n";
        CManifestParser parser;
        *g_progress += "  nested product run returned " +
                       std::to_string(parser.ProcessUpdateInformation(_bstr_t("Zendor32"), nullptr)) + "\n";
    }
    *g_progress += "  " + std::to_string(p->CurrentStep) + "/" + std::to_string(p->TotalSteps) + " " +
                   p->StatusText;
    if (p->ItemTotalSet) *g_progress += " (" + std::to_string(p->ItemDone) + "/" + std::to_string(p->ItemTotal) + ")";
    *g_progress += "\n";
    return false;
}

std::string Call(const Run& run) {
    g_run = run;
    if (run.product.empty()) return UpdateAll(&Record) ? "true" : "false";
    CManifestParser parser;
    return std::to_string(parser.ProcessUpdateInformation(_bstr_t(run.product.c_str()), &Record));
}

}  // namespace

std::string RunHere(const Run& run, const std::string& modulePath, std::string* progress) {
    g_progress = progress;
    StartLibrary(modulePath);
    const std::string result = Call(run);
    StopLibrary();
    g_progress = nullptr;
    return result;
}

// This program again with the arguments; its exit code, or -1 when it could not be run.
int RunSelf(const std::string& arguments) {
    plat::proc::Process child;
    std::uint32_t code = 0;
    const bool ran = plat::proc::Start("\"" + plat::files::ModuleFileName(nullptr) + "\"" + arguments, "", &child) &&
                     plat::proc::Wait(child, plat::proc::kInfinite) == plat::proc::WaitResult::Ended &&
                     plat::proc::ExitCode(child, &code);
    return ran ? static_cast<int>(code) : -1;
}

int RunScenarioAlone(const std::string& testName) {
    pextest::SetEnvironment(kScenarioVariable, "1");
    const int code = RunSelf(" --gtest_filter=" + testName);
    pextest::RemoveEnvironment(kScenarioVariable);
    return code;
}

bool IsScenarioProcess() { return std::getenv(kScenarioVariable) != nullptr; }

std::string RunCutOff(const Run& run, int crashAt) {
    pextest::SetEnvironment(kChildVariable, std::to_string(crashAt) + " " + run.product);
    pextest::SetEnvironment("PEX_MACHINE", plat::machine::Root());
    const int code = RunSelf("");
    pextest::RemoveEnvironment(kChildVariable);
    if (code < 0) return "could not start";
    if (code == plat::fault::kCrashExitCode) return "cut off";
    return code == 0 ? "finished first" : "exit " + std::to_string(code);
}

bool IsChild() { return std::getenv(kChildVariable) != nullptr; }

int ChildMain() {
    const std::string request = std::getenv(kChildVariable);
    const auto blank = request.find(' ');
    plat::machine::Ensure();
    plat::fault::CrashAtMutation(std::stoi(request.substr(0, blank)));
    g_TraceLog.enabled = false;
    Call(Run{blank == std::string::npos ? "" : request.substr(blank + 1), false, ""});
    return 0;
}

struct LockHolder::State {
    std::promise<void> held, release;
    std::thread thread;
};

LockHolder::LockHolder() : state_(new State) {
    plat::SetMachineLockWaitCap(0);
    state_->thread = std::thread([state = state_.get(), done = state_->release.get_future()]() mutable {
        plat::MachineLock lock(kProductRunLockName);
        lock.Acquire(0);
        state->held.set_value();
        done.wait();
    });
    state_->held.get_future().wait();
}

LockHolder::~LockHolder() {
    state_->release.set_value();
    state_->thread.join();
    plat::SetMachineLockWaitCap(plat::kNoMachineLockWaitCap);
}

bool ChildLeft() {
#ifdef _WIN32
    return false;  // processes started on Windows are checked by the Linux build
#else
    int status = 0;
    return !(waitpid(-1, &status, WNOHANG) == -1 && errno == ECHILD);
#endif
}

}  // namespace golden
