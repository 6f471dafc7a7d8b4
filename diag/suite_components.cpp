// What the support snapshot looks at: the components and registry keys of the Vantric suite.
#include "diag/suite_components.h"

const std::vector<SuiteComponent>& SuiteComponentList() {
    static const std::vector<SuiteComponent> list = {
        {SuiteComponent::File, "Mendler.DLL"},
        {SuiteComponent::File, "Rivzip.dll"},
        {SuiteComponent::File, "Fetchwell.DLL"},
        {SuiteComponent::File, "Pellow.exe"},
        {SuiteComponent::File, "Zendor32.exe"},
        {SuiteComponent::File, "Orlandel.dll"},
        {SuiteComponent::File, "ZenMatrix.dll"},
        {SuiteComponent::File, "VanShared.dll"},
        {SuiteComponent::File, "pexupdate.exe"},
        {SuiteComponent::ProgId, "Vantric.Zendor32.Application"},
        {SuiteComponent::ProgId, "Vantric.Zendor32.Document"},
        {SuiteComponent::ProgId, "Vantric.Zendor32.Matrix"},
        {SuiteComponent::ProgId, "Vantric.Orlandel.Engine"},
        {SuiteComponent::ProgId, "Vantric.Orlandel.Library"},
        {SuiteComponent::ProgId, "Vantric.Orlandel.Viewer"},
        {SuiteComponent::ProgId, "Vantric.Fetchwell.Downloader"},
        {SuiteComponent::ProgId, "Vantric.Fetchwell.Scheduler"},
        {SuiteComponent::ProgId, "Vantric.Fetchwell.Session"},
        {SuiteComponent::ProgId, "Vantric.Pellow.Notifier"},
        {SuiteComponent::ProgId, "Vantric.Pellow.Tray"},
        {SuiteComponent::ProgId, "Vantric.Mendler.Updater"},
        {SuiteComponent::ProgId, "Vantric.Mendler.Services"},
        {SuiteComponent::ProgId, "Vantric.Rivzip.Expander"},
        {SuiteComponent::ProgId, "Vantric.Shared.Settings"},
        {SuiteComponent::ProgId, "Tessary.Zendor32.Branding"},
        {SuiteComponent::ProgId, "Brindle.Zendor32.Branding"},
    };
    return list;
}

const std::string& SuiteRegistryKeyList() {
    static const std::string list = [] {
        std::string keys = "HKEY_CURRENT_USER\\Software\\Vantric\r\n"
                           "HKEY_LOCAL_MACHINE\\Software\\Vantric\r\n";
        // The class identifiers of the suite's registered components.
        static const char* const kClassIds[14] = {
            "{6E0B1A01-3C52-4D7A-9B11-5A10C0DE0001}", "{6E0B1A02-3C52-4D7A-9B11-5A10C0DE0002}",
            "{6E0B1A03-3C52-4D7A-9B11-5A10C0DE0003}", "{6E0B1A04-3C52-4D7A-9B11-5A10C0DE0004}",
            "{6E0B1A05-3C52-4D7A-9B11-5A10C0DE0005}", "{6E0B1A06-3C52-4D7A-9B11-5A10C0DE0006}",
            "{6E0B1A07-3C52-4D7A-9B11-5A10C0DE0007}", "{6E0B1A08-3C52-4D7A-9B11-5A10C0DE0008}",
            "{6E0B1A09-3C52-4D7A-9B11-5A10C0DE0009}", "{6E0B1A0A-3C52-4D7A-9B11-5A10C0DE000A}",
            "{6E0B1A0B-3C52-4D7A-9B11-5A10C0DE000B}", "{6E0B1A0C-3C52-4D7A-9B11-5A10C0DE000C}",
            "{6E0B1A0D-3C52-4D7A-9B11-5A10C0DE000D}", "{6E0B1A0E-3C52-4D7A-9B11-5A10C0DE000E}",
        };
        for (const char* clsid : kClassIds) keys += std::string("HKEY_CLASSES_ROOT\\CLSID\\") + clsid + "\r\n";
        // Every component's identifier, and the versioned identifiers of the main programs.
        for (const SuiteComponent& c : SuiteComponentList())
            if (c.kind == SuiteComponent::ProgId) keys += "HKEY_CLASSES_ROOT\\" + c.text + "\r\n";
        static const char* const kVersioned[9] = {
            "Vantric.Zendor32.Application.1", "Vantric.Zendor32.Document.1", "Vantric.Orlandel.Engine.1",
            "Vantric.Orlandel.Viewer.1",      "Vantric.Fetchwell.Downloader.1", "Vantric.Pellow.Notifier.1",
            "Vantric.Mendler.Updater.1",      "Vantric.Rivzip.Expander.1",   "Vantric.Shared.Settings.1",
        };
        for (const char* progId : kVersioned) keys += std::string("HKEY_CLASSES_ROOT\\") + progId + "\r\n";
        return keys;
    }();
    return list;
}
