// The registry's key handles are the system's HKEYs; these helpers convert between the two
// and end every call as the interface promises, with the code also set as the last error.
#pragma once
#include <cstdint>

#include "platform/errors.h"
#include "platform/registry.h"
#include "platform/win32/windows_api.h"

namespace plat::reg::win32 {

inline HKEY Native(HKey key) { return reinterpret_cast<HKEY>(key); }
inline HKey Wrapped(HKEY key) { return reinterpret_cast<HKey>(key); }

inline long Done(long code) {
    SetLastErrorCode(static_cast<std::uint32_t>(code));
    return code;
}

// Asks the fault plan before a registry write: 0, or the code the plan chose.
long AllowWrite();

}  // namespace plat::reg::win32
