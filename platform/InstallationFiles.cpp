#include "platform/InstallationFiles.h"

#include <algorithm>
#include <string>
#include <system_error>

namespace QVSa::platform {

bool isOfInstallation(const std::filesystem::path& file) {
  const std::string name = file.filename().string();
  const bool isNamedSo = std::ranges::any_of(databaseNames, [&](const std::string& database) {
    return name.starts_with(database + ".db") || name == database + ".lock";
  });
  return isNamedSo && std::ranges::any_of(databaseNames, [&](const std::string& database) {
           std::error_code ignored;
           return std::filesystem::exists(file.parent_path() / (database + ".lock"), ignored);
         });
}

}  // namespace QVSa::platform
