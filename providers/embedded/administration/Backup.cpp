#include "providers/embedded/administration/Backup.h"

#include <cerrno>
#include <fcntl.h>
#include <sys/stat.h>
#include <system_error>
#include <unistd.h>

#include "platform/FileDescriptor.h"
#include "platform/NewFile.h"
#include "providers/embedded/administration/BackupTrailer.h"
#include "providers/embedded/storage/StorageFailure.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

Failure terminated(const std::string& reason) {
  return tsql::sqlFailure(3013, reason + " BACKUP DATABASE is terminating abnormally.");
}

Failure cannotWrite(const String& path, int reason) {
  return terminated("Write on '" + path + "' failed: " + std::generic_category().message(reason) + ".");
}

// What the system says of the device as the server says it.
platform::NewFile openDevice(const String& path) {
  try {
    return platform::NewFile(path, platform::NewFile::Writers::one);
  } catch (const Failure& failure) {
    throw cannotOpenDevice(path, failure.native());
  }
}

void keep(platform::NewFile& file, const String& path) {
  try {
    file.keep();
  } catch (const Failure& failure) {
    throw cannotWrite(path, failure.native());
  }
}

// Appends the SHA-256 of what was written.
void seal(const platform::NewFile& file, const String& path, const Handle& handle) {
  const platform::FileDescriptor written(::open(file.name().c_str(), O_RDWR | O_CLOEXEC));
  struct stat state {};
  if (!written.isOpen() || ::fstat(written.get(), &state) != 0) throw cannotWrite(path, errno);
  const Trailer trailer = trailerOf(
      [&](void* bytes, std::size_t count, std::int64_t place) {
        if (handle.isLate()) throw timeExpired();
        if (::pread(written.get(), bytes, count, place) != static_cast<ssize_t>(count)) throw cannotWrite(path, errno);
      },
      state.st_size);
  if (::pwrite(written.get(), trailer.data(), trailer.size(), state.st_size) != static_cast<ssize_t>(trailer.size()))
    throw cannotWrite(path, errno);
}

}  // namespace

// On a handle of its own: the session's may have row sets or a transaction open, in which the library makes no copy.
void backUp(const Handle& handle, std::size_t database, const String& path) {
  platform::NewFile file = openDevice(path);
  Handle source(handle.folder(), Handle::Unreadable::replaced);
  if (const auto& reason = source.whyReplaced(database)) throw *reason;
  source.deadline(handle.deadline());
  try {
    Prepared copy(source.get(), std::string("vacuum \"") + databaseNames[database] + "\" into ?");
    copy.bind(1, file.name().string());
    copy.step();
  } catch (const Failure& failure) {
    if (failure.number() == number::timeout) throw;
    throw terminated(failure.description());
  }
  seal(file, path, handle);
  keep(file, path);
}

}  // namespace QVSa::embedded
