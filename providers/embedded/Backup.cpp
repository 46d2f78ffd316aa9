#include "providers/embedded/Backup.h"

#include <system_error>

#include "platform/NewFile.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

Failure terminated(const std::string& reason) {
  return tsql::sqlFailure(3013, reason + " BACKUP DATABASE is terminating abnormally.");
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
    throw terminated("Write on '" + path + "' failed: " + std::generic_category().message(failure.native()) + ".");
  }
}

}  // namespace

// On a handle of its own: the session's may have row sets or a transaction open, in which the library makes no copy.
void backUp(const Handle& handle, std::size_t database, const String& path) {
  platform::NewFile file = openDevice(path);
  Handle source(handle.folder());
  source.deadline(handle.deadline());
  try {
    Prepared copy(source.get(), std::string("vacuum \"") + databaseNames[database] + "\" into ?");
    copy.bind(1, file.name().string());
    copy.step();
  } catch (const Failure& failure) {
    if (failure.number() == number::timeout) throw;
    throw terminated(failure.description());
  }
  keep(file, path);
}

}  // namespace QVSa::embedded
