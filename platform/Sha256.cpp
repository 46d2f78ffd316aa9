#include "platform/Sha256.h"

#include <new>

namespace QVSa::platform {

namespace {

void require(bool done) {
  if (!done) throw std::bad_alloc();
}

}  // namespace

Sha256::Sha256() : context_(EVP_MD_CTX_new()) {
  const OpenSslPointer<EVP_MD, EVP_MD_free> method(EVP_MD_fetch(openSslLibrary(), "SHA2-256", nullptr));
  require(context_ && method && EVP_DigestInit_ex2(context_.get(), method.get(), nullptr) == 1);
}

void Sha256::add(const void* bytes, std::size_t count) { require(EVP_DigestUpdate(context_.get(), bytes, count) == 1); }

Sha256::Digest Sha256::digest() {
  Digest result{};
  require(EVP_DigestFinal_ex(context_.get(), result.data(), nullptr) == 1);
  return result;
}

}  // namespace QVSa::platform
