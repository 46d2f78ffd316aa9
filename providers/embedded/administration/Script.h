#pragma once

#include <filesystem>
#include <string>

namespace QVSa::embedded {

// Runs a T-SQL script, batch by batch between its GO lines, in one database of an installation whose files are there.
void runScript(const std::filesystem::path& folder, const std::string& database, const std::string& script);

}  // namespace QVSa::embedded
