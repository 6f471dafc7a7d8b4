// How the golden-run driver runs the library: in its own process as a host that loaded
// Mendler.dll, or in a child process that the fault plan ends before a chosen operation.
#pragma once
#include <memory>
#include <string>

namespace golden {

struct Run {
    std::string product;  // empty: UpdateAll over every product
    bool nested = false;  // the callback's first report calls UpdateAll and the product run again
    std::string nestAt;   // ... or its first report whose status text starts with this
};

// Another process's product run holds the machine's update lock while this object lives (a
// thread of this process holds it, which on both targets counts as another holder), and a run
// waits no time for it.
class LockHolder {
public:
    LockHolder();
    ~LockHolder();

private:
    struct State;
    std::unique_ptr<State> state_;
};

// Starts the library as loading Mendler.dll at modulePath does, runs, stops it again; each
// progress report is appended to *progress. Returns what the call returned.
std::string RunHere(const Run& run, const std::string& modulePath, std::string* progress);

// The run in a child process (this program again) that ends just before its crashAt-th
// mutating operation, as a killed process would; it writes no trace, whose lines would count
// as operations of their own. Returns how the child ended.
std::string RunCutOff(const Run& run, int crashAt);

// Runs one scenario test of this program in a process of its own, so that it starts from a
// freshly loaded library as a host does (the decompressor and the progress record live as long
// as the process). Returns the child's exit code; what it finds is in its own output.
int RunScenarioAlone(const std::string& testName);
// True in that process.
bool IsScenarioProcess();

// The child's side of RunCutOff.
bool IsChild();
int ChildMain();

// True when this process has a child left running or not waited for.
bool ChildLeft();

}  // namespace golden
