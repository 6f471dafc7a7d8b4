// The module's two operations on CFile objects, behind both forms of its exports.
//
// ExpandFile: reads SZDD data from source's current position to its end and writes the expanded
// data to destination from its start (the caller creates it empty; an existing longer file keeps
// its tail). Result and progress as ExpandSzdd; failing to position the destination gives
// kRivzipWriteError.
//
// CompressFile: reads source from its current position to its end and writes SZDD data to
// destination from its start. The header's missing character is the last character of the
// source's file name when that name has an extension ("setup.exe" gives 'e'), else 0, as
// COMPRESS.EXE does for the name EXPAND.EXE restores. Result and progress as CompressSzdd; an
// original of 4 GiB or more gives kRivzipTooLarge, nothing written and nothing reported.
#pragma once
#include <cstdint>
#include <string>

#include "platform/cfile.h"
#include "rivzip/compress_performance.h"

namespace rivzip {

std::int32_t ExpandFile(plat::CFile& source, plat::CFile& destination, RivzipProgressFn progress);
std::int32_t CompressFile(plat::CFile& source, plat::CFile& destination, RivzipProgressFn progress);

// The header's missing character for a file of the given path (see CompressFile).
std::uint8_t MissingCharOf(const std::string& path);

}  // namespace rivzip
