#include "platform/PrivateFile.h"

#include <array>
#include <cerrno>
#include <fcntl.h>
#include <grp.h>
#include <sys/stat.h>

#include "platform/FileReader.h"
#include "platform/SystemFailure.h"

namespace QVSa::platform {

namespace {

constexpr std::size_t largest = std::size_t{64} * 1024;

Failure refused(const String& path, const String& why) {
  return {number::accessDenied, "Secrets", "The file of secrets " + path + " " + why};
}

void requirePrivate(const FileDescriptor& file, const String& path) {
  struct stat found {};
  if (::fstat(file.get(), &found) != 0) throw fileFailure(errno, path);
  if (!S_ISREG(found.st_mode)) throw refused(path, "is no plain file.");
  if ((found.st_mode & S_IRWXO) != 0) throw refused(path, "is open to others: chmod o= takes that away.");
}

gid_t groupNamed(const String& name) {
  struct group entry {};
  struct group* found = nullptr;
  std::array<char, std::size_t{16} * 1024> room;
  if (getgrnam_r(name.c_str(), &entry, room.data(), room.size(), &found) != 0 || found == nullptr)
    throw Failure(number::argument, "Secrets", "There is no group " + name + ".");
  return found->gr_gid;
}

void writeWhole(const FileDescriptor& file, const String& content, const String& path) {
  for (std::size_t done = 0; done < content.size();) {
    const ssize_t count = ::write(file.get(), content.data() + done, content.size() - done);
    if (count < 0 && errno == EINTR) continue;
    if (count < 0) throw fileFailure(errno, path);
    done += static_cast<std::size_t>(count);
  }
  if (::fsync(file.get()) != 0) throw fileFailure(errno, path);
}

}  // namespace

String readPrivateFile(const String& path) {
  FileDescriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
  if (!file.isOpen() && errno == EACCES) throw refused(path, "can't be read by this account.");
  if (!file.isOpen()) throw fileFailure(errno, path);
  requirePrivate(file, path);
  Bytes content(largest + 1);
  content.resize(FileReader(std::move(file)).read(content));
  if (content.size() > largest) throw refused(path, "is too large.");
  return {content.begin(), content.end()};
}

void makePrivateFile(const String& path, const String& content, const String& group) {
  const bool forGroup = !group.empty();
  const gid_t owner = forGroup ? groupNamed(group) : 0;
  const FileDescriptor file(::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0600));
  if (!file.isOpen()) throw fileFailure(errno, path);
  try {
    writeWhole(file, content, path);
    if (forGroup && (::fchown(file.get(), static_cast<uid_t>(-1), owner) != 0 || ::fchmod(file.get(), 0640) != 0))
      throw fileFailure(errno, path);
  } catch (...) {
    ::unlink(path.c_str());
    throw;
  }
}

}  // namespace QVSa::platform
