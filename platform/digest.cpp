// The portable side of the digests: the hexadecimal form, and the digest of a file streamed
// through the framework's file class, so that both targets read with the same sharing rules.
// Only the engine (platform/<backend>/sha256.cpp) differs between them.
#include <vector>

#include "platform/cfile.h"
#include "platform/digest.h"
#include "platform/errors.h"

namespace plat::digest {

namespace {

// Large enough that the library call per block costs nothing against the read.
constexpr std::uint32_t kBlockSize = 1u << 20;

bool Stream(CFile& file, Sha256& sha) {
    std::vector<char> block(kBlockSize);
    try {
        for (;;) {
            const std::uint32_t got = file.Read(block.data(), kBlockSize);
            if (got == 0) return true;
            if (!sha.Update(block.data(), got)) return false;
        }
    } catch (const CFileException& error) {
        SetLastErrorCode(error.OsError());
        return false;
    }
}

}  // namespace

bool Sha256::Finish(std::string* hexLowercase) {
    unsigned char bytes[kBytes];
    if (!FinishBytes(bytes)) return false;
    static const char kDigits[] = "0123456789abcdef";
    hexLowercase->clear();
    for (unsigned char byte : bytes) {
        hexLowercase->push_back(kDigits[byte >> 4]);
        hexLowercase->push_back(kDigits[byte & 0x0F]);
    }
    return true;
}

bool Sha256File(const std::string& path, std::string* hexLowercase) {
    hexLowercase->clear();
    CFile file;
    if (!file.Open(path, CFile::modeRead | CFile::shareDenyWrite | CFile::typeBinary)) return false;
    Sha256 sha;
    std::string hex;
    if (!Stream(file, sha) || !sha.Finish(&hex)) return false;
    *hexLowercase = hex;
    return true;  // the open left the last error at success
}

}  // namespace plat::digest
