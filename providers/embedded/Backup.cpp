#include "providers/embedded/Backup.h"

#include <algorithm>
#include <cerrno>
#include <fcntl.h>
#include <sys/stat.h>
#include <system_error>
#include <unistd.h>

#include "platform/Files.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

namespace fs = std::filesystem;

constexpr mode_t fileMode = S_IRUSR | S_IWUSR | S_IRGRP | S_IWGRP;
// Far behind the bytes that the storage library locks in the same file.
constexpr off_t lockByte = off_t{1} << 62;

Failure terminated(const std::string& reason) {
  return tsql::sqlFailure(3013, reason + " BACKUP DATABASE is terminating abnormally.");
}

Failure cannotWrite(const String& path) {
  return terminated("Write on '" + path + "' failed: " + std::generic_category().message(errno) + ".");
}

// A file of a database, there or not: what lies in their folder and is named as they are.
bool isOfInstallation(const fs::path& target, const fs::path& folder) {
  std::error_code error;
  if (!fs::equivalent(target.has_parent_path() ? target.parent_path() : ".", folder, error)) return false;
  const std::string name = target.filename().string();
  return std::ranges::any_of(databaseNames, [&](const std::string& database) {
    return name.starts_with(database + ".db") || name == database + ".lock";
  });
}

class Descriptor {
 public:
  explicit Descriptor(int file) : file_(file) {}
  ~Descriptor() {
    if (file_ >= 0) ::close(file_);
  }
  Descriptor(const Descriptor&) = delete;
  Descriptor& operator=(const Descriptor&) = delete;
  int get() const { return file_; }

 private:
  int file_;
};

// The new content beside its target, which goes again unless it was moved to its place. Its name is always the same, so
// that the next backup takes over what a killed one left; a lock tells that from one that is being written.
class PassingFile {
 public:
  PassingFile(const String& path, const fs::path& installation)
      : path_(path),
        target_(platform::localPath(path)),
        beside_(target_.string() + ".new"),
        file_(openBeside(installation)) {
    if (const int reason = reasonAgainstTaking(); reason != 0) throw cannotOpenDevice(path_, reason);
    discard(journal());
    if (::ftruncate(file_.get(), 0) != 0) throw cannotWrite(path_);
  }
  ~PassingFile() {
    // Once it was moved, another backup's file may bear the name.
    if (moved_) return;
    discard(journal());
    discard(beside_);
  }
  PassingFile(const PassingFile&) = delete;
  PassingFile& operator=(const PassingFile&) = delete;

  const std::string& name() const { return beside_; }

  void moveToTarget() {
    if (::fsync(file_.get()) != 0) throw cannotWrite(path_);
    if (::rename(beside_.c_str(), target_.c_str()) != 0) throw cannotOpenDevice(path_, errno);
    moved_ = true;
    if (!platform::syncFolderOf(target_)) throw cannotWrite(path_);
  }

 private:
  int openBeside(const fs::path& installation) const {
    const int reason = isOfInstallation(target_, installation) ? EBUSY : platform::reasonAgainstReplacing(target_);
    if (reason != 0) throw cannotOpenDevice(path_, reason);
    const int file = ::open(beside_.c_str(), O_RDWR | O_CREAT | O_NOFOLLOW | O_CLOEXEC, fileMode);
    if (file < 0) throw cannotOpenDevice(path_, errno);
    return file;
  }

  // Its holder may have moved or removed it between the opening and the lock: the name has to mean this file still.
  int reasonAgainstTaking() const {
    struct flock lock {};
    lock.l_type = F_WRLCK;
    lock.l_whence = SEEK_SET;
    lock.l_start = lockByte;
    lock.l_len = 1;
    if (::fcntl(file_.get(), F_OFD_SETLK, &lock) != 0) return errno;
    struct stat mine {
    }, named{};
    if (::fstat(file_.get(), &mine) != 0 || ::lstat(beside_.c_str(), &named) != 0) return errno;
    return mine.st_dev == named.st_dev && mine.st_ino == named.st_ino ? 0 : EBUSY;
  }

  std::string journal() const { return beside_ + "-journal"; }
  static void discard(const std::string& file) { ::unlink(file.c_str()); }

  String path_;
  fs::path target_;
  std::string beside_;
  Descriptor file_;  // open until the end: its lock is what keeps others away
  bool moved_ = false;
};

}  // namespace

// On a handle of its own: the session's may have row sets or a transaction open, in which the library makes no copy.
void backUp(const Handle& handle, std::size_t database, const String& path) {
  PassingFile file(path, handle.folder());
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
