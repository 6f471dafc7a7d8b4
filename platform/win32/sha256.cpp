// SHA-256 through the Windows cryptography primitives (BCrypt).
#include "platform/win32/windows_api.h"

#include <bcrypt.h>

#include <vector>

#include "platform/digest.h"
#include "platform/errors.h"

namespace plat::digest {

namespace {

bool LibraryFailed() {
    SetLastErrorCode(kErrorGenFailure);
    return false;
}

}  // namespace

// Null handles when the provider or the hash could not be made.
struct Sha256::State {
    BCRYPT_ALG_HANDLE algorithm = nullptr;
    BCRYPT_HASH_HANDLE hash = nullptr;
    std::vector<UCHAR> hashObject;  // the working memory the hash object lives in

    ~State() {
        if (hash) ::BCryptDestroyHash(hash);
        if (algorithm) ::BCryptCloseAlgorithmProvider(algorithm, 0);
    }
    bool Start() {
        if (!BCRYPT_SUCCESS(::BCryptOpenAlgorithmProvider(&algorithm, BCRYPT_SHA256_ALGORITHM, nullptr, 0))) {
            algorithm = nullptr;
            return false;
        }
        DWORD objectLength = 0;
        ULONG got = 0;
        if (!BCRYPT_SUCCESS(::BCryptGetProperty(algorithm, BCRYPT_OBJECT_LENGTH,
                                           reinterpret_cast<PUCHAR>(&objectLength), sizeof objectLength,
                                           &got, 0)))
            return false;
        hashObject.resize(objectLength);
        if (!BCRYPT_SUCCESS(::BCryptCreateHash(algorithm, &hash, hashObject.data(), objectLength, nullptr, 0, 0))) {
            hash = nullptr;
            return false;
        }
        return true;
    }
};

Sha256::Sha256() : state_(new State) { state_->Start(); }

Sha256::~Sha256() = default;

bool Sha256::Update(const void* bytes, std::size_t count) {
    if (!state_->hash) return LibraryFailed();
    auto* next = static_cast<PUCHAR>(const_cast<void*>(bytes));  // BCrypt does not write it
    while (count > 0) {
        const ULONG piece = count > 0x40000000u ? 0x40000000u : static_cast<ULONG>(count);
        if (!BCRYPT_SUCCESS(::BCryptHashData(state_->hash, next, piece, 0))) return LibraryFailed();
        next += piece;
        count -= piece;
    }
    return true;
}

bool Sha256::FinishBytes(unsigned char (&bytes)[kBytes]) {
    if (!state_->hash || !BCRYPT_SUCCESS(::BCryptFinishHash(state_->hash, bytes, kBytes, 0))) return LibraryFailed();
    return true;
}

}  // namespace plat::digest
