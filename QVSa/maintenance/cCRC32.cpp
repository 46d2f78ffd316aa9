#include "QVSa/maintenance/cCRC32.h"

#include <array>

#include "platform/Checksum.h"
#include "platform/FileReader.h"

namespace QVSa {

Long cCRC32::GetByteArrayCrc32(const Bytes& bytes) const { return static_cast<Long>(platform::crc32(0, bytes)); }

Long cCRC32::GetFileCrc32(const String& path) const {
  platform::FileReader file(path);
  std::array<std::uint8_t, 8192> block;
  std::uint32_t sum = 0;
  for (std::size_t length = file.read(block); length > 0; length = file.read(block))
    sum = platform::crc32(sum, std::span(block).first(length));
  return static_cast<Long>(sum);
}

}  // namespace QVSa
