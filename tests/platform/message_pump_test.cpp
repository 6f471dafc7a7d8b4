// Windows only: while the responsive wait waits for a program, window messages that arrive reach
// their window procedure (host code runs during the wait). The window and the messages are made
// here with the Win32 calls themselves.
#include <windows.h>

#include <gtest/gtest.h>

#include <atomic>

#include "platform/process.h"
#include "tests/support/test_machine.h"

namespace {

using plat::proc::WaitResult;

std::atomic<int> g_delivered{0};

LRESULT CALLBACK CountingProcedure(HWND window, UINT message, WPARAM w, LPARAM l) {
    if (message == WM_APP) {
        ++g_delivered;
        return 0;
    }
    return DefWindowProcA(window, message, w, l);
}

// A message-only window of this thread whose procedure counts WM_APP.
class CountingWindow {
public:
    CountingWindow() {
        WNDCLASSA cls{};
        cls.lpfnWndProc = CountingProcedure;
        cls.hInstance = GetModuleHandleA(nullptr);
        cls.lpszClassName = "PexPumpTest";
        RegisterClassA(&cls);
        window_ = CreateWindowExA(0, cls.lpszClassName, "", 0, 0, 0, 0, 0, HWND_MESSAGE, nullptr,
                                  cls.hInstance, nullptr);
        g_delivered = 0;
    }
    ~CountingWindow() { DestroyWindow(window_); }
    HWND get() const { return window_; }

private:
    HWND window_ = nullptr;
};

// A message waiting in the queue stays there through a wait that does not dispatch, and reaches
// its window during one that does.
TEST(MessagePump, MessagesReachTheirWindowOnlyWhileTheWaitDispatches) {
    pextest::TestMachine m;
    CountingWindow window;
    ASSERT_NE(window.get(), nullptr);
    plat::proc::Process quick, slow;
    ASSERT_TRUE(plat::proc::Start("pextestprog exit 0", "", &quick));
    PostMessageA(window.get(), WM_APP, 0, 0);
    EXPECT_EQ(plat::proc::WaitDispatching(quick, 20000, false), WaitResult::Ended);
    EXPECT_EQ(g_delivered, 0);
    ASSERT_TRUE(plat::proc::Start("pextestprog sleep 300", "", &slow));
    EXPECT_EQ(plat::proc::WaitDispatching(slow, 20000, true), WaitResult::Ended);
    EXPECT_EQ(g_delivered, 1);
}

}  // namespace
