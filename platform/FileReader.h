#pragma once

#include <cstdint>
#include <span>

#include "QVSa/frame/Values.h"

namespace QVSa::platform {

// A file that is read from its beginning to its end, in blocks. Throws Failure with the run-time's numbers: 53 file not
// found, 76 path not found, 70 access denied, 75 path/file access.
class FileReader {
 public:
  explicit FileReader(const String& path);
  ~FileReader();
  FileReader(const FileReader&) = delete;
  FileReader& operator=(const FileReader&) = delete;

  // Fills the block as far as the file goes, and tells how far; 0 at its end.
  std::size_t read(std::span<std::uint8_t> block);

 private:
  int handle_;
};

}  // namespace QVSa::platform
