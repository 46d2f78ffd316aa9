#include "platform/FileReader.h"

#include <cerrno>
#include <fcntl.h>

#include "platform/Files.h"
#include "platform/SystemFailure.h"

namespace QVSa::platform {

FileReader::FileReader(const String& path) : file_(::open(localPath(path).c_str(), O_RDONLY | O_CLOEXEC)) {
  if (!file_.isOpen()) throw fileFailure(errno, localPath(path));
}

std::size_t FileReader::read(std::span<std::uint8_t> block) {
  std::size_t filled = 0;
  while (filled < block.size()) {
    const ssize_t count = ::read(file_.get(), block.data() + filled, block.size() - filled);
    if (count < 0 && errno == EINTR) continue;
    if (count < 0) throw runtimeFailure(number::pathAccess);
    if (count == 0) break;
    filled += static_cast<std::size_t>(count);
  }
  return filled;
}

}  // namespace QVSa::platform
