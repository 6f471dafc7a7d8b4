// Registry texts for the support snapshot: one line per value, a recursive key dump, and the
// lookup of a component's in-process server.
#include <cstdio>
#include <cstring>
#include <vector>

#include "commands/platform_utilities.h"

namespace reg = plat::reg;

namespace {

std::string Format(const char* format, const std::string& a, const std::string& b) {
    int n = std::snprintf(nullptr, 0, format, a.c_str(), b.c_str());
    std::string out(static_cast<size_t>(n), '\0');
    std::snprintf(out.data(), out.size() + 1, format, a.c_str(), b.c_str());
    return out;
}

// The data as a C text: up to its first zero, never past its size.
std::string DataText(const std::uint8_t* data, std::uint32_t size) {
    const char* p = reinterpret_cast<const char*>(data);
    return std::string(p, strnlen(p, size));
}

constexpr std::uint32_t kNameRoom = 256;   // a name of up to 255 characters and its zero
constexpr std::uint32_t kDataRoom = 2048;

// Dumps one key into *out; on any failure returns the error and leaves *out unspecified.
long DumpKey(const std::string& rootName, reg::HKey root, const std::string& subKey,
             std::string* out) {
    reg::Key key;
    long rc = reg::OpenKey(root, subKey, reg::kKeyRead, key.out());
    if (rc == 2) {
        *out = "[" + rootName + "\\" + subKey + "] -- not found\n";
        return 0;
    }
    if (rc != 0) return rc;
    *out = "[" + rootName + "\\" + subKey + "]\n";
    for (std::uint32_t i = 0;; ++i) {
        char name[kNameRoom];
        std::uint8_t data[kDataRoom];
        std::uint32_t nameSize = kNameRoom, dataSize = kDataRoom, type = 0;
        rc = reg::EnumValue(key.get(), i, name, &nameSize, &type, data, &dataSize);
        if (rc == 259) break;
        if (rc != 0) return rc;
        *out += RegistryValueText(std::string(name, nameSize), type, data, dataSize) + "\n";
    }
    const std::string childRoot = rootName + "\\" + subKey;
    for (std::uint32_t i = 0;; ++i) {
        char name[kNameRoom];
        std::uint32_t nameSize = kNameRoom;
        rc = reg::EnumKey(key.get(), i, name, &nameSize);
        if (rc == 259) break;
        if (rc != 0) return rc;
        std::string child;
        rc = DumpKey(childRoot, key.get(), std::string(name, nameSize), &child);
        if (rc != 0) return rc;
        *out += "\n" + child;
    }
    return 0;
}

// A string value of at most 512 bytes; empty on any failure.
std::string ReadString(reg::HKey root, const std::string& subKey, const std::string& name,
                       bool* found) {
    *found = false;
    reg::Key key;
    if (reg::OpenKey(root, subKey, reg::kKeyRead, key.out()) != 0) return std::string();
    std::uint8_t buffer[512];
    std::uint32_t size = sizeof buffer, type = 0;
    if (reg::QueryValue(key.get(), name, &type, buffer, &size) != 0) return std::string();
    if (type != reg::kRegSz && type != reg::kRegExpandSz) return std::string();
    *found = true;
    return DataText(buffer, size);
}

}  // namespace

std::string RegistryValueText(const std::string& name, std::uint32_t type, const std::uint8_t* data,
                              std::uint32_t size) {
    if (type == reg::kRegSz || type == reg::kRegExpandSz)
        return Format("\"%s\"=\"%s\"", name, DataText(data, size));
    char line[64];
    if (type == reg::kRegDword) {
        std::uint32_t number = 0;
        std::memcpy(&number, data, size < 4 ? size : 4);
        std::snprintf(line, sizeof line, "=dword:%lx (%ld)", static_cast<unsigned long>(number),
                      static_cast<long>(static_cast<std::int32_t>(number)));
        return "\"" + name + "\"" + line;
    }
    std::snprintf(line, sizeof line, " = Unsupported Type (%d)", static_cast<int>(type));
    return "\"" + name + "\"" + line;
}

std::string RegistryKeyDump(const std::string& rootName, reg::HKey root, const std::string& subKey,
                            long* status) {
    std::string text;
    *status = DumpKey(rootName, root, subKey, &text);
    if (*status != 0) text.clear();
    return text;
}

std::string InprocServerPath(const std::string& progId) {
    bool found = false;
    const std::string clsid = ReadString(reg::kClassesRoot, progId + "\\CLSID", "", &found);
    if (!found) return std::string();
    const std::string serverKey = "CLSID\\" + clsid + "\\InprocServer32";
    std::string path = ReadString(reg::kClassesRoot, serverKey, "", &found);
    if (!found) path = ReadString(reg::kClassesRoot, serverKey, "InprocServer32", &found);
    return path;
}
