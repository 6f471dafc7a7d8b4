// Registry set-up and read-back for tests.
#pragma once
#include <cstdint>
#include <string>

#include "platform/registry.h"

namespace pextest {

// Creates the key (and its parents) and stores a REG_SZ text with its terminating zero.
void SetRegText(plat::reg::HKey root, const std::string& key, const std::string& name,
                const std::string& text);
// Stores raw bytes of any type.
void SetRegValue(plat::reg::HKey root, const std::string& key, const std::string& name,
                 std::uint32_t type, const std::string& bytes);
// Creates the key (and its parents); with `created`, keeps it open there.
void CreateRegKey(plat::reg::HKey root, const std::string& key, plat::reg::Key* created = nullptr);
// The stored bytes; false when the key or value is missing.
bool GetRegValue(plat::reg::HKey root, const std::string& key, const std::string& name,
                 std::string* bytes, std::uint32_t* type = nullptr);
bool RegKeyExists(plat::reg::HKey root, const std::string& key);

}  // namespace pextest
