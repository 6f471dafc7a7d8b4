// SHA-256 digests through the platform's own cryptography: OpenSSL's libcrypto on Linux, the
// BCrypt primitives on Windows. Used to check a download against the digest its publisher
// recorded before the download replaces anything.
#pragma once
#include <cstddef>
#include <memory>
#include <string>

namespace plat::digest {

// The number of hexadecimal digits of a SHA-256 digest.
constexpr std::size_t kSha256HexDigits = 64;

// One SHA-256 computation fed in pieces. Each operation returns false, with the last error set,
// when the library fails; the object is then of no further use.
class Sha256 {
public:
    Sha256();
    ~Sha256();
    Sha256(const Sha256&) = delete;
    Sha256& operator=(const Sha256&) = delete;

    bool Update(const void* bytes, std::size_t count);
    // The digest of everything fed, as 64 lower-case hexadecimal digits. Call once.
    bool Finish(std::string* hexLowercase);

private:
    static constexpr std::size_t kBytes = kSha256HexDigits / 2;
    // The digest's bytes, from the backend's library.
    bool FinishBytes(unsigned char (&bytes)[kBytes]);

    struct State;
    std::unique_ptr<State> state_;
};

// The digest of a file's bytes, read in blocks (a file may be far larger than memory allows)
// and shared with readers only. False with the Windows last error set when the file cannot be
// opened or read (2 missing, 3 missing folder, 5 a folder, 32 held by a writer that denies
// reading) or the library fails; *hexLowercase is then empty.
bool Sha256File(const std::string& path, std::string* hexLowercase);

}  // namespace plat::digest
