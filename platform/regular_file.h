// A regular file opened for reading pieces of it at offsets, for parsers that read only the
// parts they need (the version information of a module). Folders, devices, pipes and sockets
// are refused when opening, so a reader never waits on a pipe nor reads a device without end.
#pragma once
#include <cstdint>
#include <string>

#include "platform/byte_source.h"

namespace plat::files {

class RegularFile final : public ByteSource {
public:
    RegularFile() = default;
    ~RegularFile() override;
    RegularFile(const RegularFile&) = delete;
    RegularFile& operator=(const RegularFile&) = delete;

    // Opens by Windows path for reading; false and the last error on failure: 2/3 when missing,
    // 5 (access denied) for anything but a regular file, 32 when its holder denies reading.
    bool Open(const std::string& path);
    // The size when opened.
    std::uint64_t Size() const override { return size_; }
    bool ReadAt(std::uint64_t at, std::size_t n, std::string* bytes) const override;

private:
    int fd_ = -1;             // posix backend
    void* handle_ = nullptr;  // win32 backend
    std::uint64_t size_ = 0;
};

}  // namespace plat::files
