// The reset of the host's update-schedule dates, done after a run met one of the host's own
// files, so that the host checks for updates again at its next start.
#include "diag/trace_log.h"
#include "entry/update_all.h"
#include "platform/registry.h"

namespace reg = plat::reg;

namespace {

// Writes a text value into an existing key below HKLM; no key is ever created.
void WriteRegistryText(const char* keyPath, const char* valueName, const char* text) {
    TRACE(g_TraceLog, "Mendler: Setting Registry Key %s.%s to '%s'", keyPath, valueName, text);
    reg::Key key;
    const long opened = reg::OpenKey(reg::kLocalMachine, keyPath, reg::kKeyWrite, key.out());
    if (opened != 0) {
        TRACE(g_TraceLog, "Mendler: RegOpenKeyEx failed with %d", static_cast<int>(opened));
        return;
    }
    TRACE(g_TraceLog, "Mendler:  opened registry key...");
    const std::string value(text);
    const long set = reg::SetValue(key.get(), valueName, reg::kRegSz,
                                   reinterpret_cast<const std::uint8_t*>(value.data()),
                                   static_cast<std::uint32_t>(value.size()));
    if (set == 0)
        TRACE(g_TraceLog, "Mendler: set value successfully...");
    else
        TRACE(g_TraceLog, "Mendler: RegSetValueEx failed with %d", static_cast<int>(set));
}

}  // namespace

void ResetUpdateScheduleDates() {
    static const char* const kKeys[] = {
        "Software\\Vantric\\OEM\\Tessary\\Zendor32\\MatrixUpdates",
        "Software\\Vantric\\OEM\\Brindle\\Zendor32\\MatrixUpdates",
        "Software\\Vantric\\Zendor32\\MatrixUpdates",
    };
    for (const char* value : {"LastDate", "NextDate"})
        for (const char* key : kKeys) WriteRegistryText(key, value, "");
}
