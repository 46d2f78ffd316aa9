#include "providers/embedded/functions/ListTable.h"

#include <algorithm>
#include <new>
#include <sqlite3.h>

#include "providers/embedded/storage/StorageFailure.h"
#include "providers/embedded/storage/StoredValue.h"

namespace QVSa::embedded {

namespace {

constexpr char pointerType[] = "QVSa::ValueList";
constexpr int hiddenColumn = 1;
// A statement is planned before its list is known. Lists are short next to the tables that they are looked up in, so
// the plan begins with the list and goes to the tables by their indices.
constexpr int expectedValues = 20;

struct Cursor : sqlite3_vtab_cursor {
  const ValueList* values = nullptr;
  std::size_t at = 0;
};

// Null where no list is bound.
const ValueList* listOf(sqlite3_value* argument) {
  const void* const bound = sqlite3_value_pointer(argument, pointerType);
  return bound == nullptr ? nullptr : static_cast<const std::shared_ptr<const ValueList>*>(bound)->get();
}

void isListed(sqlite3_context* context, int, sqlite3_value** arguments) {
  const ValueList* const list = listOf(arguments[1]);
  try {
    sqlite3_result_int(context, list != nullptr && std::ranges::binary_search(*list, readValue(arguments[0])));
  } catch (const std::bad_alloc&) {
    sqlite3_result_error_nomem(context);
  }
}

Cursor& of(sqlite3_vtab_cursor* cursor) { return *static_cast<Cursor*>(cursor); }

int connect(sqlite3* handle, void*, int, const char* const*, sqlite3_vtab** table, char**) {
  const int code = sqlite3_declare_vtab(handle, "create table list(value, listed hidden)");
  if (code != SQLITE_OK) return code;
  sqlite3_vtab_config(handle, SQLITE_VTAB_INNOCUOUS);
  *table = new (std::nothrow) sqlite3_vtab();
  return *table == nullptr ? SQLITE_NOMEM : SQLITE_OK;
}

int disconnect(sqlite3_vtab* table) {
  delete table;
  return SQLITE_OK;
}

int bestIndex(sqlite3_vtab*, sqlite3_index_info* info) {
  for (int i = 0; i < info->nConstraint; ++i) {
    const auto& constraint = info->aConstraint[i];
    if (constraint.iColumn != hiddenColumn || constraint.op != SQLITE_INDEX_CONSTRAINT_EQ) continue;
    if (!constraint.usable) return SQLITE_CONSTRAINT;
    info->aConstraintUsage[i].argvIndex = 1;
    info->aConstraintUsage[i].omit = 1;
  }
  info->estimatedRows = expectedValues;
  info->estimatedCost = expectedValues;
  return SQLITE_OK;
}

int openCursor(sqlite3_vtab*, sqlite3_vtab_cursor** cursor) {
  *cursor = new (std::nothrow) Cursor();
  return *cursor == nullptr ? SQLITE_NOMEM : SQLITE_OK;
}

int closeCursor(sqlite3_vtab_cursor* cursor) {
  delete &of(cursor);
  return SQLITE_OK;
}

int filter(sqlite3_vtab_cursor* cursor, int, const char*, int count, sqlite3_value** arguments) {
  of(cursor).at = 0;
  of(cursor).values = count == 0 ? nullptr : listOf(arguments[0]);
  return SQLITE_OK;
}

int next(sqlite3_vtab_cursor* cursor) {
  ++of(cursor).at;
  return SQLITE_OK;
}

int atEnd(sqlite3_vtab_cursor* cursor) {
  return of(cursor).values == nullptr || of(cursor).at >= of(cursor).values->size();
}

int column(sqlite3_vtab_cursor* cursor, sqlite3_context* context, int ordinal) {
  if (ordinal != hiddenColumn) giveResult(context, (*of(cursor).values)[of(cursor).at]);
  return SQLITE_OK;
}

int rowid(sqlite3_vtab_cursor* cursor, sqlite3_int64* row) {
  *row = static_cast<sqlite3_int64>(of(cursor).at);
  return SQLITE_OK;
}

const sqlite3_module& module() {
  static const sqlite3_module list = [] {
    sqlite3_module made{};
    // Without xCreate it is a table of its own name in every database, and cannot be created in any.
    made.xConnect = connect;
    made.xBestIndex = bestIndex;
    made.xDisconnect = disconnect;
    made.xOpen = openCursor;
    made.xClose = closeCursor;
    made.xFilter = filter;
    made.xNext = next;
    made.xEof = atEnd;
    made.xColumn = column;
    made.xRowid = rowid;
    return made;
  }();
  return list;
}

}  // namespace

void registerListTable(sqlite3* handle) {
  int code = sqlite3_create_module_v2(handle, "list", &module(), nullptr, nullptr);
  if (code == SQLITE_OK)
    code = sqlite3_create_function_v2(handle, "t_listed", 2, SQLITE_UTF8, nullptr, isListed, nullptr, nullptr, nullptr);
  if (code != SQLITE_OK) throwStorageFailure(handle, code);
}

void bindList(sqlite3_stmt* statement, int parameter, std::shared_ptr<const ValueList> values) {
  const auto release = [](void* bound) { delete static_cast<std::shared_ptr<const ValueList>*>(bound); };
  auto* const bound = new std::shared_ptr<const ValueList>(std::move(values));
  // The library releases the pointer where it fails, too.
  const int code = sqlite3_bind_pointer(statement, parameter, bound, pointerType, release);
  if (code != SQLITE_OK) throwStorageFailure(sqlite3_db_handle(statement), code);
}

}  // namespace QVSa::embedded
