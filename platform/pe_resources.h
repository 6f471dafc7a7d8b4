// Reading resources out of a PE image (a Windows .exe or .dll) held in memory, on any host.
#pragma once
#include <cstdint>
#include <string>

namespace plat::pe {

constexpr std::uint32_t kRtVersion = 16;

enum class Lookup {
    Found,
    NotImage,     // not a PE image, or one whose headers do not hold together
    NoResources,  // a PE image without a resource section
    NotFound,     // resources, but none of that type
};

// True when the bytes start like a PE image ("MZ").
bool LooksLikeImage(const std::string& image);

// The data of the first resource of the type (first name or id, first language), as
// FindResource/LoadResource give it for the lookups GetFileVersionInfo makes.
Lookup FirstResourceOfType(const std::string& image, std::uint32_t type, std::string* data);

}  // namespace plat::pe
