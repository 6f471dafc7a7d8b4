// The application object: its load and unload hooks and its registry profile.
#include "platform/app.h"

#include <gtest/gtest.h>

#include <stdexcept>

#include "platform/registry.h"
#include "tests/support/test_machine.h"

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

TEST(AppTest, ModuleApplicationStartedAtLoadAndIsCurrent) {
    EXPECT_EQ(theApp.initCalls, 1);
    EXPECT_EQ(theApp.exitCalls, 0);
    EXPECT_TRUE(theApp.Initialized());
    EXPECT_EQ(plat::AfxGetApp(), &theApp);

    CountingApp another;  // a module has one application object: the first stays current
    EXPECT_EQ(plat::AfxGetApp(), &theApp);
}

TEST(AppTest, HooksRunInitAndExitAndSwallowExceptions) {
    CountingApp app;
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

class ProfileTest : public ::testing::Test {
protected:
    void SetUp() override {
        plat::reg::Key key;
        ASSERT_EQ(plat::reg::CreateKey(plat::reg::kCurrentUser, "Software\\Vantric\\Mendler\\Settings",
                                       plat::reg::kKeyAllAccess, key.out(), nullptr),
                  0);
        Set(key, "UBranch", plat::reg::kRegSz, std::string("release\0", 8));
        Set(key, "PBranch", plat::reg::kRegSz, "beta");  // stored without its NUL
        Set(key, "Expanded", plat::reg::kRegExpandSz, std::string("%TEMP%\0", 7));
        Set(key, "PromptThreshold", plat::reg::kRegDword, std::string("\x05\0\0\0", 4));
    }
    static void Set(const plat::reg::Key& key, const std::string& name, std::uint32_t type,
                    const std::string& data) {
        ASSERT_EQ(plat::reg::SetValue(key.get(), name, type, reinterpret_cast<const std::uint8_t*>(data.data()),
                                      static_cast<std::uint32_t>(data.size())),
                  0);
    }
    pextest::TestMachine m;
};

TEST_F(ProfileTest, ReadsStringEntriesOfTheApplicationProfile) {
    EXPECT_EQ(theApp.GetProfileString("Settings", "UBranch", "x"), "release");
    EXPECT_EQ(theApp.GetProfileString("settings", "pbranch", "x"), "beta");
    EXPECT_EQ(theApp.GetProfileString("Settings", "Expanded"), "%TEMP%");
}

TEST_F(ProfileTest, GivesTheDefaultForWhatIsMissingOrNotAString) {
    EXPECT_EQ(theApp.GetProfileString("Settings", "Missing", "fallback"), "fallback");
    EXPECT_EQ(theApp.GetProfileString("Nowhere", "UBranch", "fallback"), "fallback");
    EXPECT_EQ(theApp.GetProfileString("Settings", "PromptThreshold", "10"), "10");
    EXPECT_EQ(theApp.GetProfileString("Settings", "Missing"), "");
}

}  // namespace
