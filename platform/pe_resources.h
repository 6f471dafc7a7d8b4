// Reading resources out of a PE image (a Windows .exe or .dll), on any host. Only the headers,
// the section table and the resource tree are read, piece by piece, from a file or from bytes
// in memory.
#pragma once
#include <cstdint>
#include <string>

#include "platform/byte_source.h"

namespace plat::pe {

constexpr std::uint32_t kRtVersion = 16;
// The largest resource read: more than any version block (whose length is a 16-bit field) holds.
constexpr std::uint32_t kMaxResourceSize = 1u << 20;

enum class Lookup {
    Found,
    NotImage,     // not a PE image, or one whose headers do not hold together
    NoResources,  // a PE image without a resource section
    NotFound,     // resources, but none of that type (or one larger than kMaxResourceSize)
};

// True when the bytes start like a PE image ("MZ").
bool LooksLikeImage(const std::string& image);

// The data of the first resource of the type (first name or id, first language), as
// FindResource/LoadResource give it for the lookups GetFileVersionInfo makes. The directory
// tables and entries must lie in the resource section.
Lookup FirstResourceOfType(const ByteSource& image, std::uint32_t type, std::string* data);
Lookup FirstResourceOfType(const std::string& image, std::uint32_t type, std::string* data);

}  // namespace plat::pe
