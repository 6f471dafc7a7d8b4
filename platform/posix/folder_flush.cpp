#include "platform/posix/folder_flush.h"

#include <fcntl.h>
#include <unistd.h>

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

std::string FolderOf(const std::string& hostPath) {
    const std::size_t slash = hostPath.find_last_of('/');
    if (slash == std::string::npos) return ".";
    return slash == 0 ? "/" : hostPath.substr(0, slash);
}

}  // namespace plat::posix
