#include "platform/Files.h"

#include <algorithm>
#include <cerrno>
#include <ctime>
#include <fcntl.h>
#include <sys/stat.h>

#include "platform/FileDescriptor.h"
#include "platform/NewFile.h"
#include "platform/SystemFailure.h"

namespace QVSa::platform {

namespace {

[[noreturn]] void fail(const std::filesystem::path& file) { throw fileFailure(errno, file); }

}  // namespace

std::filesystem::path localPath(const String& path) {
  // The system would take what stands before it for the whole.
  if (path.find('\0') != String::npos) throw folderFailure(EINVAL);
  String local = path;
  std::ranges::replace(local, '\\', '/');
  return local;
}

Bytes readFile(const String& path) {
  const std::filesystem::path source = localPath(path);
  const FileDescriptor file(::open(source.c_str(), O_RDONLY | O_CLOEXEC));
  struct stat state {};
  if (!file.isOpen() || ::fstat(file.get(), &state) != 0) fail(source);
  Bytes content(static_cast<std::size_t>(state.st_size) + 1);
  std::size_t size = 0;
  while (true) {
    const ssize_t count = ::read(file.get(), content.data() + size, content.size() - size);
    if (count < 0 && errno == EINTR) continue;
    if (count < 0) fail(source);
    if (count == 0) break;
    size += static_cast<std::size_t>(count);
    if (size == content.size()) content.resize(size * 2);
  }
  content.resize(size);
  return content;
}

void writeFile(const String& path, const Bytes& content) {
  NewFile file(path);
  file.write({reinterpret_cast<const char*>(content.data()), content.size()});
  file.keep();
}

std::optional<Date> lastModified(const String& path) {
  struct stat state {};
  if (::stat(localPath(path).c_str(), &state) != 0) return std::nullopt;
  std::tm parts{};
  localtime_r(&state.st_mtim.tv_sec, &parts);
  const Date second(parts.tm_year + 1900, parts.tm_mon + 1, parts.tm_mday, parts.tm_hour, parts.tm_min,
                    std::min(parts.tm_sec, 59));
  constexpr double nanosecondsOfDay = 86400e9;
  return second.addDays(static_cast<double>(state.st_mtim.tv_nsec) / nanosecondsOfDay);
}

void deleteFile(const String& path) {
  const std::filesystem::path target = localPath(path);
  if (::unlink(target.c_str()) != 0 && errno != ENOENT && errno != ENOTDIR) fail(target);
}

}  // namespace QVSa::platform
