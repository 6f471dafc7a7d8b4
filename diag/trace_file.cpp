// TraceFile: the log's handle, shared with other programs that read or write the log while the
// library runs, and serialised between the threads of this process by a timed mutex.
#include "diag/trace_log.h"

namespace {

constexpr std::uint32_t kMutexWaitMs = 500;

constexpr unsigned kOpenFlags = plat::CFile::modeReadWrite | plat::CFile::shareDenyNone |
                                plat::CFile::modeCreate | plat::CFile::modeNoTruncate |
                                plat::CFile::typeBinary;

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

TraceFile::TraceFile() : file_(std::make_unique<plat::CFile>()) {}

TraceFile::~TraceFile() = default;  // the CFile closes its handle

bool TraceFile::Open(const std::string& name) {
    MutexHold hold(mutex_);
    return hold.Locked() && file_->Open(name, kOpenFlags);
}

bool TraceFile::Close() {
    MutexHold hold(mutex_);
    if (!hold.Locked()) return false;
    try {
        file_->Close();
    } catch (const plat::CFileException&) {
        return false;  // the handle is gone even so
    }
    return true;
}

bool TraceFile::SeekToEnd() {
    MutexHold hold(mutex_);
    if (!hold.Locked() || !file_->IsOpen()) return false;
    try {
        file_->Seek(0, plat::CFile::end);
    } catch (const plat::CFileException&) {
        return false;
    }
    return true;
}

bool TraceFile::Write(const std::string& text) {
    MutexHold hold(mutex_);
    if (!hold.Locked() || !file_->IsOpen()) return false;
    auto piece = [this](const char* data, std::size_t size) {
        if (size > 0) file_->Write(data, static_cast<std::uint32_t>(size));
    };
    try {
        std::size_t start = 0;
        for (std::size_t lf; (lf = text.find('\n', start)) != std::string::npos; start = lf + 1) {
            std::size_t end = lf > start && text[lf - 1] == '\r' ? lf - 1 : lf;
            piece(text.data() + start, end - start);
            piece("\r\n", 2);
        }
        piece(text.data() + start, text.size() - start);
    } catch (const plat::CFileException&) {
        return false;
    }
    return true;
}

bool TraceFile::Append(const std::string& text) {
    MutexHold hold(mutex_);
    return hold.Locked() && SeekToEnd() && Write(text);
}

bool TraceFile::IsOpen() const {
    return file_->IsOpen();
}
