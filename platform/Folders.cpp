#include "platform/Folders.h"

#include <algorithm>
#include <cerrno>
#include <filesystem>
#include <sys/stat.h>
#include <system_error>

#include "platform/Files.h"
#include "platform/SystemFailure.h"

namespace QVSa::platform {

namespace {

namespace fs = std::filesystem;

// Backups hold what the database holds: no access for others.
constexpr mode_t folderMode = S_IRWXU | S_IRWXG;

void require(const std::error_code& error) {
  if (error) throw folderFailure(error.value());
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
  if (::mkdir(localPath(path).c_str(), folderMode) != 0) throw folderFailure(errno);
}

std::vector<String> foldersIn(const String& path) { return namesIn(path, fs::file_type::directory); }

std::vector<String> filesIn(const String& path) { return namesIn(path, fs::file_type::regular); }

void removeFolder(const String& path) {
  std::error_code error;
  fs::remove_all(localPath(path), error);
  require(error);
}

}  // namespace QVSa::platform
