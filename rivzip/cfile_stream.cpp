#include "rivzip/cfile_stream.h"

namespace rivzip {

std::int64_t CFileSource::Read(std::uint8_t* buffer, std::uint32_t count) {
    try {
        return file_.Read(buffer, count);
    } catch (...) {
        return -1;
    }
}

bool CFileSink::Write(const std::uint8_t* data, std::uint32_t count) {
    try {
        file_.Write(data, count);
        return true;
    } catch (...) {
        return false;
    }
}

}  // namespace rivzip
