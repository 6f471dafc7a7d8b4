#include "rivzip/file_operations.h"

#include "rivzip/cfile_stream.h"
#include "rivzip/rivzip_result.h"
#include "rivzip/szdd_compressor.h"
#include "rivzip/szdd_expander.h"

namespace rivzip {
namespace {

bool Rewind(plat::CFile& file) {
    try {
        file.Seek(0, plat::CFile::begin);
        return true;
    } catch (...) {
        return false;
    }
}

// Bytes from the current position to the end; false when the file cannot say.
bool Remaining(plat::CFile& file, std::uint64_t* bytes) {
    try {
        std::uint64_t length = file.GetLength(), position = file.GetPosition();
        *bytes = length > position ? length - position : 0;
        return true;
    } catch (...) {
        return false;
    }
}

}  // namespace

std::uint8_t MissingCharOf(const std::string& path) {
    std::size_t nameStart = path.find_last_of("\\/:");
    std::size_t dot = path.find_last_of('.');
    bool hasExtension = dot != std::string::npos && (nameStart == std::string::npos || dot > nameStart);
    if (!hasExtension || dot + 1 == path.size()) return 0;
    return static_cast<std::uint8_t>(path.back());
}

std::int32_t ExpandFile(plat::CFile& source, plat::CFile& destination, RivzipProgressFn progress) {
    if (!Rewind(destination)) return kRivzipWriteError;
    CFileSource in(source);
    CFileSink out(destination);
    return ExpandSzdd(in, out, progress);
}

std::int32_t CompressFile(plat::CFile& source, plat::CFile& destination, RivzipProgressFn progress) {
    std::uint64_t length = 0;
    if (!Remaining(source, &length)) return kRivzipReadError;
    if (length > 0xFFFFFFFFu) return kRivzipTooLarge;
    if (!Rewind(destination)) return kRivzipWriteError;
    CFileSource in(source);
    CFileSink out(destination);
    CompressInput input{static_cast<std::uint32_t>(length), MissingCharOf(source.GetFilePath())};
    return CompressSzdd(in, out, input, progress);
}

}  // namespace rivzip
