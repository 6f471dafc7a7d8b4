#include "platform/app.h"

#include <cstdint>
#include <vector>

#include "platform/registry.h"

namespace plat {

namespace {
// Internal linkage keeps each module's application object its own, even when two modules both
// link the framework.
CWinApp* g_currentApp = nullptr;
}  // namespace

CWinApp::CWinApp(const char* appName) : appName_(appName ? appName : "") {
    if (!g_currentApp) g_currentApp = this;
}

CWinApp::~CWinApp() {
    if (g_currentApp == this) g_currentApp = nullptr;
}

bool CWinApp::InitInstance() {
    return true;
}

int CWinApp::ExitInstance() {
    return 0;
}

std::string CWinApp::GetProfileString(const std::string& section, const std::string& entry,
                                       const std::string& defaultValue) const {
    reg::Key key;
    std::string path = "Software\\Vantric\\" + appName_ + "\\" + section;
    if (reg::OpenKey(reg::kCurrentUser, path, reg::kKeyRead, key.out()) != 0) return defaultValue;
    std::uint32_t type = 0, size = 0;
    if (reg::QueryValue(key.get(), entry, &type, nullptr, &size) != 0) return defaultValue;
    if (type != reg::kRegSz && type != reg::kRegExpandSz) return defaultValue;
    std::vector<std::uint8_t> data(size + 1, 0);
    if (reg::QueryValue(key.get(), entry, &type, data.data(), &size) != 0) return defaultValue;
    std::string value(reinterpret_cast<const char*>(data.data()), size);
    return value.substr(0, value.find('\0'));
}

CWinApp* AfxGetApp() {
    return g_currentApp;
}

// An exception leaving a load or unload hook would end the host process, so none may escape.
AppHooks::AppHooks(CWinApp& app) : app_(app) {
    try {
        app_.initialized_ = app_.InitInstance();
    } catch (...) {
        app_.initialized_ = false;
    }
}

AppHooks::~AppHooks() {
    try {
        app_.ExitInstance();
    } catch (...) {
    }
}

}  // namespace plat
