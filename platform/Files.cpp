#include "platform/Files.h"

#include <algorithm>
#include <cerrno>
#include <ctime>
#include <fcntl.h>
#include <random>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

#include "platform/SystemFailure.h"

namespace QVSa::platform {

namespace {

class Descriptor {
 public:
  Descriptor(const std::filesystem::path& path, int flags) : handle_(::open(path.c_str(), flags | O_CLOEXEC)) {}
  Descriptor(const Descriptor&) = delete;
  Descriptor& operator=(const Descriptor&) = delete;
  ~Descriptor() {
    if (isOpen()) ::close(handle_);
  }

  bool isOpen() const { return handle_ >= 0; }
  int handle() const { return handle_; }

 private:
  int handle_;
};

[[noreturn]] void fail(const std::filesystem::path& file) { throw fileFailure(errno, file); }

std::filesystem::path nameBeside(const std::filesystem::path& target) {
  std::random_device random;
  std::filesystem::path path = target;
  path += "." + std::to_string(random()) + std::to_string(random()) + ".new";
  return path;
}

}  // namespace

std::filesystem::path localPath(const String& path) {
  String local = path;
  std::ranges::replace(local, '\\', '/');
  return local;
}

Bytes readFile(const String& path) {
  const std::filesystem::path source = localPath(path);
  const Descriptor file(source, O_RDONLY);
  struct stat state {};
  if (!file.isOpen() || ::fstat(file.handle(), &state) != 0) fail(source);
  Bytes content(static_cast<std::size_t>(state.st_size) + 1);
  std::size_t size = 0;
  while (true) {
    const ssize_t count = ::read(file.handle(), content.data() + size, content.size() - size);
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

NewFile::NewFile(const String& path) : target_(localPath(path)), beside_(nameBeside(target_)) {
  if (const int reason = reasonAgainstReplacing(target_); reason != 0) {
    errno = reason;
    fail(target_);
  }
  handle_ = ::open(beside_.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0666);
  if (handle_ < 0) fail(target_);
}

NewFile::~NewFile() {
  if (handle_ < 0) return;
  ::close(handle_);
  ::unlink(beside_.c_str());
}

void NewFile::write(std::string_view bytes) {
  while (!bytes.empty()) {
    const ssize_t count = ::write(handle_, bytes.data(), bytes.size());
    if (count < 0 && errno == EINTR) continue;
    if (count < 0) fail(target_);
    bytes.remove_prefix(static_cast<std::size_t>(count));
  }
}

void NewFile::keep() {
  if (::fsync(handle_) != 0 || ::rename(beside_.c_str(), target_.c_str()) != 0) fail(target_);
  ::close(std::exchange(handle_, -1));
  if (!syncFolderOf(target_)) fail(target_);
}

int reasonAgainstReplacing(const std::filesystem::path& target) {
  if (!target.has_filename()) return EINVAL;
  struct stat state {};
  if (::stat(target.c_str(), &state) != 0) return 0;
  if (!S_ISREG(state.st_mode)) return S_ISDIR(state.st_mode) ? EISDIR : EINVAL;
  return ::access(target.c_str(), W_OK) == 0 ? 0 : errno;
}

bool syncFolderOf(const std::filesystem::path& file) {
  const Descriptor folder(file.has_parent_path() ? file.parent_path() : ".", O_RDONLY | O_DIRECTORY);
  if (folder.isOpen() && ::fsync(folder.handle()) == 0) return true;
  return errno == EINVAL || errno == ENOTSUP || errno == EACCES;
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
