// Which items of a command list reach which executor, with executors that only record their
// calls. The TRY- rule, the exception kinds and the trace lines are the golden run
// install_commands'.
#include "commands/command_string.h"

#include <gtest/gtest.h>

#include <string>

#include "tests/support/case_file.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

// Records "Executor(parameter)" for each call.
class RecordingCommands : public CommandString {
public:
    RecordingCommands() : CommandString("C:\\App") {}
    std::string calls;

protected:
    void ExecuteRun(std::string p) override { calls += "Run(" + p + ")"; }
    void ExecuteDel(std::string p) override { calls += "Del(" + p + ")"; }
    void ExecuteRegSvr(std::string p) override { calls += "RegSvr(" + p + ")"; }
    void ExecuteDelIfExists(std::string p) override { calls += "DelIfExists(" + p + ")"; }
    void ExecuteRegistry(std::string p) override { calls += "Registry(" + p + ")"; }
};

TEST(CommandString, EveryTagReachesItsExecutorWithTheTrimmedParameter) {
    pextest::TestMachine m;
    pextest::TraceCapture trace;
    for (const pextest::Case& c : pextest::ReadCases("commands/cases/command_items.txt")) {
        SCOPED_TRACE(c.where);
        RecordingCommands commands;
        EXPECT_TRUE(commands.Execute(pextest::Unescape(c[0])));
        EXPECT_EQ(commands.calls, c[1]);
    }
}

}  // namespace
