// The per-module application object of the framework. A module defines exactly one, with
// PEX_APPLICATION, and overrides InitInstance and ExitInstance: InitInstance runs when the
// module is loaded (before anything can call into it) and ExitInstance when it is unloaded or
// the process ends. On Linux the hooks are a static object's constructor and destructor in the
// module; on Windows the same object runs from the C run-time's part of DllMain.
#pragma once
#include <string>

namespace plat {

class CWinApp {
public:
    // The first application object constructed in a module becomes the current one.
    explicit CWinApp(const char* appName = "Mendler");
    virtual ~CWinApp();
    CWinApp(const CWinApp&) = delete;
    CWinApp& operator=(const CWinApp&) = delete;

    // The framework's own start and stop steps: succeed and return 0.
    virtual bool InitInstance();
    virtual int ExitInstance();

    // The string entry of the application's registry profile,
    // HKCU\Software\Vantric\<appName>\<section>; the default when the key or the entry is missing
    // or the entry is not a string (REG_SZ / REG_EXPAND_SZ, taken up to its first NUL).
    std::string GetProfileString(const std::string& section, const std::string& entry,
                                 const std::string& defaultValue = std::string()) const;

    const std::string& AppName() const { return appName_; }
    // What the last InitInstance run by the module's hooks returned. A Windows loader would
    // refuse the module on false; a Linux loader cannot, so callers may ask.
    bool Initialized() const { return initialized_; }

private:
    friend class AppHooks;
    std::string appName_;
    bool initialized_ = false;
};

// The current application object of this module (AfxGetApp); null when it defines none.
CWinApp* AfxGetApp();

// Runs the application's hooks: InitInstance when constructed, ExitInstance when destroyed.
// PEX_APPLICATION places one right after the application object, so it is constructed after
// and destroyed before the object in every module.
class AppHooks {
public:
    explicit AppHooks(CWinApp& app);
    ~AppHooks();
    AppHooks(const AppHooks&) = delete;
    AppHooks& operator=(const AppHooks&) = delete;

private:
    CWinApp& app_;
};

}  // namespace plat

// Defines the module's application object `name` of type `Type` and its load/unload hooks.
// Use once, at namespace scope, in the file that defines the application class.
#define PEX_APPLICATION(Type, name) \
    Type name;                      \
    static ::plat::AppHooks name##Hooks_(name)
