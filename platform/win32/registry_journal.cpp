// The undo journal of registry batches on Windows (registry_journal.h).
#include "platform/win32/registry_journal.h"

#include <functional>
#include <memory>
#include <mutex>
#include <vector>

namespace plat::reg::win32::journal {

namespace {

using KeyRef = std::shared_ptr<std::remove_pointer_t<HKEY>>;

struct Journal {
    std::mutex lock;
    int depth = 0;
    std::vector<std::function<void()>> undo;
};

Journal& TheJournal() {
    static Journal journal;
    return journal;
}

// A handle of its own to the key, kept until the batch ends; null when it cannot be had.
KeyRef Keep(HKEY key, const std::string& subKey = std::string()) {
    HKEY own = nullptr;
    if (::RegOpenKeyExA(key, subKey.c_str(), 0, KEY_ALL_ACCESS, &own) != ERROR_SUCCESS) return nullptr;
    return KeyRef(own, [](HKEY k) { ::RegCloseKey(k); });
}

struct Value {
    std::string name;
    DWORD type = 0;
    std::vector<BYTE> bytes;
};

bool Read(HKEY key, const std::string& name, Value* value) {
    DWORD size = 0;
    if (::RegQueryValueExA(key, name.c_str(), nullptr, &value->type, nullptr, &size) != ERROR_SUCCESS)
        return false;
    value->name = name;
    value->bytes.assign(size + 1, 0xFF);  // the extra byte keeps RegSetValueExA from adding a NUL
    if (::RegQueryValueExA(key, name.c_str(), nullptr, &value->type, value->bytes.data(), &size) !=
        ERROR_SUCCESS)
        return false;
    value->bytes.resize(size);
    return true;
}

void Restore(HKEY key, Value value) {
    const DWORD size = static_cast<DWORD>(value.bytes.size());
    value.bytes.push_back(0xFF);
    ::RegSetValueExA(key, value.name.c_str(), 0, value.type, value.bytes.data(), size);
}

std::vector<Value> AllValues(HKEY key) {
    std::vector<Value> values;
    char name[16384];
    for (DWORD i = 0;; ++i) {
        DWORD size = sizeof name;
        if (::RegEnumValueA(key, i, name, &size, nullptr, nullptr, nullptr, nullptr) != ERROR_SUCCESS)
            break;
        Value v;
        if (Read(key, name, &v)) values.push_back(std::move(v));
    }
    return values;
}

void Record(std::function<void()> step) {
    Journal& j = TheJournal();
    std::lock_guard<std::mutex> hold(j.lock);
    if (j.depth > 0) j.undo.push_back(std::move(step));
}

bool Active() {
    Journal& j = TheJournal();
    std::lock_guard<std::mutex> hold(j.lock);
    return j.depth > 0;
}

// The shortest leading part of subKey that does not exist below parent; empty when all do.
std::string FirstMissing(HKEY parent, const std::string& subKey) {
    std::size_t end = 0;
    while (end < subKey.size()) {
        end = subKey.find('\\', end + 1);
        if (end == std::string::npos) end = subKey.size();
        const std::string prefix = subKey.substr(0, end);
        HKEY probe = nullptr;
        if (::RegOpenKeyExA(parent, prefix.c_str(), 0, KEY_READ, &probe) != ERROR_SUCCESS) return prefix;
        ::RegCloseKey(probe);
    }
    return std::string();
}

}  // namespace

bool Begin() {
    Journal& j = TheJournal();
    std::lock_guard<std::mutex> hold(j.lock);
    return j.depth++ == 0;
}

void End(bool commit) {
    std::vector<std::function<void()>> undo;
    {
        Journal& j = TheJournal();
        std::lock_guard<std::mutex> hold(j.lock);
        if (j.depth == 0 || --j.depth > 0) return;
        undo.swap(j.undo);
    }
    if (commit) return;
    const DWORD saved = ::GetLastError();
    for (auto step = undo.rbegin(); step != undo.rend(); ++step) (*step)();
    ::SetLastError(saved);
}

void BeforeSetValue(HKEY key, const std::string& name) {
    if (!Active()) return;
    KeyRef own = Keep(key);
    if (!own) return;
    Value old;
    if (Read(own.get(), name, &old)) {
        Record([own, old] { Restore(own.get(), old); });
    } else {
        Record([own, name] { ::RegDeleteValueA(own.get(), name.c_str()); });
    }
}

void BeforeDeleteValue(HKEY key, const std::string& name) {
    if (!Active()) return;
    KeyRef own = Keep(key);
    Value old;
    if (own && Read(own.get(), name, &old)) Record([own, old] { Restore(own.get(), old); });
}

void BeforeDeleteKey(HKEY parent, const std::string& subKey) {
    if (!Active()) return;
    KeyRef own = Keep(parent), doomed = Keep(parent, subKey);
    if (!own || !doomed) return;
    std::vector<Value> values = AllValues(doomed.get());
    Record([own, subKey, values] {
        HKEY again = nullptr;
        if (::RegCreateKeyExA(own.get(), subKey.c_str(), 0, nullptr, REG_OPTION_NON_VOLATILE,
                              KEY_ALL_ACCESS, nullptr, &again, nullptr) != ERROR_SUCCESS)
            return;
        for (const Value& v : values) Restore(again, v);
        ::RegCloseKey(again);
    });
}

void BeforeCreateKey(HKEY parent, const std::string& subKey) {
    if (!Active()) return;
    const std::string added = FirstMissing(parent, subKey);
    KeyRef own = added.empty() ? nullptr : Keep(parent);
    if (own) Record([own, added] { ::RegDeleteTreeA(own.get(), added.c_str()); });
}

}  // namespace plat::reg::win32::journal
