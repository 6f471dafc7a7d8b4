// RegularFile over a Win32 handle: only disk files are kept open; consoles, pipes and other
// devices are refused by their file type.
#include "platform/regular_file.h"

#include <algorithm>

#include "platform/errors.h"
#include "platform/win32/windows_api.h"

namespace plat::files {

namespace {

bool Fail(std::uint32_t code) {
    SetLastErrorCode(code);
    return false;
}

}  // namespace

RegularFile::~RegularFile() {
    if (handle_ != nullptr) ::CloseHandle(handle_);
}

bool RegularFile::Open(const std::string& path) {
    if (handle_ != nullptr) return Fail(kErrorInvalidHandle);
    // Reading is refused only when another opener denies it.
    HANDLE file = ::CreateFileA(path.c_str(), GENERIC_READ, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                                nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr);
    if (file == INVALID_HANDLE_VALUE) return false;
    LARGE_INTEGER size{};
    BY_HANDLE_FILE_INFORMATION info{};
    if (::GetFileType(file) != FILE_TYPE_DISK || !::GetFileInformationByHandle(file, &info) ||
        (info.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0 || !::GetFileSizeEx(file, &size)) {
        ::CloseHandle(file);
        return Fail(kErrorAccessDenied);
    }
    handle_ = file;
    size_ = static_cast<std::uint64_t>(size.QuadPart);
    SetLastErrorCode(kErrorSuccess);
    return true;
}

bool RegularFile::ReadAt(std::uint64_t at, std::size_t n, std::string* bytes) const {
    if (handle_ == nullptr || at > size_ || n > size_ - at) return false;
    bytes->resize(n);
    std::size_t done = 0;
    while (done < n) {
        const std::uint64_t offset = at + done;
        OVERLAPPED position{};
        position.Offset = static_cast<DWORD>(offset & 0xFFFFFFFFu);
        position.OffsetHigh = static_cast<DWORD>(offset >> 32);
        const DWORD chunk = static_cast<DWORD>(std::min<std::size_t>(n - done, 1u << 20));
        DWORD got = 0;
        if (!::ReadFile(handle_, &(*bytes)[done], chunk, &got, &position) || got == 0) return false;
        done += got;
    }
    return true;
}

}  // namespace plat::files
