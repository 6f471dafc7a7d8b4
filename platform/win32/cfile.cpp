// CFile over a Windows file handle, with the framework's share modes passed to CreateFileA.
#include "platform/cfile.h"

#include "platform/errors.h"
#include "platform/fault.h"
#include "platform/win32/windows_api.h"

namespace plat {

namespace {

HANDLE Native(void* handle) { return static_cast<HANDLE>(handle); }

bool Writing(unsigned flags) {
    return (flags & (CFile::modeWrite | CFile::modeReadWrite)) != 0;
}

DWORD Access(unsigned flags) {
    if (flags & CFile::modeReadWrite) return GENERIC_READ | GENERIC_WRITE;
    if (flags & CFile::modeWrite) return GENERIC_WRITE;
    return GENERIC_READ;
}

// The framework's share modes. "Deny none" also lets others delete or rename the file, so an
// opener that shares everything never keeps an update from replacing the file. "Deny read"
// lets nobody in, the same on every target of the platform.
DWORD Share(unsigned flags) {
    switch (flags & 0x70) {
        case CFile::shareDenyNone: return FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE;
        case CFile::shareDenyWrite: return FILE_SHARE_READ;
        default: return 0;
    }
}

DWORD Disposition(unsigned flags) {
    if (!(flags & CFile::modeCreate)) return OPEN_EXISTING;
    return (flags & CFile::modeNoTruncate) ? OPEN_ALWAYS : CREATE_ALWAYS;
}

// Windows refuses to write a read-only file; Wine running as root would not, so the rule is
// checked here. 0 when the open may go ahead.
std::uint32_t RefusalBeforeOpen(const std::string& path, unsigned flags) {
    const DWORD attributes = ::GetFileAttributesA(path.c_str());
    if (attributes == INVALID_FILE_ATTRIBUTES || (attributes & FILE_ATTRIBUTE_DIRECTORY)) return 0;
    const bool readOnly = (attributes & FILE_ATTRIBUTE_READONLY) != 0;
    return Writing(flags) && readOnly ? std::uint32_t{kErrorAccessDenied} : 0u;
}

[[noreturn]] void Throw(std::uint32_t code, const std::string& path) {
    SetLastErrorCode(code);
    throw CFileException(code, path);
}

[[noreturn]] void ThrowLast(const std::string& path) { Throw(::GetLastError(), path); }

}  // namespace

CFile::CFile() = default;

CFile::~CFile() {
    if (handle_) ::CloseHandle(Native(handle_));
}

bool CFile::Open(const std::string& path, unsigned flags, CFileException* error) {
    auto fail = [&](std::uint32_t code) {
        SetLastErrorCode(code);
        if (error) *error = CFileException(code, path);
        return false;
    };
    if (handle_) Close();
    if (std::uint32_t refusal = RefusalBeforeOpen(path, flags)) return fail(refusal);
    HANDLE h = ::CreateFileA(path.c_str(), Access(flags), Share(flags), nullptr, Disposition(flags),
                             FILE_ATTRIBUTE_NORMAL, nullptr);
    if (h == INVALID_HANDLE_VALUE) return fail(::GetLastError());
    handle_ = h;
    path_ = path;
    SetLastErrorCode(kErrorSuccess);
    return true;
}

std::uint32_t CFile::Read(void* buffer, std::uint32_t count) {
    if (!handle_) Throw(kErrorInvalidHandle, path_);
    auto* bytes = static_cast<char*>(buffer);
    std::uint32_t done = 0;
    while (done < count) {
        DWORD n = 0;
        if (!::ReadFile(Native(handle_), bytes + done, count - done, &n, nullptr)) ThrowLast(path_);
        if (n == 0) break;
        done += n;
    }
    return done;
}

void CFile::Write(const void* buffer, std::uint32_t count) {
    if (!handle_) Throw(kErrorInvalidHandle, path_);
    if (!fault::Allow(fault::Op::Write)) Throw(LastError(), path_);
    const auto* bytes = static_cast<const char*>(buffer);
    std::uint32_t done = 0;
    while (done < count) {
        DWORD n = 0;
        if (!::WriteFile(Native(handle_), bytes + done, count - done, &n, nullptr)) ThrowLast(path_);
        done += n;
    }
}

std::uint64_t CFile::Seek(std::int64_t offset, unsigned from) {
    if (!handle_) Throw(kErrorInvalidHandle, path_);
    const DWORD method = from == end ? FILE_END : from == current ? FILE_CURRENT : FILE_BEGIN;
    LARGE_INTEGER distance, position;
    distance.QuadPart = offset;
    if (!::SetFilePointerEx(Native(handle_), distance, &position, method)) ThrowLast(path_);
    return static_cast<std::uint64_t>(position.QuadPart);
}

std::uint64_t CFile::GetLength() const {
    if (!handle_) Throw(kErrorInvalidHandle, path_);
    LARGE_INTEGER size;
    if (!::GetFileSizeEx(Native(handle_), &size)) ThrowLast(path_);
    return static_cast<std::uint64_t>(size.QuadPart);
}

std::uint64_t CFile::GetPosition() const {
    if (!handle_) Throw(kErrorInvalidHandle, path_);
    LARGE_INTEGER zero, position;
    zero.QuadPart = 0;
    if (!::SetFilePointerEx(Native(handle_), zero, &position, FILE_CURRENT)) ThrowLast(path_);
    return static_cast<std::uint64_t>(position.QuadPart);
}

void CFile::Flush() {
    if (!handle_) return;
    if (!::FlushFileBuffers(Native(handle_))) ThrowLast(path_);
}

void CFile::Close() {
    if (!handle_) return;
    HANDLE h = Native(handle_);
    handle_ = nullptr;
    std::string path = std::move(path_);
    path_.clear();
    if (!::CloseHandle(h)) ThrowLast(path);
}

}  // namespace plat
