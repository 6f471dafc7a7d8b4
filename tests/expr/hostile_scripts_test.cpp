// Scripts written to hurt: long texts, deep trees and long tokens cost bounded time and stack,
// and whatever goes wrong inside one row's plan stays that row's failure (a failure inside a
// plan is execution_plan_test's).
#include <gtest/gtest.h>

#include <functional>

#ifdef _WIN32
#include <windows.h>
#else
#include <pthread.h>
#include <sys/stat.h>
#include <unistd.h>
#endif

#include "commands/row_preparation.h"
#include "expr/override_parser.h"
#include "tests/support/case_file.h"
#include "tests/support/test_machine.h"
#include "tests/support/trace_capture.h"

namespace {

using Cases = std::vector<pextest::Case>;

// The main thread of a Windows program has 1 MiB of stack, far less than a Linux main thread,
// and std::thread cannot choose: the rows are evaluated on a thread of that size. False when
// no thread could be started.
#ifdef _WIN32
DWORD WINAPI Work(void* work) {
    (*static_cast<const std::function<void()>*>(work))();
    return 0;
}
bool RunOnWindowsMainStack(std::function<void()> work) {
    // The size is the reservation, as the linker's stack size is for the main thread.
    HANDLE thread = ::CreateThread(nullptr, 1u << 20, Work, &work, STACK_SIZE_PARAM_IS_A_RESERVATION, nullptr);
    if (thread == nullptr) return false;
    ::WaitForSingleObject(thread, INFINITE);
    ::CloseHandle(thread);
    return true;
}
#else
void* Work(void* work) {
    (*static_cast<const std::function<void()>*>(work))();
    return nullptr;
}
bool RunOnWindowsMainStack(std::function<void()> work) {
    pthread_attr_t attributes;
    pthread_attr_init(&attributes);
    pthread_t thread;
    const bool started = pthread_attr_setstacksize(&attributes, 1u << 20) == 0 &&
                         pthread_create(&thread, &attributes, Work, &work) == 0;
    pthread_attr_destroy(&attributes);
    if (started) pthread_join(thread, nullptr);
    return started;
}
#endif

// A case's text with every {N*x} replaced by N copies of x (in which \x20 and \x00 are bytes).
std::string Expand(const std::string& field) {
    std::string text;
    std::size_t at = 0;
    for (std::size_t open; (open = field.find('{', at)) != std::string::npos; at = field.find('}', open) + 1) {
        const std::size_t star = field.find('*', open);
        const std::string unit = pextest::Unescape(field.substr(star + 1, field.find('}', star) - star - 1));
        text += field.substr(at, open - at);
        for (int n = std::stoi(field.substr(open + 1, star - open - 1)); n > 0; --n) text += unit;
    }
    return text + field.substr(at);
}

TEST(HostileScripts, TheBoundsAreExactAndSaySo) {
    const char* const results[] = {"accepted",        "syntax error", "stack overflow",
                                   "scanner failure", "too long",     "too deep"};
    for (const pextest::Case& c : pextest::ReadCases("expr/cases/script_bounds.txt")) {
        SCOPED_TRACE(c.where);
        testing::internal::CaptureStdout();
        testing::internal::CaptureStderr();
        const int result = ParseOverrideText(Expand(c[0]));
        const std::string printed = testing::internal::GetCapturedStdout() + testing::internal::GetCapturedStderr();
        EXPECT_EQ(results[result], c[1]);
        if (!c[2].empty()) {
            EXPECT_EQ(printed, c[2] + "\n");
        }
    }
}

// The cases' scripts run as the rows of one content file on a Windows-sized stack; each row's
// "Force Download" cell then shows how its plan ended.
TEST(HostileScripts, EachRowsPlanFailsOrRunsOnItsOwn) {
    pextest::TestMachine machine;
    machine.WriteFile("C:\\App\\big.dll", pextest::ReadHostFile(PEX_FIXTURE_DIR "/versioned.dll"));
    Cases cases = pextest::ReadCases("expr/cases/hostile_rows.txt");
#ifndef _WIN32
    machine.WriteFile("C:\\App\\huge.bin", "MZ");
    ASSERT_EQ(truncate((machine.DriveC() + "/App/big.dll").c_str(), 6LL << 30), 0);
    ASSERT_EQ(truncate((machine.DriveC() + "/App/huge.bin").c_str(), 6LL << 30), 0);
    ASSERT_EQ(mkfifo((machine.DriveC() + "/App/pipe.dll").c_str(), 0600), 0);
    const Cases posix = pextest::ReadCases("expr/cases/hostile_rows_posix.txt");
    cases.insert(cases.end(), posix.begin(), posix.end());
#endif
    std::string content = "FileName,Force Download,DynamicFieldInfo\r\n";
    for (std::size_t i = 0; i < cases.size(); ++i) content += std::to_string(i) + ",0," + Expand(cases[i][0]) + "\r\n";
    CContentTable table;
    ASSERT_GE(table.LoadFromText(content), 0);
    pextest::TraceCapture trace;
    testing::internal::CaptureStdout();
    EXPECT_TRUE(RunOnWindowsMainStack([&] { EvaluateDynamicFields(table); }));
    testing::internal::GetCapturedStdout();
    for (std::uint32_t row = 0; row < cases.size(); ++row) EXPECT_EQ(table.Cell(row, 1), cases[row][1]) << cases[row].where;
    EXPECT_TRUE(trace.Contains("ExecutionPlan: Parse, script too long, exceeds 65536 bytes"));
}

}  // namespace
