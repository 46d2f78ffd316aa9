#include "platform/NewFile.h"

#include <array>
#include <cerrno>
#include <chrono>
#include <csignal>
#include <fcntl.h>
#include <linux/magic.h>
#include <random>
#include <span>
#include <sys/vfs.h>
#include <sys/xattr.h>
#include <system_error>
#include <thread>

#include "platform/Checksum.h"
#include "platform/Files.h"
#include "platform/InstallationFiles.h"
#include "platform/SystemFailure.h"

namespace QVSa::platform {

namespace {

namespace fs = std::filesystem;

constexpr mode_t permissions = 07777;
constexpr mode_t forAll = 0666;
constexpr mode_t forOwnerAndGroup = 0660;
constexpr mode_t forOwner = 0600;
const std::string ending = ".new";
// What SQLite keeps beside a file that it writes.
const std::string journalEnding = "-journal";

fs::path folderOf(const fs::path& file) { return file.has_parent_path() ? file.parent_path() : "."; }

// The superuser needs no file's help to do harm.
bool othersMayWriteIn(const fs::path& folder) {
  struct stat state {};
  if (::stat(folder.c_str(), &state) != 0) return true;
  return (state.st_uid != ::geteuid() && state.st_uid != 0) || (state.st_mode & (S_IWGRP | S_IWOTH)) != 0;
}

bool isSameFile(const struct stat& a, const struct stat& b) { return a.st_dev == b.st_dev && a.st_ino == b.st_ino; }

// What a path leads to. A link of /proc to a pipe or a deleted file is the end: the open file behind it has no name.
struct Place {
  fs::path path;
  bool isNamelessFile = false;
};

bool leadsToNamelessFile(const fs::path& link, const fs::path& target) {
  struct statfs system {};
  struct stat opened {
  }, named{};
  return ::statfs(folderOf(link).c_str(), &system) == 0 && system.f_type == PROC_SUPER_MAGIC &&
         ::stat(link.c_str(), &opened) == 0 && (::lstat(target.c_str(), &named) != 0 || !isSameFile(opened, named));
}

Place placeOf(fs::path path) {
  constexpr int longestChain = 40;
  for (int i = 0; i < longestChain; ++i) {
    struct stat link {};
    if (::lstat(path.c_str(), &link) != 0 || !S_ISLNK(link.st_mode)) return {path};
    if (link.st_uid != ::geteuid() && othersMayWriteIn(folderOf(path))) throw fileFailure(EACCES, path);
    std::error_code error;
    const fs::path next = folderOf(path) / fs::read_symlink(path, error);
    if (error) throw fileFailure(error.value(), path);
    if (leadsToNamelessFile(path, next)) return {path, true};
    path = next;
  }
  throw fileFailure(ELOOP, path);
}

// Its list would be lost, and its mode mean something else without it.
bool hasAccessList(const fs::path& file) { return ::getxattr(file.c_str(), "system.posix_acl_access", nullptr, 0) > 0; }

// What an existing file is to others, the new one has to be as well.
bool giveOwnerAndMode(int file, const struct stat& old) {
  struct stat now {};
  if (::fstat(file, &now) != 0) return false;
  const bool isOwned = now.st_uid == old.st_uid && now.st_gid == old.st_gid;
  return (isOwned || ::fchown(file, old.st_uid, old.st_gid) == 0) && ::fchmod(file, old.st_mode & permissions) == 0;
}

// Far behind the bytes that SQLite locks in the same file.
bool lock(int file) {
  struct flock lock {};
  lock.l_type = F_WRLCK;
  lock.l_whence = SEEK_SET;
  lock.l_start = off_t{1} << 62;
  lock.l_len = 1;
  return ::fcntl(file, F_OFD_SETLK, &lock) == 0;
}

// The lock of the one writer; 0, or the system's reason against it. Somebody else may have had it, and removed or
// renamed the file, since it was opened: the name has to mean this file still.
int lockByName(int file, const fs::path& name) {
  struct stat mine {
  }, named{};
  if (!lock(file) || ::fstat(file, &mine) != 0 || ::lstat(name.c_str(), &named) != 0) return errno;
  return isSameFile(mine, named) ? 0 : EBUSY;
}

// 0 as well where there is none.
int removeLeft(const fs::path& name) {
  const FileDescriptor file(::open(name.c_str(), O_RDWR | O_NOFOLLOW | O_CLOEXEC));
  if (!file.isOpen()) return errno == ENOENT ? 0 : errno;
  if (const int reason = lockByName(file.get(), name); reason != 0) return reason;
  NewFile::NameBeside(name).discard();
  return 0;
}

// Always the same, so that a later writer finds what a killed one left. A long name is replaced by its checksum.
fs::path onlyNameBeside(const fs::path& target) {
  const std::string name = target.filename().string();
  const long longest = ::pathconf(folderOf(target).c_str(), _PC_NAME_MAX);
  if (longest < 0 || name.size() + ending.size() + journalEnding.size() <= static_cast<std::size_t>(longest))
    return target.string() + ending;
  const std::span bytes(reinterpret_cast<const std::uint8_t*>(name.data()), name.size());
  return target.parent_path() / (".qvsa-" + std::to_string(crc32(0, bytes)) + ending);
}

fs::path anyNameBeside(const fs::path& target) {
  std::random_device random;
  return target.parent_path() / (".qvsa-" + std::to_string(random()) + std::to_string(random()) + ending);
}

FileDescriptor create(const fs::path& name, mode_t mode) {
  return FileDescriptor(::open(name.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC, mode));
}

// A pipe is waited for a while: who reads it may be a moment late.
FileDescriptor openStraight(const Place& target) {
  constexpr std::chrono::seconds patience{5};
  constexpr std::chrono::milliseconds pause{10};
  const int flags = O_WRONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC | (target.isNamelessFile ? 0 : O_NOFOLLOW);
  struct stat state {};
  const bool isPipe = ::stat(target.path.c_str(), &state) == 0 && S_ISFIFO(state.st_mode);
  const auto end = std::chrono::steady_clock::now() + patience;
  FileDescriptor file(::open(target.path.c_str(), flags));
  while (isPipe && !file.isOpen() && errno == ENXIO && std::chrono::steady_clock::now() < end) {
    std::this_thread::sleep_for(pause);
    file = FileDescriptor(::open(target.path.c_str(), flags));
  }
  if (!file.isOpen() || ::fcntl(file.get(), F_SETFL, 0) != 0) throw fileFailure(errno, target.path);
  return file;
}

bool writeAll(int file, std::string_view bytes) {
  while (!bytes.empty()) {
    const ssize_t count = ::write(file, bytes.data(), bytes.size());
    if (count < 0 && errno == EINTR) continue;
    if (count < 0) return false;
    bytes.remove_prefix(static_cast<std::size_t>(count));
  }
  return true;
}

bool copyAll(int from, int to) {
  std::array<char, 65'536> block;
  off_t at = 0;
  while (true) {
    const ssize_t count = ::pread(from, block.data(), block.size(), at);
    if (count < 0 && errno == EINTR) continue;
    if (count <= 0) return count == 0;
    if (!writeAll(to, {block.data(), static_cast<std::size_t>(count)})) return false;
    at += count;
  }
}

// While it lives, a pipe whose reader went is an error of the write and no signal, which would end the host.
class PipeSignalBlocked {
 public:
  PipeSignalBlocked() {
    sigemptyset(&pipe_);
    sigaddset(&pipe_, SIGPIPE);
    sigset_t pending;
    sigpending(&pending);
    wasPending_ = sigismember(&pending, SIGPIPE) == 1;
    pthread_sigmask(SIG_BLOCK, &pipe_, &before_);
  }
  ~PipeSignalBlocked() {
    constexpr timespec now{};
    if (!wasPending_) sigtimedwait(&pipe_, nullptr, &now);
    pthread_sigmask(SIG_SETMASK, &before_, nullptr);
  }
  PipeSignalBlocked(const PipeSignalBlocked&) = delete;
  PipeSignalBlocked& operator=(const PipeSignalBlocked&) = delete;

 private:
  sigset_t pipe_;
  sigset_t before_;
  bool wasPending_;
};

}  // namespace

bool syncFolderOf(const fs::path& file) {
  const FileDescriptor folder(::open(folderOf(file).c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
  if (folder.isOpen() && ::fsync(folder.get()) == 0) return true;
  return errno == EINVAL || errno == ENOTSUP || errno == EACCES;
}

NewFile::NameBeside::NameBeside(fs::path file) : name(std::move(file)), journal(name.string() + journalEnding) {}

void NewFile::NameBeside::discard() const noexcept {
  ::unlink(journal.c_str());
  ::unlink(name.c_str());
}

fs::path behindLinks(const fs::path& path) { return placeOf(path).path; }

void removeUnfinished(const String& target) { removeLeft(onlyNameBeside(localPath(target))); }

NewFile::NewFile(const String& path, Writers writers) {
  const Place place = placeOf(localPath(path));
  target_ = place.path;
  if (!target_.has_filename()) fail(EINVAL);
  if (isOfInstallation(target_))
    throw Failure(number::accessDenied, "QVSa", "A file of an installation is not written over", EBUSY);
  struct stat old {};
  const bool isThere = ::stat(target_.c_str(), &old) == 0;
  if (isThere && S_ISDIR(old.st_mode)) fail(EISDIR);
  const bool canBeReplaced = S_ISREG(old.st_mode) && !place.isNamelessFile && !hasAccessList(target_);
  if (!isThere || canBeReplaced) {
    if (isThere && ::faccessat(AT_FDCWD, target_.c_str(), W_OK, AT_EACCESS) != 0) fail(errno);
    const int reason = openBeside(writers, isThere ? &old : nullptr);
    if (reason == 0) return;
    if (!isThere || (reason != EACCES && reason != EPERM && reason != EROFS)) fail(reason);
  }
  straight_ = openStraight(place);
  if (writers == Writers::one && S_ISREG(old.st_mode) && !lock(straight_.get())) fail(errno);
  openInTemporaryFolder();
}

// 0, or the system's reason.
int NewFile::openBeside(Writers writers, const struct stat* old) {
  const bool isOnlyOne = writers == Writers::one;
  const fs::path name = isOnlyOne ? onlyNameBeside(target_) : anyNameBeside(target_);
  NameBeside beside(name);
  if (isOnlyOne) {
    // One that another account writes, say: that is no reason to write past it.
    const int reason = removeLeft(name);
    if (reason != 0) return reason == EACCES || reason == EPERM ? EBUSY : reason;
  }
  FileDescriptor file = create(name, old != nullptr ? forOwner : isOnlyOne ? forOwnerAndGroup : forAll);
  if (!file.isOpen()) return errno;
  if (isOnlyOne)
    if (const int reason = lockByName(file.get(), name); reason != 0) return reason;
  if (old != nullptr && !giveOwnerAndMode(file.get(), *old)) {
    beside.discard();
    return EPERM;
  }
  beside_ = std::move(beside);
  file_ = std::move(file);
  return 0;
}

void NewFile::openInTemporaryFolder() {
  std::error_code error;
  const fs::path folder = fs::temp_directory_path(error);
  if (error) fail(error.value());
  NameBeside beside(anyNameBeside(folder / ""));
  file_ = create(beside.name, forOwner);
  if (!file_.isOpen()) fail(errno);
  beside_ = std::move(beside);
}

NewFile::~NewFile() {
  if (beside_) beside_->discard();
}

void NewFile::write(std::string_view bytes) {
  if (!writeAll(file_.get(), bytes)) fail(errno);
}

void NewFile::keep() {
  if (straight_.isOpen()) return copyToTarget();
  if (::fsync(file_.get()) != 0) fail(errno);
  if (::rename(name().c_str(), target_.c_str()) != 0) {
    // A file that is a mount point by itself.
    if (errno != EBUSY) fail(errno);
    straight_ = openStraight({target_});
    return copyToTarget();
  }
  // From here on another writer's file may bear the name.
  beside_.reset();
  file_ = FileDescriptor();
  if (!syncFolderOf(target_)) fail(errno);
}

void NewFile::copyToTarget() {
  const PipeSignalBlocked blocked;
  // What is no plain file can be neither cut nor synced.
  if (::ftruncate(straight_.get(), 0) != 0 && errno != EINVAL) fail(errno);
  if (!copyAll(file_.get(), straight_.get())) fail(errno);
  if (::fsync(straight_.get()) != 0 && errno != EINVAL && errno != ENOTSUP && errno != EROFS) fail(errno);
}

void NewFile::fail(int systemError) const { throw fileFailure(systemError, target_); }

}  // namespace QVSa::platform
