#include "providers/embedded/StorageFailure.h"

#include <new>
#include <optional>
#include <sqlite3.h>
#include <string>

#include "providers/embedded/Functions.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

using tsql::sqlFailure;

Failure deadlock() {
  return sqlFailure(
      1205,
      "Transaction was deadlocked on lock resources with another process and has been chosen as the deadlock "
      "victim. Rerun the transaction.");
}

// "UNIQUE constraint failed: users.userLogin, users.deptId": the columns behind the colon.
std::string constrainedColumns(const std::string& message) {
  const std::size_t colon = message.find(": ");
  return colon == std::string::npos ? std::string() : message.substr(colon + 2);
}

std::string tableOf(const std::string& columns) { return columns.substr(0, columns.find('.')); }

std::string columnText(sqlite3_stmt* statement, int ordinal) {
  const unsigned char* const text = sqlite3_column_text(statement, ordinal);
  return text == nullptr ? std::string() : std::string(reinterpret_cast<const char*>(text));
}

// The name of the unique index over these columns, if it was made by "create index" and not by a key of the table. The
// library's message names the columns only. In a file the name stands behind its table's and a point.
std::optional<std::string> madeIndex(sqlite3* handle, const std::string& columns) {
  static constexpr char query[] =
      "select l.name from pragma_database_list d cross join pragma_index_list(?1, d.name) l "
      "where l.\"unique\" and l.origin='c' and "
      "(select group_concat(?1||'.'||i.name, ', ') from pragma_index_info(l.name, d.name) i)=?2";
  sqlite3_stmt* statement = nullptr;
  if (sqlite3_prepare_v2(handle, query, -1, &statement, nullptr) != SQLITE_OK) return std::nullopt;
  const std::string table = tableOf(columns);
  sqlite3_bind_text(statement, 1, table.c_str(), -1, SQLITE_TRANSIENT);
  sqlite3_bind_text(statement, 2, columns.c_str(), -1, SQLITE_TRANSIENT);
  std::optional<std::string> name;
  if (sqlite3_step(statement) == SQLITE_ROW) name = columnText(statement, 0);
  sqlite3_finalize(statement);
  if (name) name->erase(0, name->rfind('.') + 1);
  return name;
}

Failure duplicate(sqlite3* handle, int code, const std::string& message) {
  const std::string columns = constrainedColumns(message);
  const std::string table = tableOf(columns);
  if (const auto index = madeIndex(handle, columns))
    return sqlFailure(2601,
                      "Cannot insert duplicate key row in object '" + table + "' with unique index '" + *index + "'.");
  const std::string kind = code == SQLITE_CONSTRAINT_UNIQUE ? "UNIQUE KEY" : "PRIMARY KEY";
  return sqlFailure(2627, "Violation of " + kind + " constraint. Cannot insert duplicate key in object '" + table +
                              "'. (column " + columns + ")");
}

Failure missingValue(const std::string& message) {
  const std::string column = constrainedColumns(message);
  return sqlFailure(515, "Cannot insert the value NULL into column '" + column.substr(column.find('.') + 1) +
                             "', table '" + tableOf(column) + "'; column does not allow nulls.");
}

Failure constraintFailure(sqlite3* handle, int code, const std::string& message) {
  switch (code) {
    case SQLITE_CONSTRAINT_NOTNULL:
      return missingValue(message);
    case SQLITE_CONSTRAINT_UNIQUE:
    case SQLITE_CONSTRAINT_PRIMARYKEY:
    case SQLITE_CONSTRAINT_ROWID:
      return duplicate(handle, code, message);
    default:
      return Failure(number::integrity, "SQL Server", message);
  }
}

Failure busy(sqlite3* handle, int code) {
  const bool writes = sqlite3_txn_state(handle, nullptr) == SQLITE_TXN_WRITE;
  return writes || code == SQLITE_BUSY_SNAPSHOT ? deadlock() : timeExpired();
}

Failure failureOf(sqlite3* handle, int code, const std::string& message) {
  switch (code & 0xFF) {
    case SQLITE_CONSTRAINT:
      return constraintFailure(handle, code, message);
    case SQLITE_BUSY:
      return busy(handle, code);
    case SQLITE_INTERRUPT:
      return timeExpired();
    case SQLITE_FULL:
      return sqlFailure(1105,
                        "Could not allocate space: the disk, or the size that is allowed for the database, is full.");
    case SQLITE_READONLY:
      return sqlFailure(3906, "Failed to update the database because it is read-only.");
    case SQLITE_IOERR:
    case SQLITE_CANTOPEN:
      return sqlFailure(823,
                        "The operating system returned an error while the database was read or written: " + message);
    case SQLITE_CORRUPT:
    case SQLITE_NOTADB:
      return sqlFailure(824, "The database is damaged: " + message);
    default:
      // The one error of an aggregate: a sum that 64 bits do not hold.
      if (message == "integer overflow")
        return sqlFailure(8115, "Arithmetic overflow error converting expression to data type int.");
      return Failure(number::statement, "SQL Server", message);
  }
}

}  // namespace

Failure timeExpired() { return Failure(number::timeout, "SQL Server", "Timeout expired"); }

void requireMemory(int code) {
  if ((code & 0xFF) == SQLITE_NOMEM || code == SQLITE_IOERR_NOMEM) throw std::bad_alloc();
}

void throwStorageFailure(sqlite3* handle, int code) {
  rethrowFailure(handle);
  requireMemory(code);
  // Looking for an index below runs statements of its own on the handle.
  const std::string message = sqlite3_errmsg(handle);
  throw failureOf(handle, code, message);
}

}  // namespace QVSa::embedded
