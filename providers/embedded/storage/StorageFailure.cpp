#include "providers/embedded/storage/StorageFailure.h"

#include <algorithm>
#include <new>
#include <optional>
#include <sqlite3.h>
#include <string>
#include <system_error>

#include "providers/embedded/functions/Functions.h"
#include "providers/embedded/storage/Catalogue.h"
#include "providers/embedded/storage/NullIndex.h"
#include "providers/tsql/Parser.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

using tsql::sqlFailure;

Failure notRunnable() { return Failure(number::statement, "SQL Server", "The statement can't be run here."); }

// Of an object that another session has dropped since this one looked.
Failure failedStatement(const std::string& message) {
  constexpr std::string_view noTable = "no such table: ";
  if (!message.starts_with(noTable)) return notRunnable();
  const std::size_t database = message.find('.');
  return sqlFailure(208, "Invalid object name '" +
                             message.substr(database == std::string::npos ? noTable.size() : database + 1) + "'.");
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

// As the library's message tells columns: those of a key of the table, if it is its primary key.
std::string primaryKeyOf(const tsql::CreateTable& table) {
  std::string columns;
  const auto add = [&](const std::string& column) {
    columns += (columns.empty() ? "" : ", ") + table.table.name + "." + column;
  };
  for (const auto& column : table.columns)
    if (column.primaryKey) add(column.name);
  for (const auto& key : table.keys)
    if (key.primary) std::ranges::for_each(key.columns, add);
  return columns;
}

// Whether these columns are the primary key of the table in one of the databases, which the message does not tell.
bool isPrimaryKey(sqlite3* handle, const std::string& columns) {
  for (const char* database : databaseNames) {
    Prepared query(handle, std::string("select text from ") + database + ".definitions where name=?");
    query.bind(1, foldName(tableOf(columns)));
    if (!query.step()) continue;
    const auto statements = tsql::parse(tsql::tokenize(std::get<std::string>(query.column(0))));
    const auto* const table = std::get_if<tsql::CreateTable>(&statements.front());
    if (table != nullptr && sameName(primaryKeyOf(*table), columns)) return true;
  }
  return false;
}

Failure duplicateKey(const std::string& kind, const std::string& table, const std::string& columns) {
  return sqlFailure(2627, "Violation of " + kind + " constraint. Cannot insert duplicate key in object '" + table +
                              "'. (column " + columns + ")");
}

Failure duplicateRow(const std::string& table, const std::string& index) {
  return sqlFailure(2601,
                    "Cannot insert duplicate key row in object '" + table + "' with unique index '" + index + "'.");
}

Failure duplicate(sqlite3* handle, int code, const std::string& message) {
  const std::string columns = constrainedColumns(message);
  if (const auto nulls = readNullIndex(columns)) {
    const auto& [table, index] = *nulls;
    return index.empty() ? duplicateKey("UNIQUE KEY", table, "that is NULL") : duplicateRow(table, index);
  }
  const std::string table = tableOf(columns);
  if (const auto index = madeIndex(handle, columns)) return duplicateRow(table, *index);
  const bool isPrimary = code != SQLITE_CONSTRAINT_UNIQUE || isPrimaryKey(handle, columns);
  return duplicateKey(isPrimary ? "PRIMARY KEY" : "UNIQUE KEY", table, columns);
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
    case SQLITE_CONSTRAINT_CHECK:
      // The one check that there is: of an identity column's range.
      return sqlFailure(8115, "Arithmetic overflow error converting IDENTITY to data type int.");
    default:
      return notRunnable();
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
      return sqlFailure(823, "The operating system returned an error while the database was read or written: " +
                                 std::generic_category().message(sqlite3_system_errno(handle)) + ".");
    case SQLITE_CORRUPT:
    case SQLITE_NOTADB:
      return sqlFailure(824, "The database is damaged.");
    case SQLITE_TOOBIG:
      return valueTooLarge();
    default:
      return failedStatement(message);
  }
}

}  // namespace

Failure unsupported(const std::string& what) {
  return sqlFailure(40515, what + " is not supported by the embedded engine.");
}

Failure valueTooLarge() {
  return sqlFailure(7119, "Attempting to grow LOB beyond maximum allowed size of 1000000000 bytes.");
}

Failure deadlock() {
  return sqlFailure(
      1205,
      "Transaction was deadlocked on lock resources with another process and has been chosen as the deadlock "
      "victim. Rerun the transaction.");
}

Failure duplicateKey(const std::string& table) {
  return sqlFailure(2627,
                    "Violation of PRIMARY KEY constraint. Cannot insert duplicate key in object '" + table + "'.");
}

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
