// Version information through GetFileVersionInfoA; the block is parsed by the platform's
// portable reader, which answers the same queries as VerQueryValueA.
#include "platform/version_info.h"

#include <vector>

#include "platform/errors.h"
#include "platform/regular_file.h"
#include "platform/pe_resources.h"
#include "platform/win32/windows_api.h"

namespace plat::ver {

namespace {

bool Fail(std::uint32_t code) {
    SetLastErrorCode(code);
    return false;
}

// Windows versions (and Wine) differ in the code they give for a file without version
// information; the file itself tells which of the two documented cases it is.
bool Unavailable(const std::string& winPath, DWORD error) {
    if (error == ERROR_FILE_NOT_FOUND || error == ERROR_PATH_NOT_FOUND ||
        error == ERROR_ACCESS_DENIED || error == ERROR_SHARING_VIOLATION) {
        return Fail(error);
    }
    // Only the headers are read, and only of a regular file: anything else is no module.
    files::RegularFile image;
    std::string start, unused;
    const bool module = image.Open(winPath) && image.ReadAt(0, 2, &start) && pe::LooksLikeImage(start) &&
                        pe::FirstResourceOfType(image, pe::kRtVersion, &unused) != pe::Lookup::NotImage;
    return Fail(module ? kErrorResourceTypeNotFound : kErrorResourceDataNotFound);
}

}  // namespace

bool ReadBlock(const std::string& winPath, std::string* block) {
    DWORD unused = 0;
    const DWORD size = ::GetFileVersionInfoSizeA(winPath.c_str(), &unused);
    if (size == 0) return Unavailable(winPath, ::GetLastError());
    std::vector<char> data(size);
    if (!::GetFileVersionInfoA(winPath.c_str(), 0, size, data.data())) {
        return Unavailable(winPath, ::GetLastError());
    }
    // The buffer may be larger than the block (room for conversions); the block's own first
    // field is its length.
    std::size_t length = static_cast<unsigned char>(data[0]) |
                         (static_cast<std::size_t>(static_cast<unsigned char>(data[1])) << 8);
    if (length == 0 || length > data.size()) length = data.size();
    block->assign(data.data(), length);
    SetLastErrorCode(kErrorSuccess);
    return true;
}

}  // namespace plat::ver
