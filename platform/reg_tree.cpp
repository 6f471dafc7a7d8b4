// Whole keys over the registry calls.
#include "platform/reg_tree.h"

#include "platform/errors.h"

namespace plat::reg {

namespace {

// Windows caps value names at 16383 characters.
constexpr std::uint32_t kValueNameChars = 16384;

long ReadValue(HKey key, std::uint32_t index, std::vector<char>& name, Value* value) {
    auto nameSize = static_cast<std::uint32_t>(name.size());
    std::uint32_t dataSize = 0;
    long rc = EnumValue(key, index, name.data(), &nameSize, &value->type, nullptr, &dataSize);
    if (rc) return rc;
    value->name.assign(name.data(), nameSize);
    value->data.assign(dataSize, '\0');
    rc = QueryValue(key, value->name, &value->type,
                    reinterpret_cast<std::uint8_t*>(value->data.data()), &dataSize);
    value->data.resize(dataSize);
    return rc;
}

}  // namespace

long ReadValues(HKey key, std::vector<Value>* values) {
    values->clear();
    std::vector<char> name(kValueNameChars);
    for (std::uint32_t i = 0;; ++i) {
        Value value;
        long rc = ReadValue(key, i, name, &value);
        if (rc == kErrorNoMoreItems) return 0;
        if (rc) return rc;
        values->push_back(std::move(value));
    }
}

long SubKeyNames(HKey key, std::vector<std::string>* names) {
    names->clear();
    std::vector<char> name(256);
    for (std::uint32_t i = 0;;) {
        auto size = static_cast<std::uint32_t>(name.size());
        long rc = EnumKey(key, i, name.data(), &size);
        if (rc == kErrorNoMoreItems) return 0;
        if (rc == kErrorMoreData && name.size() < (1u << 20)) {
            name.resize(name.size() * 4);  // the emulation allows names past Windows' 255
            continue;
        }
        if (rc) return rc;
        names->emplace_back(name.data(), size);
        ++i;
    }
}

long DeleteTree(HKey parent, const std::string& subKey) {
    Key key;
    if (long rc = OpenKey(parent, subKey, kKeyAllAccess, key.out())) return rc;
    std::vector<std::string> children;
    if (long rc = SubKeyNames(key.get(), &children)) return rc;
    for (const std::string& child : children)
        if (long rc = DeleteTree(key.get(), child)) return rc;
    key.Reset();
    return DeleteKey(parent, subKey);
}

}  // namespace plat::reg
