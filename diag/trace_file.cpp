// TraceFile: the log's handle, shared with other programs that read or write the log while the
// library runs, and serialised between the threads of this process by a timed mutex.
#include "diag/trace_log.h"

namespace {

constexpr std::uint32_t kMutexWaitMs = 500;

// Holds the mutex for one operation when the wait succeeded.
class MutexHold {
public:
    explicit MutexHold(plat::TimedMutex& mutex) : mutex_(mutex), locked_(mutex.Lock(kMutexWaitMs)) {}
    ~MutexHold() {
        if (locked_) mutex_.Unlock();
    }
    MutexHold(const MutexHold&) = delete;
    MutexHold& operator=(const MutexHold&) = delete;
    bool Locked() const { return locked_; }

private:
    plat::TimedMutex& mutex_;
    bool locked_;
};

}  // namespace

TraceFile::TraceFile() = default;

TraceFile::~TraceFile() = default;  // the AppendFile closes its handle

bool TraceFile::Open(const std::string& name) {
    MutexHold hold(mutex_);
    return hold.Locked() && file_.Open(name);
}

void TraceFile::ForgetMapping() {
    MutexHold hold(mutex_);
    if (hold.Locked()) file_.ForgetMapping();
}

bool TraceFile::Close() {
    MutexHold hold(mutex_);
    if (!hold.Locked()) return false;
    file_.Close();
    return true;
}

// The append mode of the file puts every write at its end, so no seek is needed.
bool TraceFile::Write(const std::string& text) {
    MutexHold hold(mutex_);
    if (!hold.Locked() || !file_.IsOpen()) return false;
    std::string windows;
    windows.reserve(text.size() + 2);
    std::size_t start = 0;
    for (std::size_t lf; (lf = text.find('\n', start)) != std::string::npos; start = lf + 1) {
        const std::size_t end = lf > start && text[lf - 1] == '\r' ? lf - 1 : lf;
        windows.append(text, start, end - start).append("\r\n");
    }
    windows.append(text, start, std::string::npos);
    return windows.empty() || file_.Append(windows.data(), windows.size());
}

bool TraceFile::Append(const std::string& text) {
    MutexHold hold(mutex_);
    return hold.Locked() && Write(text);
}

void TraceFile::Release() {
    MutexHold hold(mutex_);
    if (hold.Locked()) file_.Release();
}

bool TraceFile::IsOpen() const {
    return file_.IsOpen();
}
