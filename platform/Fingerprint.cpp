#include "platform/Fingerprint.h"

#include <array>
#include <new>
#include <openssl/evp.h>

#include "platform/OpenSsl.h"
#include "platform/RandomBytes.h"

namespace QVSa::platform {

namespace {

using Key = std::array<std::uint8_t, 32>;

const Key& processKey() {
  static const Key key = [] {
    Key made;
    fillRandom(made);
    return made;
  }();
  return key;
}

}  // namespace

Bytes fingerprint(const String& secret) {
  const OpenSslErrorsKept kept;
  const Key& key = processKey();
  Bytes digest(EVP_MAX_MD_SIZE);
  std::size_t size = 0;
  const auto* const bytes = reinterpret_cast<const unsigned char*>(secret.data());
  if (EVP_Q_mac(openSslLibrary(), "HMAC", nullptr, "SHA2-256", nullptr, key.data(), key.size(), bytes, secret.size(),
                digest.data(), digest.size(), &size) == nullptr)
    throw std::bad_alloc();
  digest.resize(size);
  return digest;
}

}  // namespace QVSa::platform
