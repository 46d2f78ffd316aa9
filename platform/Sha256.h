#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <openssl/evp.h>

#include "platform/OpenSsl.h"

namespace QVSa::platform {

// SHA-256 of bytes that come piece by piece. Throws std::bad_alloc, the only reason for which it can't be computed.
class Sha256 {
 public:
  using Digest = std::array<std::uint8_t, 32>;

  Sha256();

  void add(const void* bytes, std::size_t count);
  // Of all that was added; the end of this object's use.
  Digest digest();

 private:
  OpenSslErrorsKept kept_;
  OpenSslPointer<EVP_MD_CTX, EVP_MD_CTX_free> context_;
};

}  // namespace QVSa::platform
