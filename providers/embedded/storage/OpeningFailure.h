#pragma once

#include <filesystem>
#include <optional>
#include <sqlite3.h>
#include <string>

#include "QVSa/values/Failure.h"

namespace QVSa::embedded {

inline constexpr Long cannotOpenDatabase = 4060;

// 4060 for a database of the installation in this folder: what is wrong, its file, and what to do.
Failure cannotOpen(const std::filesystem::path& folder, std::size_t database, const std::string& wrong,
                   const std::string& advice);
// The same for a file that is not what it should be: to be replaced by the right one, or by a backup.
Failure cannotOpen(const std::filesystem::path& folder, std::size_t database, const std::string& wrong);
// The same by the code that SQLite gave when it opened or read the file.
Failure cannotOpen(const std::filesystem::path& folder, std::size_t database, sqlite3* handle, int code);

// The same for the lock file of a database, by errno.
Failure cannotOpenLockFile(const std::filesystem::path& file);

// 17 where the folder holds no file of an installation, 4060 where it lacks that of master only; nothing where it is
// there.
std::optional<Failure> missingMaster(const std::filesystem::path& folder);

}  // namespace QVSa::embedded
