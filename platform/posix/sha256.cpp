// SHA-256 through OpenSSL's libcrypto (the EVP digest interface).
#include <openssl/evp.h>

#include "platform/digest.h"
#include "platform/errors.h"

namespace plat::digest {

namespace {

bool LibraryFailed() {
    SetLastErrorCode(kErrorGenFailure);
    return false;
}

}  // namespace

struct Sha256::State {
    EVP_MD_CTX* context = nullptr;  // null when the library could not start the digest
    ~State() { EVP_MD_CTX_free(context); }
};

Sha256::Sha256() : state_(new State) {
    state_->context = EVP_MD_CTX_new();
    if (state_->context && EVP_DigestInit_ex(state_->context, EVP_sha256(), nullptr) != 1) {
        EVP_MD_CTX_free(state_->context);
        state_->context = nullptr;
    }
}

Sha256::~Sha256() = default;

bool Sha256::Update(const void* bytes, std::size_t count) {
    if (!state_->context || EVP_DigestUpdate(state_->context, bytes, count) != 1) return LibraryFailed();
    return true;
}

bool Sha256::FinishBytes(unsigned char (&bytes)[kBytes]) {
    unsigned int length = 0;
    if (!state_->context || EVP_DigestFinal_ex(state_->context, bytes, &length) != 1 || length != kBytes)
        return LibraryFailed();
    return true;
}

}  // namespace plat::digest
