#include "platform/posix/folder_flush.h"

#include <fcntl.h>
#include <unistd.h>

#include <set>

#include "platform/files.h"
#include "platform/power_cut.h"

namespace plat::posix {

bool FlushFolder(const std::string& hostFolder) {
    const int fd = open(hostFolder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (fd < 0) return false;
    const bool flushed = fsync(fd) == 0;
    close(fd);
    if (flushed) power::FolderFlushed(hostFolder);
    return flushed;
}

namespace {
// The folders that the live folder flush batch of this thread has noted; null while there is none.
thread_local std::set<std::string>* gathered = nullptr;
}  // namespace

void FlushFolderOrNote(const std::string& hostFolder) {
    if (gathered) {
        gathered->insert(hostFolder);
    } else {
        FlushFolder(hostFolder);
    }
}

std::string FolderOf(const std::string& hostPath) {
    const std::size_t slash = hostPath.find_last_of('/');
    if (slash == std::string::npos) return ".";
    return slash == 0 ? "/" : hostPath.substr(0, slash);
}

}  // namespace plat::posix

namespace plat::files {

FolderFlushBatch::FolderFlushBatch() : outermost_(posix::gathered == nullptr) {
    if (outermost_) posix::gathered = new std::set<std::string>();
}

FolderFlushBatch::~FolderFlushBatch() {
    if (!outermost_) return;
    Flush();
    delete posix::gathered;
    posix::gathered = nullptr;
}

bool FolderFlushBatch::Flush() {
    if (!posix::gathered) return true;
    bool flushed = true;
    for (const std::string& folder : *posix::gathered) flushed = posix::FlushFolder(folder) && flushed;
    posix::gathered->clear();
    return flushed;
}

}  // namespace plat::files
