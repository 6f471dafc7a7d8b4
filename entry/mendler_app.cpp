// The library's application object: the start-up snapshot when a host loads Mendler.dll, and
// the closing of the trace log when it unloads it.
#include "diag/startup_snapshot.h"
#include "diag/trace_log.h"
#include "diag/trace_startup.h"
#include "platform/app.h"
#include "platform/files.h"
#include "platform/library.h"

namespace {

class CMendlerApp : public plat::CWinApp {
public:
    bool InitInstance() override {
        ConfigureTraceLog(g_TraceLog, plat::files::ModuleFileName(reinterpret_cast<const void*>(&Anchor)));
        // The banner shows the Mendler.dll that the library search finds for the bare name,
        // which is the file a host loading the library by name gets.
        WriteStartupSnapshot(plat::lib::SearchFile("Mendler.dll"));
        return plat::CWinApp::InitInstance();
    }

    int ExitInstance() override {
        try {
            g_TraceLog.Close();
        } catch (...) {
        }
        return plat::CWinApp::ExitInstance();
    }

private:
    static void Anchor() {}
};

PEX_APPLICATION(CMendlerApp, theApp);

}  // namespace
