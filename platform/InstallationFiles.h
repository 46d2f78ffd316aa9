#pragma once

#include <array>
#include <filesystem>

namespace QVSa::platform {

// The databases of an embedded installation: each is a file NAME.db with what SQLite keeps beside it, and
// a file NAME.lock.
inline constexpr std::array<const char*, 4> databaseNames = {"master", "QVSys", "QVApp", "QVUpdate"};

// Whether the path is that of such a file, there or not, in the folder of an installation. Nothing is opened: that
// would cost a process that has the database open its locks.
bool isOfInstallation(const std::filesystem::path& file);

}  // namespace QVSa::platform
