// Windows error codes and the thread-local last error of the stand-in platform.
// Every platform operation that can fail sets the last error to the code Windows gives
// in the same situation; registry operations also return the code, as the Win32 calls do.
#pragma once
#include <cstdint>

namespace plat {

enum WinError : std::uint32_t {
    kErrorSuccess = 0,
    kErrorFileNotFound = 2,
    kErrorPathNotFound = 3,
    kErrorAccessDenied = 5,
    kErrorInvalidHandle = 6,
    kErrorNotEnoughMemory = 8,
    kErrorSharingViolation = 32,
    kErrorHandleDiskFull = 39,
    kErrorFileExists = 80,
    kErrorInvalidParameter = 87,
    kErrorDiskFull = 112,
    kErrorModNotFound = 126,
    kErrorProcNotFound = 127,
    kErrorDirNotEmpty = 145,
    kErrorAlreadyExists = 183,
    kErrorFilenameExcedRange = 206,
    kErrorFileTooLarge = 223,
    kErrorMoreData = 234,
    kErrorWaitTimeout = 258,
    kErrorNoMoreItems = 259,
    kErrorBadFormat = 11,
    kErrorGenFailure = 31,
};

// The calling thread's last error (GetLastError / SetLastError).
std::uint32_t LastError();
void SetLastErrorCode(std::uint32_t code);

// The Windows code for a C errno value, as Windows reports the same situation.
std::uint32_t ErrorFromErrno(int err);

}  // namespace plat
