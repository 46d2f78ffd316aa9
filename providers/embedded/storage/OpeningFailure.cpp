#include "providers/embedded/storage/OpeningFailure.h"

#include <algorithm>
#include <cerrno>
#include <system_error>
#include <unistd.h>

#include "providers/embedded/storage/Layout.h"
#include "providers/embedded/storage/StorageFailure.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

namespace fs = std::filesystem;

constexpr const char* giveRights = "Give this program's account the rights of the installation's group.";
constexpr const char* makeRoom = "Make room on the disk.";

Failure told(const fs::path& file, const std::string& wrong, const std::string& advice) {
  return tsql::sqlFailure(cannotOpenDatabase, "Cannot open database \"" + file.stem().string() + "\": " + wrong + " (" +
                                                  file.string() + "). " + advice);
}

// Not one that this user may not see.
bool isMissing(const fs::path& file) {
  return ::access(file.c_str(), F_OK) != 0 && (errno == ENOENT || errno == ENOTDIR);
}

}  // namespace

Failure cannotOpen(const fs::path& folder, std::size_t database, const std::string& wrong, const std::string& advice) {
  return told(databaseFile(folder, databaseNames[database]), wrong, advice);
}

Failure cannotOpen(const fs::path& folder, std::size_t database, const std::string& wrong) {
  return cannotOpen(folder, database, wrong,
                    database == 0
                        ? "Put the right file there, or make a new installation and restore the backups there."
                        : "Put the right file there, or restore a backup as the administrator.");
}

Failure cannotOpen(const fs::path& folder, std::size_t database, sqlite3* handle, int code) {
  requireMemory(code);
  const int system = sqlite3_system_errno(handle);
  const bool isFull = system == ENOSPC || system == EDQUOT || system == EFBIG;
  if (isFull || (code & 0xFF) == SQLITE_FULL) return cannotOpen(folder, database, "there is no room", makeRoom);
  if (isMissing(databaseFile(folder, databaseNames[database])))
    return cannotOpen(folder, database, "the file is missing");
  switch (code & 0xFF) {
    case SQLITE_NOTADB:
      return cannotOpen(folder, database, "the file is no database");
    case SQLITE_CORRUPT:
      return cannotOpen(folder, database, "the file is damaged");
    case SQLITE_READONLY:
      return cannotOpen(folder, database, "the file or its folder is read-only for this user", giveRights);
    case SQLITE_CANTOPEN:
      if (system == 0)
        return cannotOpen(folder, database, "the file or its folder cannot be written by this user", giveRights);
      break;
    case SQLITE_BUSY:
      return cannotOpen(folder, database, "another process keeps the file locked", "Try again when it has ended.");
    case SQLITE_DONE:
    case SQLITE_ERROR:
      return cannotOpen(folder, database, "the file is no database of this system");
    default:
      break;
  }
  if (system == EACCES || system == EPERM || system == EROFS)
    return cannotOpen(folder, database, std::generic_category().message(system), giveRights);
  return cannotOpen(
      folder, database,
      system == 0 ? "the file cannot be read, code " + std::to_string(code) : std::generic_category().message(system));
}

Failure cannotOpenLockFile(const fs::path& file) {
  const int reason = errno;
  return told(file, "its lock file: " + std::generic_category().message(reason),
              reason == ENOENT ? "Make an empty one while no program uses the installation." : giveRights);
}

std::optional<Failure> missingMaster(const fs::path& folder) {
  const auto lacks = [&](const char* database) { return isMissing(databaseFile(folder, database)); };
  if (!lacks(databaseNames[0])) return std::nullopt;
  if (!std::ranges::all_of(databaseNames, lacks)) return cannotOpen(folder, 0, "the file is missing");
  return tsql::sqlFailure(17, "SQL Server does not exist or access denied. There is no installation in " +
                                  folder.string() + ": name the folder of one, or make it.");
}

}  // namespace QVSa::embedded
