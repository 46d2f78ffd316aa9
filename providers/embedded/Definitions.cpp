#include "providers/embedded/Definitions.h"

#include <algorithm>

#include "platform/PasswordDigest.h"
#include "providers/embedded/Binder.h"
#include "providers/tsql/Printer.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

std::size_t databaseOf(const tsql::ObjectName& name, std::size_t current) {
  if (name.database.empty()) return current;
  const auto database = databaseByName(name.database);
  if (!database) throw tsql::sqlFailure(911, "Database '" + name.database + "' does not exist.");
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

void refuseTaken(const Catalogue& catalogue, std::size_t database, const std::string& name) {
  if (catalogue.exists(database, name))
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

std::string columnText(const tsql::ColumnDefinition& column, bool required) {
  // The identity column is the row's key in the file. The number of a deleted row never comes again, that of a row
  // that was rolled back does.
  if (column.identity) return quoteName(column.name) + " integer primary key autoincrement";
  const bool unique = column.unique || column.primaryKey;
  return quoteName(column.name) + " " + storageType(typeOf(column.type)) + (required ? " not null" : "") +
         (unique ? " unique" : "");
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
  for (const auto& column : table.columns) {
    if (!column.identity) continue;
    if (column.increment != 1)
      throw tsql::sqlFailure(40515, "An identity increment other than 1 is not supported by the embedded engine.");
    if (column.seed != 1)
      run(handle, std::string("insert into ") + databaseNames[database] + ".sqlite_sequence(name,seq) values(?,?)",
          {table.table.name, column.seed - 1});
  }
}

void createTable(Handle& handle, const Catalogue& catalogue, std::size_t current, const tsql::Statement& statement) {
  const auto& table = std::get<tsql::CreateTable>(statement);
  const std::size_t database = databaseOf(table.table, current);
  refuseTaken(catalogue, database, table.table.name);
  if (std::ranges::count_if(table.columns, &tsql::ColumnDefinition::identity) > 1)
    throw tsql::sqlFailure(2744, "Multiple identity columns specified for table '" + table.table.name +
                                     "'. Only one identity column per table is allowed.");
  std::string text;
  for (const auto& column : table.columns) {
    const bool required = !column.nullable.value_or(true) || column.primaryKey || inPrimaryKey(table, column.name);
    text += (text.empty() ? "" : ",") + columnText(column, required);
  }
  for (const auto& key : table.keys)
    if (!isIdentityKey(key, table)) text += "," + keyText(key);
  handle.execute("create table " + qualified(database, table.table.name) + "(" + text + ")");
  setSeed(handle, database, table);
  remember(handle, database, table.table.name, statement);
}

void createView(Handle& handle, const Catalogue& catalogue, std::size_t current, const tsql::Statement& statement) {
  const auto& view = std::get<tsql::CreateView>(statement);
  const std::size_t database = databaseOf(view.view, current);
  refuseTaken(catalogue, database, view.view.name);
  Binder(catalogue, database).bindQuery(*view.select, false);
  remember(handle, database, view.view.name, statement);
}

void createSynonym(Handle& handle, const Catalogue& catalogue, std::size_t current, const tsql::Statement& statement) {
  const auto& synonym = std::get<tsql::CreateSynonym>(statement);
  const std::size_t database = databaseOf(synonym.synonym, current);
  refuseTaken(catalogue, database, synonym.synonym.name);
  if (!synonym.target.database.empty()) databaseOf(synonym.target, current);
  remember(handle, database, synonym.synonym.name, statement);
}

// An index is named within its table, as the dialect has it.
std::string indexName(std::size_t database, const std::string& table, const std::string& index) {
  return qualified(database, foldName(table) + "." + foldName(index));
}

const TableInfo& tableNamed(const Catalogue& catalogue, const tsql::ObjectName& name, std::size_t current) {
  const Object object = catalogue.find(name, current);
  if (const auto* table = std::get_if<const TableInfo*>(&object)) return **table;
  throw tsql::sqlFailure(1939, "Cannot create index on view '" + name.name + "'.");
}

void createIndex(Handle& handle, const Catalogue& catalogue, std::size_t current, const tsql::CreateIndex& index) {
  const TableInfo& table = tableNamed(catalogue, index.table, current);
  for (const auto& column : index.columns)
    if (!table.find(column))
      throw tsql::sqlFailure(1911, "Column name '" + column + "' does not exist in the target table or view.");
  try {
    handle.execute(std::string("create ") + (index.unique ? "unique " : "") + "index " +
                   indexName(table.database, table.name, index.name) + " on " + quoteName(table.name) + "(" +
                   columnList(index.columns) + ")");
  } catch (const Failure& failure) {
    if (failure.number() != number::integrity) throw;
    throw tsql::sqlFailure(1505,
                           "The CREATE UNIQUE INDEX statement terminated because a duplicate key was found for the "
                           "object name '" +
                               table.name + "' and the index name '" + index.name + "'.");
  }
}

void createLogin(Handle& handle, const tsql::CreateLogin& login) {
  Prepared known(handle.get(), "select 1 from master.logins where name=?");
  known.bind(1, login.name);
  if (known.step()) throw tsql::sqlFailure(15025, "The server principal '" + login.name + "' already exists.");
  run(handle, "insert into master.logins(name,digest) values(?,?)",
      {login.name, platform::makePasswordDigest(login.password.text)});
}

[[noreturn]] void refuseDrop(const std::string& kind, const std::string& name) {
  throw tsql::sqlFailure(3701, "Cannot drop the " + kind + " '" + name +
                                   "', because it does not exist or you do not have "
                                   "permission.");
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
    const TableInfo& table = tableNamed(catalogue, *drop.table, current);
    return handle.execute("drop index " + indexName(table.database, table.name, name));
  }
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

}  // namespace

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
               std::is_same_v<Kind, tsql::CreateLogin> || std::is_same_v<Kind, tsql::Drop>;
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
  } else {
    drop(handle, catalogue, currentDatabase, std::get<tsql::Drop>(statement));
  }
}

}  // namespace QVSa::embedded
