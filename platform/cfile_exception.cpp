#include "platform/cfile.h"

namespace plat {

namespace {
std::string Describe(std::uint32_t osError, const std::string& fileName) {
    return "file error " + std::to_string(osError) + (fileName.empty() ? "" : " on '" + fileName + "'");
}
}  // namespace

CFileException::CFileException(std::uint32_t osError, const std::string& fileName)
    : std::runtime_error(Describe(osError, fileName)), osError_(osError), fileName_(fileName) {}

}  // namespace plat
