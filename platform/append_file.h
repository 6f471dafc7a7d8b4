// A file that lines are appended to, each line opened, written and closed again, while other
// programs may read, write, copy or delete it in between: the trace log's file. Its Windows
// path is mapped to the file system's once, and again only when an open fails; an append is one
// write at the end of the file, which the file's append mode finds without a seek.
#pragma once
#include <cstddef>
#include <cstdint>
#include <string>

namespace plat {

class AppendFile {
public:
    AppendFile() = default;
    AppendFile(const AppendFile&) = delete;
    AppendFile& operator=(const AppendFile&) = delete;
    ~AppendFile();  // closes an open file, never throws

    // Opens the file for appending, created when missing and its bytes kept, shared for reading
    // and writing with other openers. False with the last error set, as CFile::Open: 3 a missing
    // folder, 5 a folder or a read-only file, 32 another opener's share mode refuses writers.
    // On the emulated machine the read-only attribute is asked when the path was mapped anew
    // (the first open, and the open after a failed one).
    bool Open(const std::string& path);
    // Maps the path again at the next open (the log was configured anew).
    void ForgetMapping() { mapped_.clear(); }
    // Writes the bytes at the end of the file in one write; false with the last error set when
    // the write (or the fault plan) failed.
    bool Append(const char* data, std::size_t size);
    // Lets other openers' share checks through while the file stays open between appends.
    void Release();
    void Close();
    bool IsOpen() const { return fd_ >= 0 || handle_ != nullptr; }

private:
    bool OpenMapped();
    std::uint32_t ModeRefusal(int fd);  // posix

    // The backend built uses its own.
    int fd_ = -1;                               // posix
    void* handle_ = nullptr;                    // win32
    [[maybe_unused]] bool locked_ = false;      // posix: the share lock is held
    [[maybe_unused]] bool checkMode_ = true;    // posix: the next open asks for read-only
    std::string path_;                          // the Windows path last opened
    std::string mapped_;                        // its file system path when it was mapped
};

}  // namespace plat
