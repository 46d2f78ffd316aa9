#include "providers/embedded/storage/Layout.h"

#include <algorithm>
#include <new>
#include <sqlite3.h>
#include <string_view>

namespace QVSa::embedded {

namespace {

// The library adds this to the name of a database for a file of its own, and counts it in.
constexpr std::string_view longestSuffix = "-journal";

}  // namespace

std::filesystem::path databaseFile(const std::filesystem::path& folder, const std::string& database) {
  return folder / (database + ".db");
}

std::array<NamedFile, 2> filesOf(const std::filesystem::path& folder, const std::string& database) {
  const std::string data = databaseFile(folder, database).string();
  return {{{database, data}, {database + "_log", data + "-wal"}}};
}

std::string lengthProblem(const std::filesystem::path& folder, std::size_t spare) {
  std::size_t longestName = 0;
  for (const char* database : databaseNames)
    longestName = std::max(longestName, databaseFile("/", database).native().size());
  // Without memory the library does not start.
  const sqlite3_vfs* system = sqlite3_vfs_find(nullptr);
  if (system == nullptr) throw std::bad_alloc();
  const std::size_t most = static_cast<std::size_t>(system->mxPathname) - longestSuffix.size() - longestName - spare;
  const std::size_t length = folder.native().size();
  if (length <= most) return {};
  return "the path of its folder has " + std::to_string(length) + " bytes, and " + std::to_string(most) +
         " are the most";
}

std::filesystem::path lockFile(const std::filesystem::path& folder, const std::string& database) {
  return folder / (database + ".lock");
}

}  // namespace QVSa::embedded
