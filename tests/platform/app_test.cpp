// The application object: its load and unload hooks and its registry profile.
#include "platform/app.h"

#include <gtest/gtest.h>

#include <stdexcept>

#include "platform/registry.h"
#include "tests/support/case_file.h"
#include "tests/support/test_machine.h"
#include "tests/support/test_registry.h"

namespace {

class CountingApp : public plat::CWinApp {
public:
    bool InitInstance() override {
        ++initCalls;
        if (throwOnInit) throw std::runtime_error("start-up failed");
        return CWinApp::InitInstance();
    }
    int ExitInstance() override {
        ++exitCalls;
        if (throwOnExit) throw std::runtime_error("shut-down failed");
        return CWinApp::ExitInstance();
    }
    int initCalls = 0, exitCalls = 0;
    bool throwOnInit = false, throwOnExit = false;
};

}  // namespace

// This test program's own application object, started when the program was loaded.
PEX_APPLICATION(CountingApp, theApp);

namespace {

// This program's application object was started when it was loaded; another one does not
// replace it as the current one. Hooks run InitInstance and ExitInstance and swallow exceptions.
TEST(AppTest, StartedAtLoadAndHooksRunInitAndExitSwallowingExceptions) {
    EXPECT_EQ(theApp.initCalls, 1);
    EXPECT_EQ(theApp.exitCalls, 0);
    EXPECT_TRUE(theApp.Initialized());
    CountingApp app;
    EXPECT_EQ(plat::AfxGetApp(), &theApp);
    {
        plat::AppHooks hooks(app);
        EXPECT_EQ(app.initCalls, 1);
        EXPECT_TRUE(app.Initialized());
        EXPECT_EQ(app.exitCalls, 0);
    }
    EXPECT_EQ(app.exitCalls, 1);

    app.throwOnInit = app.throwOnExit = true;
    EXPECT_NO_THROW({
        plat::AppHooks hooks(app);
        EXPECT_FALSE(app.Initialized());
    });
    EXPECT_EQ(app.exitCalls, 2);
}

// Texts are read with or without their NUL, without regard to case; what is missing or not a
// text gives the default.
TEST(AppTest, ProfileStringsComeFromTheRegistryProfile) {
    pextest::TestMachine m;
    const auto set = [](const char* name, std::uint32_t type, const std::string& bytes) {
        pextest::SetRegValue(plat::reg::kCurrentUser, "Software\\Vantric\\Mendler\\Settings", name, type, bytes);
    };
    set("UBranch", plat::reg::kRegSz, std::string("release\0", 8));
    set("PBranch", plat::reg::kRegSz, "beta");
    set("Expanded", plat::reg::kRegExpandSz, std::string("%TEMP%\0", 7));
    set("PromptThreshold", plat::reg::kRegDword, std::string("\x05\0\0\0", 4));
    for (const pextest::Case& c : pextest::ReadCases("platform/cases/profile_strings.txt")) {
        SCOPED_TRACE(c.where);
        EXPECT_EQ(theApp.GetProfileString(c[0], c[1], c[2]), c[3]);
    }
}

}  // namespace
