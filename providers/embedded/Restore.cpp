#include "providers/embedded/Restore.h"

#include "providers/embedded/StorageFailure.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

constexpr std::chrono::seconds checkpointLimit{1};

// In one step: in several, another writer would make it start over.
void copyAll(Handle& target, std::size_t database, sqlite3* source) {
  sqlite3_backup* const copy = sqlite3_backup_init(target.get(), databaseNames[database], source, "main");
  if (copy == nullptr) throwStorageFailure(target.get(), sqlite3_extended_errcode(target.get()));
  const int code = sqlite3_backup_step(copy, -1);
  const int end = sqlite3_backup_finish(copy);
  if (code == SQLITE_DONE && end == SQLITE_OK) return;
  throwStorageFailure(target.get(), code == SQLITE_DONE ? end : code);
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

}  // namespace

void restoreCopy(const Handle& handle, std::size_t database, const String& path) {
  BackupFile copy(path, handle.deadline());
  if (!copy.isOf(database))
    throw tsql::sqlFailure(
        3234, "The copy on device '" + path + "' is not one of database '" + databaseNames[database] + "'.");
  copy.check();
  Handle target(handle.folder());
  target.deadline(handle.deadline());
  try {
    copyAll(target, database, copy.get());
  } catch (const Failure& failure) {
    if (failure.number() == number::timeout) throw;
    throw tsql::sqlFailure(3013, failure.description() + " RESTORE DATABASE is terminating abnormally.");
  }
  emptyLog(target, database);
}

}  // namespace QVSa::embedded
