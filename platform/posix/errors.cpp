// The thread-local last error and the translation of errno values into Windows codes.
#include "platform/errors.h"

#include <cerrno>

namespace plat {

namespace {

thread_local std::uint32_t lastError = kErrorSuccess;

// Codes that only this translation needs, in Windows numbering.
constexpr std::uint32_t kErrorTooManyOpenFiles = 4;
constexpr std::uint32_t kErrorNotSameDevice = 17;
constexpr std::uint32_t kErrorNotSupported = 50;

}  // namespace

std::uint32_t LastError() { return lastError; }

void SetLastErrorCode(std::uint32_t code) { lastError = code; }

std::uint32_t ErrorFromErrno(int err) {
    switch (err) {
        case 0: return kErrorSuccess;
        // Callers that can tell a missing folder from a missing file refine this to 3.
        case ENOENT: return kErrorFileNotFound;
        case ENOTDIR:
        case ELOOP: return kErrorPathNotFound;
        case EACCES:
        case EPERM:
        case EROFS:
        // Windows refuses to open or delete a folder as a file with "access denied".
        case EISDIR: return kErrorAccessDenied;
        case EBADF: return kErrorInvalidHandle;
        case ENOMEM: return kErrorNotEnoughMemory;
        case ETXTBSY:
        case EBUSY:
        case EWOULDBLOCK: return kErrorSharingViolation;
        // Folder creation reports 183 instead; it translates EEXIST itself.
        case EEXIST: return kErrorFileExists;
        case ENOSPC:
        case EDQUOT:
        case EFBIG: return kErrorDiskFull;
        case ENAMETOOLONG: return kErrorFilenameExcedRange;
        case ENOTEMPTY: return kErrorDirNotEmpty;
        case EINVAL: return kErrorInvalidParameter;
        case EMFILE:
        case ENFILE: return kErrorTooManyOpenFiles;
        case EXDEV: return kErrorNotSameDevice;
        case ENOTSUP: return kErrorNotSupported;
        case ENOEXEC: return kErrorBadFormat;
        default: return kErrorGenFailure;
    }
}

}  // namespace plat
