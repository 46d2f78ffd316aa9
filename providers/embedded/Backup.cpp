#include "providers/embedded/Backup.h"

#include <cerrno>
#include <fcntl.h>
#include <random>
#include <sys/stat.h>
#include <system_error>
#include <unistd.h>

#include "platform/Files.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

namespace fs = std::filesystem;

constexpr mode_t fileMode = S_IRUSR | S_IWUSR | S_IRGRP | S_IWGRP;

Failure terminated(const std::string& reason) {
  return tsql::sqlFailure(3013, reason + " BACKUP DATABASE is terminating abnormally.");
}

Failure cannotWrite(const String& path) {
  return terminated("Write on '" + path + "' failed: " + std::generic_category().message(errno) + ".");
}

bool sync(const fs::path& path, int flags) {
  const int file = ::open(path.c_str(), flags | O_CLOEXEC);
  if (file < 0) return false;
  const bool done = ::fsync(file) == 0;
  const int reason = errno;
  ::close(file);
  errno = reason;
  return done;
}

// A new empty file beside the target, which goes again unless it was moved to its place.
class PassingFile {
 public:
  explicit PassingFile(const String& path) : path_(path), target_(platform::localPath(path)), beside_(target_) {
    std::random_device random;
    beside_ += "." + std::to_string(random()) + ".new";
    const int file = ::open(beside_.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, fileMode);
    if (file < 0) throw cannotOpenDevice(path, errno);
    ::close(file);
  }
  ~PassingFile() { ::unlink(beside_.c_str()); }
  PassingFile(const PassingFile&) = delete;
  PassingFile& operator=(const PassingFile&) = delete;

  std::string name() const { return beside_.string(); }

  void moveToTarget() {
    if (!sync(beside_, O_RDONLY)) throw cannotWrite(path_);
    if (::rename(beside_.c_str(), target_.c_str()) != 0) throw cannotOpenDevice(path_, errno);
    const fs::path folder = target_.has_parent_path() ? target_.parent_path() : fs::path(".");
    if (!sync(folder, O_RDONLY | O_DIRECTORY)) throw cannotWrite(path_);
  }

 private:
  String path_;
  fs::path target_;
  fs::path beside_;
};

}  // namespace

// On a handle of its own: the session's may have row sets or a transaction open, in which the library makes no copy.
void backUp(const Handle& handle, std::size_t database, const String& path) {
  PassingFile file(path);
  Handle source(handle.folder());
  source.deadline(handle.deadline());
  try {
    Prepared copy(source.get(), std::string("vacuum \"") + databaseNames[database] + "\" into ?");
    copy.bind(1, file.name());
    copy.step();
  } catch (const Failure& failure) {
    if (failure.number() == number::timeout) throw;
    throw terminated(failure.description());
  }
  file.moveToTarget();
}

}  // namespace QVSa::embedded
