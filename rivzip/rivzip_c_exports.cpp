// The plain C symbols behind the entries' loader names (see rivzip.h): on Linux the loader finds
// them for the decorated names, on Windows rivzip.def exports them under the decorated names.
// They have the type RivzipFileFn. This file does not include rivzip.h, whose C++ overloads of
// the same names would make calls with a literal 0 ambiguous.
#include <cstdint>

#include "platform/cfile.h"
#include "rivzip/compress_performance.h"
#include "rivzip/file_operations.h"

#if defined(_WIN32)
#define RIVZIP_C_API extern "C"
#else
#define RIVZIP_C_API extern "C" __attribute__((visibility("default")))
#endif

RIVZIP_C_API std::int32_t LZSS_ExpandFile(plat::CFile& source, plat::CFile& destination,
                                          RivzipProgressFn progress, std::uint32_t /*value: reserved*/) {
    return rivzip::ExpandFile(source, destination, progress);
}

RIVZIP_C_API std::int32_t LZSS_CompressFile(plat::CFile& source, plat::CFile& destination,
                                            RivzipProgressFn progress, std::uint32_t /*value: reserved*/) {
    return rivzip::CompressFile(source, destination, progress);
}
