#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

struct evp_md_ctx_st;

namespace QVSa::platform {

// SHA-256 of bytes that come piece by piece. Throws 51 where the digest can't be computed.
class Sha256 {
 public:
  using Digest = std::array<std::uint8_t, 32>;

  Sha256();
  ~Sha256();
  Sha256(const Sha256&) = delete;
  Sha256& operator=(const Sha256&) = delete;

  void add(const void* bytes, std::size_t count);
  // Of all that was added; the end of this object's use.
  Digest digest();

 private:
  evp_md_ctx_st* context_;
};

}  // namespace QVSa::platform
