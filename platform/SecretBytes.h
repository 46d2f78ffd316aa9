#pragma once

#include <memory>
#include <openssl/crypto.h>
#include <optional>
#include <vector>

#include "QVSa/values/Values.h"

namespace QVSa::platform {

template <typename T>
struct ClearingAllocator {
  using value_type = T;

  ClearingAllocator() = default;
  template <typename U>
  ClearingAllocator(const ClearingAllocator<U>&) {}

  T* allocate(std::size_t count) { return std::allocator<T>().allocate(count); }
  void deallocate(T* data, std::size_t count) {
    OPENSSL_cleanse(data, count * sizeof(T));
    std::allocator<T>().deallocate(data, count);
  }
  friend bool operator==(ClearingAllocator, ClearingAllocator) { return true; }
};

// Bytes of keys, passwords and plain texts: their memory is overwritten before it is given back.
using SecretBytes = std::vector<std::uint8_t, ClearingAllocator<std::uint8_t>>;

// The text in UTF-16, low byte first, without mark or terminator. Bytes that are no UTF-8 read as U+FFFD.
SecretBytes toUtf16Bytes(const String& text);

// The reverse. Nothing for an odd number of bytes and for a surrogate without its partner.
std::optional<String> fromUtf16Bytes(const SecretBytes& bytes);

}  // namespace QVSa::platform
