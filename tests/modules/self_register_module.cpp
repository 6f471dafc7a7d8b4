// A self-registering test module: DllRegisterServer records that it ran in the registry
// (HKLM\Software\Vantric\Test "Registered"=1, and "RegisteredBy" naming the module), so a
// test can see the registration happen. Built twice, with and without "OLESelfRegister" in
// its version information.
#include <cstdint>
#include <cstring>

#include "module_export.h"
#include "platform/registry.h"

PEX_EXPORT const char* PexModuleName() { return PEX_MODULE_NAME; }

PEX_EXPORT std::int32_t DllRegisterServer() {
    plat::reg::Key key;
    if (plat::reg::CreateKey(plat::reg::kLocalMachine, "Software\\Vantric\\Test", plat::reg::kKeyAllAccess,
                             key.out(), nullptr) != 0)
        return 1;
    const std::uint32_t one = 1;
    long rc = plat::reg::SetValue(key.get(), "Registered", plat::reg::kRegDword,
                                  reinterpret_cast<const std::uint8_t*>(&one), sizeof one);
    if (rc == 0)
        rc = plat::reg::SetValue(key.get(), "RegisteredBy", plat::reg::kRegSz,
                                 reinterpret_cast<const std::uint8_t*>(PEX_MODULE_NAME),
                                 static_cast<std::uint32_t>(std::strlen(PEX_MODULE_NAME) + 1));
    return rc == 0 ? 0 : 1;
}
