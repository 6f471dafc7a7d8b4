// Whether a Windows test program runs under Wine.
#include "tests/support/platform_guard.h"

#include "platform/library.h"

namespace pextest {

bool UnderWine() {
#ifdef _WIN32
    static const bool wine = [] {
        plat::lib::Library ntdll(plat::lib::Load("ntdll.dll"));
        return ntdll && plat::lib::FindExport(ntdll.get(), "wine_get_version") != nullptr;
    }();
    return wine;
#else
    return false;
#endif
}

}  // namespace pextest
