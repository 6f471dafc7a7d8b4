// Windows only: while the responsive wait waits for a program, window messages that arrive reach
// their window procedure (host code runs during the wait), and the time-out still holds however
// many arrive. The window and the messages are made here with the Win32 calls themselves.
#include <windows.h>

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <thread>

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

// Posts WM_APP to the window every few milliseconds from another thread, until destroyed.
class Poster {
public:
    explicit Poster(HWND window)
        : thread_([this, window] {
              while (!stop_) {
                  PostMessageA(window, WM_APP, 0, 0);
                  std::this_thread::sleep_for(std::chrono::milliseconds(5));
              }
          }) {}
    ~Poster() {
        stop_ = true;
        thread_.join();
    }

private:
    std::atomic<bool> stop_{false};
    std::thread thread_;
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

TEST(MessagePump, TheTimeOutHoldsWhileMessagesKeepArriving) {
    pextest::TestMachine m;
    CountingWindow window;
    plat::proc::Process program;
    ASSERT_TRUE(plat::proc::Start("pextestprog sleep 60000", "", &program));
    const auto started = std::chrono::steady_clock::now();
    {
        Poster poster(window.get());
        EXPECT_EQ(plat::proc::WaitDispatching(program, 400, true), WaitResult::TimedOut);
    }
    const auto waited = std::chrono::steady_clock::now() - started;
    EXPECT_LT(waited, std::chrono::seconds(5));
    EXPECT_GT(g_delivered, 0);
    EXPECT_TRUE(plat::proc::Terminate(program, 1));
}

}  // namespace
