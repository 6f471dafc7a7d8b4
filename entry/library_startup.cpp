#include "entry/library_startup.h"

#include "diag/startup_snapshot.h"
#include "diag/trace_log.h"
#include "diag/trace_startup.h"
#include "platform/library.h"

void StartLibrary(const std::string& modulePath) {
    ConfigureTraceLog(g_TraceLog, modulePath);
    // The banner shows the Mendler.dll that the library search finds for the bare name: the
    // file a host loading the library by name gets.
    WriteStartupSnapshot(plat::lib::SearchFile("Mendler.dll"));
}

void StopLibrary() {
    try {
        g_TraceLog.Close();
    } catch (...) {
    }
}
