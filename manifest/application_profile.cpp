#include "manifest/application_profile.h"

#include "platform/app.h"

std::string ApplicationProfileString(const std::string& section, const std::string& entry,
                                     const std::string& dflt) {
    if (const plat::CWinApp* app = plat::AfxGetApp()) return app->GetProfileString(section, entry, dflt);
    // Driven without the library's application object (a host linking the parser statically,
    // or a test): read the same profile through a stand-in object of the same name.
    const plat::CWinApp standIn("Mendler");
    return standIn.GetProfileString(section, entry, dflt);
}
