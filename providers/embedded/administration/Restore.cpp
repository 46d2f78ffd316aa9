#include "providers/embedded/administration/Restore.h"

#include "providers/embedded/storage/ReplacedFile.h"
#include "providers/embedded/storage/StorageFailure.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

constexpr std::chrono::seconds checkpointLimit{1};

// In one step: in several, another writer would make it start over.
void copyAll(sqlite3* target, const char* database, sqlite3* source) {
  sqlite3_backup* const copy = sqlite3_backup_init(target, database, source, "main");
  if (copy == nullptr) throwStorageFailure(target, sqlite3_extended_errcode(target));
  const int code = sqlite3_backup_step(copy, -1);
  const int end = sqlite3_backup_finish(copy);
  if (code == SQLITE_DONE && end == SQLITE_OK) return;
  throwStorageFailure(target, code == SQLITE_DONE ? end : code);
}

// The log is as large as the database now. Where a reader holds it, a later checkpoint does the same.
void emptyLog(Handle& target, std::size_t database) {
  target.deadline(std::chrono::steady_clock::now() + checkpointLimit);
  try {
    target.execute(std::string("pragma ") + databaseNames[database] + ".wal_checkpoint(truncate)");
  } catch (...) {
    // The copy is in its place.
  }
}

void copyInto(Handle& target, std::size_t database, BackupFile& copy) {
  // What cannot be opened cannot be written to either.
  if (target.whyReplaced(database)) {
    ReplacedFile file(databaseFile(target.folder(), databaseNames[database]));
    copyAll(file.get(), "main", copy.get());
    return file.takePlace();
  }
  copyAll(target.get(), databaseNames[database], copy.get());
  emptyLog(target, database);
}

}  // namespace

void restoreCopy(const Handle& handle, std::size_t database, const String& path) {
  BackupFile copy(path, handle.deadline());
  if (!copy.isOf(database))
    throw tsql::sqlFailure(
        3234, "The copy on device '" + path + "' is not one of database '" + databaseNames[database] + "'.");
  copy.check();
  Handle target(handle.folder(), Handle::Unreadable::replaced);
  target.deadline(handle.deadline());
  try {
    copyInto(target, database, copy);
  } catch (const Failure& failure) {
    if (failure.number() == number::timeout) throw;
    throw tsql::sqlFailure(3013, failure.description() + " RESTORE DATABASE is terminating abnormally.");
  }
}

}  // namespace QVSa::embedded
