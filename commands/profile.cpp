// The product profile over the registry: sections are keys below HKLM\software\Vantric\Pex.
#include <vector>

#include "commands/platform_utilities.h"

namespace reg = plat::reg;

namespace {

// Creates or opens subKey with read and write access, falling back to read-only access when
// write access is denied, and to opening the existing key when even that create is denied.
long CreateOrOpen(reg::HKey parent, const std::string& subKey, reg::Key* out) {
    long rc = reg::CreateKey(parent, subKey, reg::kKeyRead | reg::kKeyWrite, out->out(), nullptr);
    if (rc != 5) return rc;
    rc = reg::CreateKey(parent, subKey, reg::kKeyRead, out->out(), nullptr);
    if (rc != 5) return rc;
    return reg::OpenKey(parent, subKey, reg::kKeyRead, out->out());
}

long OpenSoftware(reg::Key* out) {
    long rc = reg::OpenKey(reg::kLocalMachine, "software", reg::kKeyRead | reg::kKeyWrite, out->out());
    if (rc == 5) rc = reg::OpenKey(reg::kLocalMachine, "software", reg::kKeyRead, out->out());
    return rc;
}

// The section key below software\Vantric\Pex; every key opened on the way is closed here.
bool OpenSection(const std::string& section, reg::Key* sectionKey) {
    reg::Key software, vantric, pex;
    if (OpenSoftware(&software) != 0) return false;
    if (CreateOrOpen(software.get(), "Vantric", &vantric) != 0) return false;
    if (CreateOrOpen(vantric.get(), "Pex", &pex) != 0) return false;
    return CreateOrOpen(pex.get(), section, sectionKey) == 0;
}

}  // namespace

std::string CProfile::ReadProfileEntry(const std::string& section, const std::string& entry,
                                       const std::string& dflt) const {
    reg::Key key;
    if (!OpenSection(section, &key)) return dflt;
    std::uint32_t size = 0;
    if (reg::QueryValue(key.get(), entry, nullptr, nullptr, &size) != 0) return dflt;
    std::vector<std::uint8_t> buffer(size + 1, 0);
    if (reg::QueryValue(key.get(), entry, nullptr, buffer.data(), &size) != 0) return dflt;
    // The stored bytes are read as a C text: a terminating zero ends it.
    return std::string(reinterpret_cast<const char*>(buffer.data()));
}

bool CProfile::WriteProfileEntry(const std::string& section, const char* entry,
                                 const char* value) const {
    if (entry == nullptr) return false;
    reg::Key key;
    if (!OpenSection(section, &key)) return false;
    if (value == nullptr) return reg::DeleteValue(key.get(), entry) == 0;
    std::string text(value);
    return reg::SetValue(key.get(), entry, reg::kRegSz,
                         reinterpret_cast<const std::uint8_t*>(text.c_str()),
                         static_cast<std::uint32_t>(text.size() + 1)) == 0;
}
