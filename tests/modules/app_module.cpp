// A test module with an application object: its start and stop hooks count themselves in the
// registry (HKCU\Software\Vantric\PexAppModule, DWORDs "Started" and "Stopped"), so a test sees
// them run when the module is loaded and when it is freed.
#include <cstdint>

#include "platform/app.h"
#include "module_export.h"
#include "platform/registry.h"

namespace {

void Count(const char* name) {
    namespace reg = plat::reg;
    reg::Key key;
    if (reg::CreateKey(reg::kCurrentUser, "Software\\Vantric\\PexAppModule", reg::kKeyAllAccess,
                       key.out(), nullptr) != 0)
        return;
    std::uint32_t count = 0, size = sizeof count;
    reg::QueryValue(key.get(), name, nullptr, reinterpret_cast<std::uint8_t*>(&count), &size);
    ++count;
    reg::SetValue(key.get(), name, reg::kRegDword, reinterpret_cast<const std::uint8_t*>(&count),
                  sizeof count);
}

class CAppModule : public plat::CWinApp {
public:
    bool InitInstance() override {
        Count("Started");
        return CWinApp::InitInstance();
    }
    int ExitInstance() override {
        Count("Stopped");
        return CWinApp::ExitInstance();
    }
};

PEX_APPLICATION(CAppModule, theApp);

}  // namespace

PEX_EXPORT bool PexAppInitialized() { return theApp.Initialized(); }
