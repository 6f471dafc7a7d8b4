// windows.h for the win32 backend, and only for it. The macros that windows.h defines over
// names the platform interface uses (RemoveDirectory, GetProfileString, ...) are removed, so
// the backend's definitions keep the interface's names; the backend calls the "A" functions
// by their full names.
#pragma once
#ifndef WIN32_LEAN_AND_MEAN
#define WIN32_LEAN_AND_MEAN
#endif
#ifndef NOMINMAX
#define NOMINMAX
#endif
#include <windows.h>

#undef RemoveDirectory
#undef GetProfileString
#undef CopyFile
#undef DeleteFile
#undef CreateDirectory
#undef LoadLibrary
#undef GetTempPath
#undef GetTempFileName
#undef Yield
