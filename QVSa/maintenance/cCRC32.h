#pragma once

#include "QVSa/values/Values.h"

namespace QVSa {

// The standard CRC-32 of bytes and files, its 32 bits in a Long; 0 for nothing at all.
class QVSA_EXPORT cCRC32 {
 public:
  Long GetByteArrayCrc32(const Bytes& bytes) const;
  // Throws Failure 53, 70, 75 or 76 for a file that can't be read.
  Long GetFileCrc32(const String& path) const;
};

}  // namespace QVSa
