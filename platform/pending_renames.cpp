// The restart queue in Windows' own layout, over the registry and file operations of the
// platform, so the same bytes that MoveFileEx would write are what the emulation stores.
#include "platform/errors.h"
#include "platform/files.h"
#include "platform/registry.h"
#include "platform/setup_install.h"

namespace plat::setup {

namespace {

const std::string kNtPrefix = "\\??\\";

std::string WithoutNtPrefix(const std::string& path) {
    return path.compare(0, kNtPrefix.size(), kNtPrefix) == 0 ? path.substr(kNtPrefix.size()) : path;
}

// The next NUL-terminated string from at; sets *at past its NUL (or to the end).
std::string NextString(const std::string& data, std::size_t* at) {
    std::size_t end = data.find('\0', *at);
    if (end == std::string::npos) end = data.size();
    std::string s = data.substr(*at, end - *at);
    *at = end + 1;
    return s;
}

long OpenSessionManager(bool create, reg::Key* key) {
    if (create) return reg::CreateKey(reg::kLocalMachine, kSessionManagerKey, reg::kKeyAllAccess, key->out(), nullptr);
    return reg::OpenKey(reg::kLocalMachine, kSessionManagerKey, reg::kKeyRead, key->out());
}

}  // namespace

std::string EncodePendingRenames(const std::vector<PendingRename>& queue) {
    std::string data;
    for (const PendingRename& op : queue) {
        data += kNtPrefix + op.from;
        data.push_back('\0');
        if (!op.to.empty()) data += (op.replace ? "!" : "") + kNtPrefix + op.to;
        data.push_back('\0');
    }
    data.push_back('\0');
    return data;
}

std::vector<PendingRename> DecodePendingRenames(const std::string& data) {
    std::vector<PendingRename> queue;
    std::size_t at = 0;
    while (at < data.size()) {
        std::string from = NextString(data, &at);
        if (from.empty()) break;
        std::string to = at < data.size() ? NextString(data, &at) : std::string();
        bool replace = !to.empty() && to[0] == '!';
        queue.push_back({WithoutNtPrefix(from), WithoutNtPrefix(replace ? to.substr(1) : to), replace});
    }
    return queue;
}

bool ReadPendingRenames(std::vector<PendingRename>* queue) {
    queue->clear();
    reg::Key key;
    long rc = OpenSessionManager(false, &key);
    std::uint32_t size = 0;
    if (rc == 0) rc = reg::QueryValue(key.get(), kPendingRenamesValue, nullptr, nullptr, &size);
    if (rc == kErrorFileNotFound) return true;
    std::string data(size, '\0');
    if (rc == 0 && size > 0)
        rc = reg::QueryValue(key.get(), kPendingRenamesValue, nullptr,
                             reinterpret_cast<std::uint8_t*>(data.data()), &size);
    if (rc != 0) {
        SetLastErrorCode(static_cast<std::uint32_t>(rc));
        return false;
    }
    *queue = DecodePendingRenames(data.substr(0, size));
    return true;
}

long WritePendingRenames(const std::vector<PendingRename>& queue) {
    reg::Key key;
    long rc = OpenSessionManager(true, &key);
    if (rc != 0) return rc;
    if (queue.empty()) {
        rc = reg::DeleteValue(key.get(), kPendingRenamesValue);
        return rc == kErrorFileNotFound ? 0 : rc;
    }
    std::string data = EncodePendingRenames(queue);
    return reg::SetValue(key.get(), kPendingRenamesValue, reg::kRegMultiSz,
                         reinterpret_cast<const std::uint8_t*>(data.data()),
                         static_cast<std::uint32_t>(data.size()));
}

long QueuePendingRename(const PendingRename& op) {
    std::vector<PendingRename> queue;
    if (!ReadPendingRenames(&queue)) return static_cast<long>(LastError());
    queue.push_back(op);
    return WritePendingRenames(queue);
}

bool CarryOutPendingRenames(std::vector<RenameOutcome>* outcomes) {
    outcomes->clear();
    std::vector<PendingRename> queue, failed;
    if (!ReadPendingRenames(&queue)) return false;
    for (const PendingRename& op : queue) {
        bool ok = op.to.empty() ? files::Remove(op.from) : files::Rename(op.from, op.to, op.replace);
        outcomes->push_back({op, ok ? 0u : LastError()});
        if (!ok) failed.push_back(op);
    }
    long rc = WritePendingRenames(failed);
    if (rc != 0) SetLastErrorCode(static_cast<std::uint32_t>(rc));
    return rc == 0;
}

}  // namespace plat::setup
