#include "providers/embedded/Layout.h"

namespace QVSa::embedded {

std::filesystem::path databaseFile(const std::filesystem::path& folder, const std::string& database) {
  return folder / (database + ".db");
}

std::array<NamedFile, 2> filesOf(const std::filesystem::path& folder, const std::string& database) {
  const std::string data = databaseFile(folder, database).string();
  return {{{database, data}, {database + "_log", data + "-wal"}}};
}

std::filesystem::path lockFile(const std::filesystem::path& folder, const std::string& database) {
  return folder / (database + ".lock");
}

}  // namespace QVSa::embedded
