#pragma once

#include <cstdint>
#include <span>

#include "QVSa/values/Values.h"
#include "platform/FileDescriptor.h"

namespace QVSa::platform {

// A file that is read from its beginning to its end, in blocks. Throws Failure with the run-time's numbers: 53 file not
// found, 76 path not found, 70 access denied, 75 path/file access.
class FileReader {
 public:
  explicit FileReader(const String& path);
  // Of a file that is open for reading.
  explicit FileReader(FileDescriptor file) : file_(std::move(file)) {}

  // Fills the block as far as the file goes, and tells how far; 0 at its end.
  std::size_t read(std::span<std::uint8_t> block);

 private:
  FileDescriptor file_;
};

}  // namespace QVSa::platform
