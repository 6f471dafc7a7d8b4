#include "tests/support/test_registry.h"

#include <stdexcept>
#include <vector>

namespace reg = plat::reg;

namespace pextest {

void CreateRegKey(reg::HKey root, const std::string& key, reg::Key* created) {
    reg::Key k;
    if (reg::CreateKey(root, key, reg::kKeyAllAccess, (created ? *created : k).out(), nullptr) != 0)
        throw std::runtime_error("cannot create test key " + key);
}

void SetRegValue(reg::HKey root, const std::string& key, const std::string& name, std::uint32_t type,
                 const std::string& bytes) {
    reg::Key k;
    CreateRegKey(root, key, &k);
    if (reg::SetValue(k.get(), name, type, reinterpret_cast<const std::uint8_t*>(bytes.data()),
                      static_cast<std::uint32_t>(bytes.size())) != 0)
        throw std::runtime_error("cannot set test value " + name);
}

void SetRegText(reg::HKey root, const std::string& key, const std::string& name,
                const std::string& text) {
    SetRegValue(root, key, name, reg::kRegSz, std::string(text.c_str(), text.size() + 1));
}

bool GetRegValue(reg::HKey root, const std::string& key, const std::string& name, std::string* bytes,
                 std::uint32_t* type) {
    reg::Key k;
    if (reg::OpenKey(root, key, reg::kKeyRead, k.out()) != 0) return false;
    std::uint32_t size = 0;
    if (reg::QueryValue(k.get(), name, type, nullptr, &size) != 0) return false;
    std::vector<std::uint8_t> data(size + 1);
    if (reg::QueryValue(k.get(), name, type, data.data(), &size) != 0) return false;
    bytes->assign(reinterpret_cast<const char*>(data.data()), size);
    return true;
}

bool RegKeyExists(reg::HKey root, const std::string& key) {
    reg::Key k;
    return reg::OpenKey(root, key, reg::kKeyRead, k.out()) == 0;
}

}  // namespace pextest
