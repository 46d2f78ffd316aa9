#pragma once

#include <filesystem>
#include <string>
#include <vector>

namespace QVSa::embedded {

// The T-SQL batches that bring a database of a layout up to this build's.
std::vector<std::string> upgradeBatches(const std::string& database, int layout);

// Brings the databases of an installation that are of an older layout up to this build's, each as a whole and once no
// other session is in it; those that can't be read are left alone. Throws 4060 where others do not leave in time or a
// database can't be upgraded: that one is as it was, the others are upgraded.
void upgradeInstallation(const std::filesystem::path& folder);

}  // namespace QVSa::embedded
