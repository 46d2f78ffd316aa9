#include "platform/Sha256.h"

#include <openssl/evp.h>

#include "QVSa/frame/Failure.h"

namespace QVSa::platform {

namespace {

void require(bool done) {
  if (!done) throw runtimeFailure(number::internal);
}

}  // namespace

Sha256::Sha256() : context_(EVP_MD_CTX_new()) {
  if (context_ != nullptr && EVP_DigestInit_ex(context_, EVP_sha256(), nullptr) == 1) return;
  EVP_MD_CTX_free(context_);
  throw runtimeFailure(number::internal);
}

Sha256::~Sha256() { EVP_MD_CTX_free(context_); }

void Sha256::add(const void* bytes, std::size_t count) { require(EVP_DigestUpdate(context_, bytes, count) == 1); }

Sha256::Digest Sha256::digest() {
  Digest result{};
  require(EVP_DigestFinal_ex(context_, result.data(), nullptr) == 1);
  return result;
}

}  // namespace QVSa::platform
