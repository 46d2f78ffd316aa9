#include "platform/Fingerprint.h"

#include <array>
#include <openssl/evp.h>
#include <openssl/hmac.h>
#include <openssl/rand.h>

#include "QVSa/frame/Failure.h"

namespace QVSa::platform {

namespace {

using Key = std::array<std::uint8_t, 32>;

const Key& processKey() {
  static const Key key = [] {
    Key made;
    if (RAND_bytes(made.data(), static_cast<int>(made.size())) != 1) throw runtimeFailure(number::internal);
    return made;
  }();
  return key;
}

}  // namespace

Bytes fingerprint(const String& secret) {
  const Key& key = processKey();
  Bytes digest(EVP_MAX_MD_SIZE);
  unsigned int size = 0;
  const auto* const bytes = reinterpret_cast<const unsigned char*>(secret.data());
  if (HMAC(EVP_sha256(), key.data(), static_cast<int>(key.size()), bytes, secret.size(), digest.data(), &size) ==
      nullptr)
    throw runtimeFailure(number::internal);
  digest.resize(size);
  return digest;
}

}  // namespace QVSa::platform
