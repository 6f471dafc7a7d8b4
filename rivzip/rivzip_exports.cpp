// The C++ forms of the module's entries (see rivzip.h).
#include "rivzip/rivzip.h"

#include "rivzip/file_operations.h"

long LZSS_ExpandFile(plat::CFile& source, plat::CFile& destination,
                     void (*progress)(SCompressPerformance&), unsigned long /*value: reserved*/) {
    return rivzip::ExpandFile(source, destination, progress);
}

long LZSS_CompressFile(plat::CFile& source, plat::CFile& destination,
                       void (*progress)(SCompressPerformance&), unsigned long /*value: reserved*/) {
    return rivzip::CompressFile(source, destination, progress);
}
