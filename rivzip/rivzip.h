// Rivzip.dll: expands and makes files of Microsoft's SZDD format (COMPRESS.EXE / EXPAND.EXE).
//
// LZSS_ExpandFile(source, destination, progress, value)
//   Expands the SZDD data of source, read from its current position (callers give it at its
//   start), into destination, written from its start (callers give it newly created and empty).
//   The expanded length must match the header. Both files stay open; the caller closes them.
// LZSS_CompressFile(source, destination, progress, value)
//   Compresses source, from its current position to its end (less than 4 GiB), into SZDD data
//   written to destination from its start.
//
// Both return zero or more on success (bytes written, clamped to 2^31-1) and a negative
// RivzipResult on failure. No exception leaves them. progress may be null; otherwise it gets an
// SCompressPerformance record: one starting report, one per 1 KiB of expanded data, one ending
// report (also after a failure, once started). value is reserved and ignored; callers pass 0.
//
// Export names. On Windows the module exports the decorated names below (rivzip.def). ELF cannot
// hold '@@' in a symbol, so on Linux it exports plain C symbols "LZSS_ExpandFile" and
// "LZSS_CompressFile", which the platform's library loader finds for the decorated names. Either
// way the symbol a loader finds has the type RivzipFileFn, with 32-bit types throughout.
#pragma once
#include <cstdint>

#include "platform/cfile.h"
#include "rivzip/compress_performance.h"
#include "rivzip/rivzip_result.h"

#if defined(_WIN32)
#define RIVZIP_API __declspec(dllexport)
#else
#define RIVZIP_API __attribute__((visibility("default")))
#endif

constexpr char kRivzipExpandExport[] = "?LZSS_ExpandFile@@YGJAAVCFile@@0P6GXAAUSCompressPerformance@@@ZK@Z";
constexpr char kRivzipCompressExport[] = "?LZSS_CompressFile@@YGJAAVCFile@@0P6GXAAUSCompressPerformance@@@ZK@Z";
constexpr char kRivzipModuleName[] = "Rivzip.dll";

using RivzipFileFn = std::int32_t (*)(plat::CFile& source, plat::CFile& destination,
                                      RivzipProgressFn progress, std::uint32_t value);

// The C++ forms, for a program that links the module directly.
RIVZIP_API long LZSS_ExpandFile(plat::CFile& source, plat::CFile& destination,
                                void (*progress)(SCompressPerformance&), unsigned long value);
RIVZIP_API long LZSS_CompressFile(plat::CFile& source, plat::CFile& destination,
                                  void (*progress)(SCompressPerformance&), unsigned long value);
