// The library's application object: the start-up snapshot when a host loads Mendler.dll, and
// the closing of the trace log when it unloads it.
#include "entry/library_startup.h"
#include "platform/app.h"
#include "platform/files.h"

namespace {

void Anchor() {}  // an address inside this module, to find the module's own file

class CMendlerApp : public plat::CWinApp {
public:
    bool InitInstance() override {
        StartLibrary(plat::files::ModuleFileName(reinterpret_cast<const void*>(&Anchor)));
        return plat::CWinApp::InitInstance();
    }

    int ExitInstance() override {
        StopLibrary();
        return plat::CWinApp::ExitInstance();
    }
};

PEX_APPLICATION(CMendlerApp, theApp);

}  // namespace
