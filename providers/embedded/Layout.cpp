#include "providers/embedded/Layout.h"

namespace QVSa::embedded {

std::filesystem::path databaseFile(const std::filesystem::path& folder, const std::string& database) {
  return folder / (database + ".db");
}

std::filesystem::path lockFile(const std::filesystem::path& folder, const std::string& database) {
  return folder / (database + ".lock");
}

}  // namespace QVSa::embedded
