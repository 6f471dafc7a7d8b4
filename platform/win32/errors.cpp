// The last error is the thread's own Windows last error; errno values from the C run-time are
// translated for the few callers that meet them.
#include "platform/errors.h"

#include <cerrno>

#include "platform/win32/windows_api.h"

namespace plat {

std::uint32_t LastError() { return ::GetLastError(); }

void SetLastErrorCode(std::uint32_t code) { ::SetLastError(code); }

std::uint32_t ErrorFromErrno(int err) {
    switch (err) {
        case 0: return kErrorSuccess;
        case ENOENT: return kErrorFileNotFound;
        case ENOTDIR: return kErrorPathNotFound;
        case EACCES:
        case EPERM:
        case EROFS:
        case EISDIR: return kErrorAccessDenied;
        case EBADF: return kErrorInvalidHandle;
        case ENOMEM: return kErrorNotEnoughMemory;
        case EBUSY: return kErrorSharingViolation;
        case EEXIST: return kErrorFileExists;
        case ENOSPC:
        case EFBIG: return kErrorDiskFull;
        case ENAMETOOLONG: return kErrorFilenameExcedRange;
        case ENOTEMPTY: return kErrorDirNotEmpty;
        case EINVAL: return kErrorInvalidParameter;
        case ENOEXEC: return kErrorBadFormat;
        default: return kErrorGenFailure;
    }
}

}  // namespace plat
