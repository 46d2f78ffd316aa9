#include "platform/Folders.h"

#include <algorithm>
#include <cerrno>
#include <filesystem>
#include <sys/stat.h>
#include <system_error>

#include "QVSa/frame/Failure.h"
#include "platform/Files.h"

namespace QVSa::platform {

namespace {

namespace fs = std::filesystem;

constexpr Long fileExistsAlready = 58;
// Backups hold what the database holds: no access for others.
constexpr mode_t folderMode = S_IRWXU | S_IRWXG;

[[noreturn]] void fail(int code) {
  switch (code) {
    case EEXIST:
      throw runtimeFailure(fileExistsAlready);
    case ENOENT:
    case ENOTDIR:
      throw runtimeFailure(number::noPath);
    case EACCES:
    case EPERM:
    case EROFS:
      throw runtimeFailure(number::accessDenied);
    default:
      throw runtimeFailure(number::pathAccess);
  }
}

void require(const std::error_code& error) {
  if (error) fail(error.value());
}

std::vector<String> namesIn(const String& path, fs::file_type type) {
  std::vector<String> names;
  std::error_code error;
  // An entry that vanished meanwhile is none of the wanted type.
  std::error_code ignored;
  for (fs::directory_iterator entry(localPath(path), error), end; !error && entry != end; entry.increment(error))
    if (entry->status(ignored).type() == type) names.push_back(entry->path().filename().string());
  require(error);
  std::ranges::sort(names);
  return names;
}

}  // namespace

bool fileExists(const String& path) {
  std::error_code ignored;
  return fs::is_regular_file(localPath(path), ignored);
}

bool folderExists(const String& path) {
  std::error_code ignored;
  return fs::is_directory(localPath(path), ignored);
}

void makeFolder(const String& path) {
  if (::mkdir(localPath(path).c_str(), folderMode) != 0) fail(errno);
}

std::vector<String> foldersIn(const String& path) { return namesIn(path, fs::file_type::directory); }

std::vector<String> filesIn(const String& path) { return namesIn(path, fs::file_type::regular); }

void removeFolder(const String& path) {
  std::error_code error;
  fs::remove_all(localPath(path), error);
  require(error);
}

}  // namespace QVSa::platform
