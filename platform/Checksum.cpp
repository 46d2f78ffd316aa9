#include "platform/Checksum.h"

#include <zlib.h>

namespace QVSa::platform {

std::uint32_t crc32(std::uint32_t before, std::span<const std::uint8_t> bytes) {
  // For no address at all the library would answer with its start value.
  if (bytes.empty()) return before;
  return static_cast<std::uint32_t>(::crc32_z(before, bytes.data(), bytes.size()));
}

}  // namespace QVSa::platform
