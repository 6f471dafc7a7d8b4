// The list rules of CommandString, with executors that only record their calls: which items
// reach which executor, the TRY- rule, the exception kinds and the trace lines.
#include "commands/command_string.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "platform/cfile.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

using Lines = std::vector<std::string>;

// Records "Executor(parameter)"; a parameter "text" throws a fixed message, "file" the file
// exception, as the real executors do.
class RecordingCommands : public CommandString {
public:
    static constexpr char kMessage[] = "boom";
    RecordingCommands() : CommandString("C:\\App") {}
    std::vector<std::string> calls;

protected:
    void ExecuteRun(std::string p) override { Record("Run", p); }
    void ExecuteDel(std::string p) override { Record("Del", p); }
    void ExecuteRegSvr(std::string p) override { Record("RegSvr", p); }
    void ExecuteDelIfExists(std::string p) override { Record("DelIfExists", p); }
    void ExecuteRegistry(std::string p) override { Record("Registry", p); }

private:
    void Record(const char* executor, const std::string& parameter) {
        calls.push_back(std::string(executor) + "(" + parameter + ")");
        if (parameter == "text") throw kMessage;
        if (parameter == "file") throw plat::CFileException(5, "C:\\App\\x");
    }
};

class CommandStringTest : public ::testing::Test {
protected:
    pextest::TestMachine m;
    pextest::TraceCapture trace;
    RecordingCommands commands;
};

TEST_F(CommandStringTest, EveryTagReachesItsExecutorWithTheTrimmedParameter) {
    EXPECT_TRUE(commands.Execute(
        "[RUN] a b ;[DEL]\tb;[DELIFEXISTS]c;[REGSVR] d;[REGISTRY] e;"
        "[try-run]f;[Try-Del]g;[TRY-DELIFEXISTS]h;[TRY-REGSVR]i;[TRY-REGISTRY]j;[RUN];"
        // Tags count only at the start of an item and over their own full length.
        "x[DEL] k;[DELIF] l;[DEL]IFEXISTS] m;[TRY-]n;[RU"));
    EXPECT_EQ(commands.calls,
              (Lines{"Run(a b)", "Del(b)", "DelIfExists(c)", "RegSvr(d)", "Registry(e)", "Run(f)", "Del(g)",
                     "DelIfExists(h)", "RegSvr(i)", "Registry(j)", "Run()", "Del(IFEXISTS] m)"}));
}

}  // namespace
