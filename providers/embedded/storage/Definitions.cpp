#include "providers/embedded/storage/Definitions.h"

#include <algorithm>
#include <set>

#include "platform/PasswordDigest.h"
#include "providers/embedded/bind/Binder.h"
#include "providers/embedded/storage/ColumnType.h"
#include "providers/embedded/storage/NullIndex.h"
#include "providers/embedded/storage/StorageFailure.h"
#include "providers/tsql/Parser.h"
#include "providers/tsql/Printer.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

std::size_t databaseOf(const tsql::ObjectName& name, std::size_t current) {
  if (!isOwner(name.owner))
    throw tsql::sqlFailure(2760, "The specified schema name \"" + name.owner +
                                     "\" either does not exist or you do not have permission to use it.");
  if (name.database.empty()) return current;
  const auto database = databaseByName(name.database);
  if (!database) throw tsql::sqlFailure(2702, "Database '" + name.database + "' does not exist.");
  return *database;
}

std::string qualified(std::size_t database, const std::string& name) {
  return std::string(databaseNames[database]) + "." + quoteName(name);
}

void run(Handle& handle, const std::string& text, const std::vector<Value>& values) {
  Prepared statement(handle.get(), text);
  for (std::size_t i = 0; i < values.size(); ++i) statement.bind(static_cast<int>(i + 1), values[i]);
  while (statement.step()) {
  }
}

void changed(Handle& handle, std::size_t database) {
  handle.execute(std::string("update ") + databaseNames[database] + ".engine set catalogue=catalogue+1");
}

void remember(Handle& handle, std::size_t database, const std::string& name, const tsql::Statement& statement) {
  run(handle, std::string("insert into ") + databaseNames[database] + ".definitions(name,text) values(?,?)",
      {foldName(name), tsql::print(statement)});
  changed(handle, database);
}

void forget(Handle& handle, std::size_t database, const std::string& name) {
  run(handle, std::string("delete from ") + databaseNames[database] + ".definitions where name=?", {foldName(name)});
  changed(handle, database);
}

// Empty for a value that is no text, which only a damaged file has in such a place.
std::string textOf(const Value& value) {
  const auto* const text = std::get_if<std::string>(&value);
  return text ? *text : std::string();
}

// What a file holds beside the tables of the dialect, and what SQLite keeps for itself.
bool isReserved(const std::string& name) {
  static constexpr std::string_view own[] = {"definitions", "engine", "gate", "list", "logins"};
  const std::string folded = foldName(name);
  return folded.starts_with("sqlite_") || std::ranges::find(own, folded) != std::end(own);
}

// Whether SQLite has an object of that name, be it one of ours or an index.
bool isInFile(Handle& handle, std::size_t database, const std::string& name) {
  Prepared query(handle.get(), std::string("select 1 from ") + databaseNames[database] +
                                   ".sqlite_schema where name=? collate nocase");
  query.bind(1, name);
  return query.step();
}

void refuseTaken(Handle& handle, const Catalogue& catalogue, std::size_t database, const std::string& name) {
  if (name.starts_with('#')) throw unsupported("A temporary table, '" + name + "',");
  if (catalogue.exists(database, name) || isReserved(name) || isInFile(handle, database, name))
    throw tsql::sqlFailure(2714, "There is already an object named '" + name + "' in the database.");
}

std::string storageType(const Type& type) {
  if (type.isWhole() || type.isDate()) return "integer";
  if (type.base == Base::real) return "real";
  return type.isText() ? "text collate tsql" : "blob";
}

std::string columnList(const std::vector<String>& names) {
  std::string list;
  for (const auto& name : names) list += (list.empty() ? "" : ",") + quoteName(name);
  return list;
}

const char* largestIdentity(Base base) {
  return base == Base::tinyint ? "255" : base == Base::smallint ? "32767" : "2147483647";
}

std::string columnText(const tsql::ColumnDefinition& column, bool required) {
  const std::string name = quoteName(column.name);
  const Type type = typeOf(column.type);
  // The identity column is the row's key in the file. The number of a deleted row never comes again, that of a row
  // that was rolled back does.
  if (column.identity)
    return name + " integer primary key autoincrement" +
           (type.base == Base::bigint ? "" : " check(" + name + "<=" + largestIdentity(type.base) + ")");
  const bool unique = column.unique || column.primaryKey;
  return name + " " + storageType(type) + (required ? " not null" : "") + (unique ? " unique" : "");
}

std::string keyText(const tsql::KeyDefinition& key) { return "unique(" + columnList(key.columns) + ")"; }

bool isIdentityKey(const tsql::KeyDefinition& key, const tsql::CreateTable& table) {
  return key.columns.size() == 1 && std::ranges::any_of(table.columns, [&](const tsql::ColumnDefinition& column) {
           return column.identity && sameName(column.name, key.columns.front());
         });
}

bool inPrimaryKey(const tsql::CreateTable& table, const std::string& column) {
  return std::ranges::any_of(table.keys, [&](const tsql::KeyDefinition& key) {
    return key.primary && std::ranges::any_of(key.columns, [&](const String& name) { return sameName(name, column); });
  });
}

void setSeed(Handle& handle, std::size_t database, const tsql::CreateTable& table) {
  for (const auto& column : table.columns)
    if (column.identity && column.seed != 1)
      run(handle, std::string("insert into ") + databaseNames[database] + ".sqlite_sequence(name,seq) values(?,?)",
          {table.table.name, column.seed - 1});
}

void checkIdentity(const tsql::ColumnDefinition& column, const std::string& table) {
  const Type type = typeOf(column.type);
  if (!type.isWhole() || type.base == Base::bit)
    throw tsql::sqlFailure(2749, "Identity column '" + column.name +
                                     "' must be of data type int, bigint, smallint or tinyint, and constrained to be "
                                     "nonnullable.");
  if (column.nullable.value_or(false))
    throw tsql::sqlFailure(
        8147, "Could not create IDENTITY attribute on nullable column '" + column.name + "', table '" + table + "'.");
  if (column.defaultValue)
    throw tsql::sqlFailure(1754, "Defaults cannot be created on columns with an IDENTITY attribute. Table '" + table +
                                     "', column '" + column.name + "'.");
  if (column.increment != 1 || column.seed < 1)
    throw unsupported("An identity increment other than 1, or a seed below it,");
}

void checkColumns(const tsql::CreateTable& table) {
  constexpr std::size_t mostColumns = 1024;
  const std::string& name = table.table.name;
  if (table.columns.size() > mostColumns)
    throw tsql::sqlFailure(1702, "CREATE TABLE failed because column '" + table.columns[mostColumns].name +
                                     "' in table '" + name + "' exceeds the maximum of 1024 columns.");
  if (std::ranges::count_if(table.columns, &tsql::ColumnDefinition::identity) > 1)
    throw tsql::sqlFailure(2744, "Multiple identity columns specified for table '" + name +
                                     "'. Only one identity column per table is allowed.");
  // SQLite's own name for the key of a row.
  std::set<std::string> known = {"_rowid_"};
  for (const auto& column : table.columns) {
    if (!known.insert(foldName(column.name)).second)
      throw tsql::sqlFailure(2705, "Column names in each table must be unique. Column name '" + column.name +
                                       "' in table '" + name + "' is specified more than once.");
    if (column.identity) checkIdentity(column, name);
  }
}

// The columns of a key or an index: there, once each, and of a type that has an order.
void checkKey(const TableInfo& table, const std::vector<String>& columns) {
  std::set<std::string> known;
  for (const auto& name : columns) {
    const auto column = table.find(name);
    if (!column) throw tsql::sqlFailure(1911, "Column name '" + name + "' does not exist in the target table or view.");
    if (!known.insert(foldName(name)).second)
      throw tsql::sqlFailure(
          1909, "Cannot use duplicate column names in index. Column name '" + name + "' listed more than once.");
    const Type& type = table.columns[*column].type;
    if (type.base == Base::ntext || type.base == Base::image)
      throw tsql::sqlFailure(1919, "Column '" + name + "' in table '" + table.name +
                                       "' is of a type that is invalid for use as a key column in an index.");
  }
}

void checkKeys(const tsql::CreateTable& table, const TableInfo& info) {
  std::size_t primaries = 0;
  for (const auto& key : table.keys) {
    checkKey(info, key.columns);
    primaries += key.primary ? 1 : 0;
  }
  for (const auto& column : table.columns) {
    if (column.primaryKey || column.unique) checkKey(info, {column.name});
    primaries += column.primaryKey ? 1 : 0;
    const bool isKey = column.primaryKey || inPrimaryKey(table, column.name);
    if (isKey && column.nullable.value_or(false))
      throw tsql::sqlFailure(8111,
                             "Cannot define PRIMARY KEY constraint on nullable column in table '" + info.name + "'.");
  }
  if (primaries > 1)
    throw tsql::sqlFailure(8110, "Cannot add multiple PRIMARY KEY constraints to table '" + info.name + "'.");
}

// One NULL is all that a unique key takes.
void makeNullIndices(Handle& handle, const tsql::CreateTable& table, const TableInfo& info) {
  std::size_t ordinal = 0;
  const auto make = [&](const std::vector<String>& columns) {
    const std::string text = makeNullIndex(info, columns, "", ++ordinal);
    if (!text.empty()) handle.execute(text);
  };
  for (const auto& column : table.columns)
    if (column.unique) make({column.name});
  for (const auto& key : table.keys)
    if (!key.primary) make(key.columns);
}

void createTable(Handle& handle, const Catalogue& catalogue, std::size_t current, const tsql::Statement& statement) {
  const auto& table = std::get<tsql::CreateTable>(statement);
  const std::size_t database = databaseOf(table.table, current);
  refuseTaken(handle, catalogue, database, table.table.name);
  checkColumns(table);
  // As it will be read again from its definition.
  auto copy = tsql::parse(tsql::tokenize(tsql::print(statement)));
  const TableInfo info = tableInfo(database, std::get<tsql::CreateTable>(copy.front()));
  checkKeys(table, info);
  for (const auto& column : info.columns) Binder(catalogue, database).checkDefault(column);
  std::string text;
  for (const auto& column : table.columns) {
    const bool required = !column.nullable.value_or(true) || column.primaryKey || inPrimaryKey(table, column.name);
    text += (text.empty() ? "" : ",") + columnText(column, required);
  }
  for (const auto& key : table.keys)
    if (!isIdentityKey(key, table)) text += "," + keyText(key);
  handle.execute("create table " + qualified(database, table.table.name) + "(" + text + ")");
  setSeed(handle, database, table);
  makeNullIndices(handle, table, info);
  remember(handle, database, table.table.name, statement);
}

void createView(Handle& handle, const Catalogue& catalogue, std::size_t current, const tsql::Statement& statement) {
  const auto& view = std::get<tsql::CreateView>(statement);
  const std::size_t database = databaseOf(view.view, current);
  refuseTaken(handle, catalogue, database, view.view.name);
  Binder(catalogue, database).checkView(view);
  remember(handle, database, view.view.name, statement);
}

void createSynonym(Handle& handle, const Catalogue& catalogue, std::size_t current, const tsql::Statement& statement) {
  const auto& synonym = std::get<tsql::CreateSynonym>(statement);
  const std::size_t database = databaseOf(synonym.synonym, current);
  refuseTaken(handle, catalogue, database, synonym.synonym.name);
  if (!synonym.target.database.empty()) databaseOf(synonym.target, current);
  remember(handle, database, synonym.synonym.name, statement);
}

// An index is named within its table, as the dialect has it.
std::string indexName(const TableInfo& table, const std::string& index) {
  return foldName(table.name) + "." + foldName(index);
}

const TableInfo& tableNamed(const Catalogue& catalogue, const tsql::ObjectName& name, std::size_t current) {
  const Object object = catalogue.find(name, current);
  if (const auto* table = std::get_if<const TableInfo*>(&object)) return **table;
  throw tsql::sqlFailure(1939, "Cannot create index on view '" + name.name + "'.");
}

[[noreturn]] void refuseDrop(const std::string& kind, const std::string& name) {
  throw tsql::sqlFailure(3701, "Cannot drop the " + kind + " '" + name +
                                   "', because it does not exist or you do not have "
                                   "permission.");
}

void createIndex(Handle& handle, const Catalogue& catalogue, std::size_t current, const tsql::CreateIndex& index) {
  const TableInfo& table = tableNamed(catalogue, index.table, current);
  checkKey(table, index.columns);
  const std::string name = indexName(table, index.name);
  if (isInFile(handle, table.database, name))
    throw tsql::sqlFailure(1913, "The operation failed because an index or statistics with name '" + index.name +
                                     "' already exists on table '" + table.name + "'.");
  try {
    handle.execute(std::string("create ") + (index.unique ? "unique " : "") + "index " +
                   qualified(table.database, name) + " on " + quoteName(table.name) + "(" + columnList(index.columns) +
                   ")");
    const std::string nulls = index.unique ? makeNullIndex(table, index.columns, index.name) : "";
    if (!nulls.empty()) handle.execute(nulls);
  } catch (const Failure& failure) {
    if (failure.number() != number::integrity) throw;
    throw tsql::sqlFailure(1505,
                           "The CREATE UNIQUE INDEX statement terminated because a duplicate key was found for the "
                           "object name '" +
                               table.name + "' and the index name '" + index.name + "'.");
  }
}

void dropIndex(Handle& handle, const TableInfo& table, const std::string& index) {
  const std::string name = indexName(table, index);
  if (!isInFile(handle, table.database, name)) refuseDrop("index", index);
  handle.execute("drop index " + qualified(table.database, name));
  handle.execute(dropNullIndex(table, index));
}

void createLogin(Handle& handle, const tsql::CreateLogin& login) {
  Prepared known(handle.get(), "select 1 from master.logins where name=?");
  known.bind(1, login.name);
  if (known.step()) throw tsql::sqlFailure(15025, "The server principal '" + login.name + "' already exists.");
  run(handle, "insert into master.logins(name,digest) values(?,?)",
      {login.name, platform::makePasswordDigest(login.password.text)});
}

void alterLogin(Handle& handle, const tsql::AlterLogin& login) {
  if (handle.loginDigest(login.name).empty())
    throw tsql::sqlFailure(
        15151, "Cannot alter the login '" + login.name + "', because it does not exist or you do not have permission.");
  run(handle, "update master.logins set digest=? where name=?",
      {platform::makePasswordDigest(login.password.text), login.name});
}

template <class Info>
const Info* infoNamed(const Catalogue& catalogue, std::size_t database, const std::string& name) {
  if (!catalogue.exists(database, name) || catalogue.synonym(database, name)) return nullptr;
  const Object object = catalogue.find({"", "", name, 0}, database);
  const auto* info = std::get_if<const Info*>(&object);
  return info ? *info : nullptr;
}

void drop(Handle& handle, const Catalogue& catalogue, std::size_t current, const tsql::Drop& drop) {
  using Kind = tsql::Drop::Kind;
  const std::string& name = drop.name.name;
  if (drop.kind == Kind::index) {
    if (!drop.table) refuseDrop("index", name);
    return dropIndex(handle, tableNamed(catalogue, *drop.table, current), name);
  }
  if (drop.kind == Kind::login && handle.loginDigest(name).empty())
    throw tsql::sqlFailure(
        15151, "Cannot drop the login '" + name + "', because it does not exist or you do not have permission.");
  if (drop.kind == Kind::login) return run(handle, "delete from master.logins where name=?", {name});
  const std::size_t database = databaseOf(drop.name, current);
  if (drop.kind == Kind::table) {
    if (!infoNamed<TableInfo>(catalogue, database, name)) refuseDrop("table", name);
    handle.execute("drop table " + qualified(database, name));
  }
  if (drop.kind == Kind::view && !infoNamed<ViewInfo>(catalogue, database, name)) refuseDrop("view", name);
  if (drop.kind == Kind::synonym && !catalogue.synonym(database, name)) refuseDrop("synonym", name);
  forget(handle, database, name);
}

std::vector<std::string> columnsOf(sqlite3* handle, const std::string& table) {
  Prepared columns(handle, "select name from pragma_table_info(?)");
  columns.bind(1, table);
  std::vector<std::string> names;
  while (columns.step()) names.push_back(textOf(columns.column(0)));
  return names;
}

std::vector<std::string> columnsOf(const tsql::CreateTable& table) {
  std::vector<std::string> names;
  for (const auto& column : table.columns) {
    typeOf(column.type);
    names.push_back(column.name);
  }
  return names;
}

void requireFitting(sqlite3* handle, const std::string& name, const std::string& text) {
  const auto statements = tsql::parse(tsql::tokenize(text));
  const tsql::Statement* const only = statements.size() == 1 ? &statements.front() : nullptr;
  const auto* const table = only ? std::get_if<tsql::CreateTable>(only) : nullptr;
  const auto* const view = only ? std::get_if<tsql::CreateView>(only) : nullptr;
  const auto* const synonym = only ? std::get_if<tsql::CreateSynonym>(only) : nullptr;
  const tsql::ObjectName* const object = table     ? &table->table
                                         : view    ? &view->view
                                         : synonym ? &synonym->synonym
                                                   : nullptr;
  if (!object || foldName(object->name) != name || (table && columnsOf(*table) != columnsOf(handle, object->name)))
    throw tsql::sqlFailure(3241, "'" + name + "' is not what its definition says.");
}

}  // namespace

void requireFittingDefinitions(sqlite3* handle) {
  Prepared definitions(handle, "select name, text from definitions");
  std::set<std::string> names;
  while (definitions.step()) {
    const std::string name = textOf(definitions.column(0));
    requireFitting(handle, name, textOf(definitions.column(1)));
    names.insert(name);
  }
  Prepared tables(handle,
                  "select name from sqlite_schema where type='table' and name not like 'sqlite\\_%' escape '\\' and "
                  "name not in ('engine','gate','definitions','logins')");
  while (tables.step())
    if (const std::string name = textOf(tables.column(0)); !names.contains(foldName(name)))
      throw tsql::sqlFailure(3241, "'" + name + "' has no definition.");
}

void prepareDefinitions(Handle& handle, std::size_t database) {
  handle.execute(std::string("create table if not exists ") + databaseNames[database] +
                 ".definitions(name text primary key, text text not null)");
}

bool isDefinition(const tsql::Statement& statement) {
  return std::visit(
      [](const auto& value) {
        using Kind = std::decay_t<decltype(value)>;
        return std::is_same_v<Kind, tsql::CreateTable> || std::is_same_v<Kind, tsql::CreateView> ||
               std::is_same_v<Kind, tsql::CreateIndex> || std::is_same_v<Kind, tsql::CreateSynonym> ||
               std::is_same_v<Kind, tsql::CreateLogin> || std::is_same_v<Kind, tsql::AlterLogin> ||
               std::is_same_v<Kind, tsql::Drop>;
      },
      statement);
}

std::size_t definedDatabase(const tsql::Statement& statement, std::size_t currentDatabase) {
  if (const auto* table = std::get_if<tsql::CreateTable>(&statement)) return databaseOf(table->table, currentDatabase);
  if (const auto* view = std::get_if<tsql::CreateView>(&statement)) return databaseOf(view->view, currentDatabase);
  if (const auto* index = std::get_if<tsql::CreateIndex>(&statement)) return databaseOf(index->table, currentDatabase);
  if (const auto* synonym = std::get_if<tsql::CreateSynonym>(&statement))
    return databaseOf(synonym->synonym, currentDatabase);
  if (const auto* dropped = std::get_if<tsql::Drop>(&statement))
    if (dropped->kind != tsql::Drop::Kind::login)
      return databaseOf(dropped->table ? *dropped->table : dropped->name, currentDatabase);
  return 0;
}

void define(Handle& handle, const Catalogue& catalogue, std::size_t currentDatabase, const tsql::Statement& statement) {
  if (std::holds_alternative<tsql::CreateTable>(statement)) {
    createTable(handle, catalogue, currentDatabase, statement);
  } else if (std::holds_alternative<tsql::CreateView>(statement)) {
    createView(handle, catalogue, currentDatabase, statement);
  } else if (std::holds_alternative<tsql::CreateSynonym>(statement)) {
    createSynonym(handle, catalogue, currentDatabase, statement);
  } else if (const auto* index = std::get_if<tsql::CreateIndex>(&statement)) {
    createIndex(handle, catalogue, currentDatabase, *index);
  } else if (const auto* login = std::get_if<tsql::CreateLogin>(&statement)) {
    createLogin(handle, *login);
  } else if (const auto* known = std::get_if<tsql::AlterLogin>(&statement)) {
    alterLogin(handle, *known);
  } else {
    drop(handle, catalogue, currentDatabase, std::get<tsql::Drop>(statement));
  }
}

}  // namespace QVSa::embedded
