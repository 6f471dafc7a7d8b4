// Whole keys over the registry calls: all values of a key, all subkey names, and the deletion
// of a key with everything below it. Each returns the Windows code of the first failing call.
#pragma once
#include <cstdint>
#include <string>
#include <vector>

#include "platform/registry.h"

namespace plat::reg {

struct Value {
    std::string name;  // empty for the default value
    std::uint32_t type = kRegNone;
    std::string data;  // the stored bytes
};

// The values of an open key (opened with query rights), in enumeration order.
long ReadValues(HKey key, std::vector<Value>* values);

// The names of the direct subkeys of an open key, in enumeration order.
long SubKeyNames(HKey key, std::vector<std::string>* names);

// RegDeleteTree: deletes subKey of parent and every key and value below it, deepest first;
// 2 when it is missing. Run it inside a Transaction to delete all or nothing.
long DeleteTree(HKey parent, const std::string& subKey);

}  // namespace plat::reg
