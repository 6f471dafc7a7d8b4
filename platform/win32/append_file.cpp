// AppendFile over a Windows handle opened for appending data: every write lands at the end of
// the file. The file system's share modes make the check that the other openers allow writers,
// so no lock is taken; the path is the Windows path itself.
#include "platform/append_file.h"

#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/win32/windows_api.h"

namespace plat {

namespace {

bool Fail(std::uint32_t code) {
    SetLastErrorCode(code);
    return false;
}

}  // namespace

AppendFile::~AppendFile() {
    if (handle_) ::CloseHandle(static_cast<HANDLE>(handle_));
}

bool AppendFile::Open(const std::string& path) {
    Close();
    path_ = mapped_ = path;
    return OpenMapped();
}

bool AppendFile::OpenMapped() {
    // Windows refuses to write a read-only file; Wine running as root would not.
    const DWORD attributes = ::GetFileAttributesA(mapped_.c_str());
    if (attributes != INVALID_FILE_ATTRIBUTES && !(attributes & FILE_ATTRIBUTE_DIRECTORY) &&
        (attributes & FILE_ATTRIBUTE_READONLY))
        return Fail(kErrorAccessDenied);
    HANDLE h = ::CreateFileA(mapped_.c_str(), GENERIC_READ | FILE_APPEND_DATA,
                             FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr, OPEN_ALWAYS,
                             FILE_ATTRIBUTE_NORMAL, nullptr);
    if (h == INVALID_HANDLE_VALUE) return Fail(::GetLastError());
    handle_ = h;
    SetLastErrorCode(kErrorSuccess);
    return true;
}

bool AppendFile::Append(const char* data, std::size_t size) {
    if (!handle_) return Fail(kErrorInvalidHandle);
    if (!fault::Allow(fault::Op::Write)) return false;
    for (std::size_t done = 0; done < size;) {
        DWORD n = 0;
        const DWORD chunk = static_cast<DWORD>(size - done > 0x40000000 ? 0x40000000 : size - done);
        if (!::WriteFile(static_cast<HANDLE>(handle_), data + done, chunk, &n, nullptr)) return Fail(::GetLastError());
        done += n;
    }
    return true;
}

void AppendFile::Release() {}

void AppendFile::Close() {
    if (handle_) ::CloseHandle(static_cast<HANDLE>(handle_));
    handle_ = nullptr;
}

}  // namespace plat
