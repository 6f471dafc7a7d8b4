// The framework's file class and its exception. CFile's operations are virtual so that another
// module (Rivzip.dll) can call them on an object that this module opened.
#pragma once
#include <cstdint>
#include <stdexcept>
#include <string>

namespace plat {

// Raised by CFile operations from an operating-system error code (Windows numbering).
class CFileException : public std::runtime_error {
public:
    CFileException(std::uint32_t osError, const std::string& fileName);
    std::uint32_t OsError() const { return osError_; }
    const std::string& FileName() const { return fileName_; }
private:
    std::uint32_t osError_;
    std::string fileName_;
};

class CFile {
public:
    // Open flags, with the framework's values.
    enum OpenFlags : unsigned {
        modeRead = 0x0000,
        modeWrite = 0x0001,
        modeReadWrite = 0x0002,
        shareExclusive = 0x0010,
        shareDenyWrite = 0x0020,
        shareDenyRead = 0x0030,
        shareDenyNone = 0x0040,
        modeNoTruncate = 0x1000,
        modeCreate = 0x1000 << 1,
        typeBinary = 0x8000,
    };
    enum SeekPosition : unsigned { begin = 0, current = 1, end = 2 };

    CFile();
    CFile(const CFile&) = delete;
    CFile& operator=(const CFile&) = delete;
    virtual ~CFile();  // closes an open file, never throws

    // Opens by Windows path; false (and *error filled when given, last error set) on failure:
    // 2 missing file, 3 missing folder, 5 a folder or a read-only file opened for writing,
    // 32 when another opener's share mode refuses this access or this share mode refuses
    // another opener's. shareDenyNone lets every other opener in; shareDenyWrite lets other
    // readers in; shareExclusive, shareDenyRead and no share flag let nobody in. A refused
    // modeCreate open leaves the file untouched.
    virtual bool Open(const std::string& path, unsigned flags, CFileException* error = nullptr);
    // Reads up to count bytes; returns the number read (0 at the end). Throws CFileException.
    virtual std::uint32_t Read(void* buffer, std::uint32_t count);
    // Writes all count bytes or throws CFileException (112 when the disk is full).
    virtual void Write(const void* buffer, std::uint32_t count);
    // Moves the position; returns the new position. Throws CFileException.
    virtual std::uint64_t Seek(std::int64_t offset, unsigned from);
    virtual std::uint64_t GetLength() const;
    virtual std::uint64_t GetPosition() const;
    // Flushes written data to the disk; the first flush of a file that Open created also makes
    // its name durable (on Windows the file system's log does so).
    virtual void Flush();
    virtual void Close();
    bool IsOpen() const { return fd_ >= 0 || handle_ != nullptr; }
    const std::string& GetFilePath() const { return path_; }

protected:
    int fd_ = -1;             // posix backend
    void* handle_ = nullptr;  // win32 backend
    std::string path_;
    bool newName_ = false;    // posix backend: Open created the file, its folder is not flushed yet
};

}  // namespace plat
