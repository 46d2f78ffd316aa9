#pragma once

#include <array>
#include <cstddef>
#include <filesystem>
#include <string>

#include "platform/InstallationFiles.h"

namespace QVSa::embedded {

// In the order in which a handle attaches them.
using platform::databaseNames;

// The layout of the files that this build writes, and the mark that tells an installation's file from any other.
// Each file holds engine(layout, catalogue), one row: its layout and a count of changed definitions; definitions(name,
// text), the T-SQL of its objects; and gate(n), empty, which is written to where the write lock has to be taken and
// nothing else is to change. The library's user_version says which database it is: its place above plus 1; 0 in some
// files of layout 1. Upgrade.cpp has what brings a file from one layout to the next.
inline constexpr int layoutVersion = 2;
inline constexpr int applicationId = 0x51565361;

std::filesystem::path databaseFile(const std::filesystem::path& folder, const std::string& database);
// The database's two files by their names in T-SQL: its data and its log.
struct NamedFile {
  std::string name;
  std::string path;
};
std::array<NamedFile, 2> filesOf(const std::filesystem::path& folder, const std::string& database);

// What is wrong with a folder whose absolute path, and `spare` bytes more, is too long for SQLite; empty
// where it is not.
std::string lengthProblem(const std::filesystem::path& folder, std::size_t spare = 0);

std::filesystem::path lockFile(const std::filesystem::path& folder, const std::string& database);

}  // namespace QVSa::embedded
