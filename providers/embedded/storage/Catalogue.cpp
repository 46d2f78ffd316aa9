#include "providers/embedded/storage/Catalogue.h"

#include <algorithm>
#include <string_view>
#include <utility>

#include "providers/embedded/storage/ColumnType.h"
#include "providers/embedded/storage/OpeningFailure.h"
#include "providers/tsql/Parser.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

std::string quoted(const std::string& text) {
  std::string result = "N'";
  for (const char c : text) result.append(c == '\'' ? 2 : 1, c);
  return result + "'";
}

// Not kept in the file: an installation may have been moved since.
std::string filesView(const std::filesystem::path& folder, const std::string& database) {
  const auto [data, log] = filesOf(folder, database);
  return "create view sysfiles(fileid, groupid, name, filename) as select 1, 1, " + quoted(data.name) + ", " +
         quoted(data.path) + " union all select 2, 0, " + quoted(log.name) + ", " + quoted(log.path);
}

std::string dotted(const tsql::ObjectName& name) {
  const std::string owned = name.owner.empty() && name.database.empty() ? name.name : name.owner + "." + name.name;
  return name.database.empty() ? owned : name.database + "." + owned;
}

}  // namespace

TableKey keyOf(const TableInfo& table) { return {table.database, foldName(table.name)}; }

TableInfo tableInfo(std::size_t database, tsql::CreateTable& definition) {
  TableInfo table{database, definition.table.name, {}, std::nullopt, {}};
  for (auto& column : definition.columns) {
    const bool inKey = column.primaryKey || std::ranges::any_of(definition.keys, [&](const tsql::KeyDefinition& key) {
                         return key.primary && std::ranges::any_of(key.columns, [&](const String& name) {
                                  return sameName(name, column.name);
                                });
                       });
    if (column.identity) table.identity = table.columns.size();
    if (column.identity || column.primaryKey || column.unique) table.keys.push_back({table.columns.size()});
    table.columns.push_back({column.name, typeOf(column.type),
                             !inKey && !column.identity && column.nullable.value_or(true),
                             std::move(column.defaultValue)});
  }
  for (const auto& key : definition.keys) {
    std::vector<std::size_t> columns;
    for (const auto& name : key.columns)
      if (const auto column = table.find(name)) columns.push_back(*column);
    table.keys.push_back(std::move(columns));
  }
  return table;
}

std::optional<std::size_t> TableInfo::find(const std::string& column) const {
  for (std::size_t i = 0; i < columns.size(); ++i)
    if (sameName(columns[i].name, column)) return i;
  return std::nullopt;
}

Catalogue::Catalogue(Handle& handle) : version_(handle.catalogueVersion()) {
  for (std::size_t database = 0; database < databaseNames.size(); ++database) load(handle, database);
}

void Catalogue::load(Handle& handle, std::size_t database) {
  unreadable_[database] = handle.whyReplaced(database);
  try {
    Prepared query(handle.get(), std::string("select text from ") + databaseNames[database] + ".definitions");
    while (query.step()) {
      const Value text = query.column(0);
      if (!std::holds_alternative<std::string>(text)) throw tsql::sqlFailure(824, "A definition is no text.");
      loadText(database, std::get<std::string>(text));
    }
  } catch (const Failure& failure) {
    if (failure.number() == number::timeout) throw;
    const Failure told = cannotOpen(handle.folder(), database, "a definition can't be read: " + failure.description());
    if (database == 0 || !handle.replacesUnreadable()) throw told;
    unreadable_[database] = told;
    std::erase_if(entries_, [&](const auto& entry) { return entry.first.first == database; });
  }
  loadText(database, filesView(handle.folder(), databaseNames[database]));
}

void Catalogue::requireReadable(std::size_t database) const {
  if (unreadable_[database]) throw *unreadable_[database];
}

void Catalogue::loadText(std::size_t database, const std::string& definition) {
  auto statements = tsql::parse(tsql::tokenize(definition));
  for (auto& statement : statements) {
    if (auto* table = std::get_if<tsql::CreateTable>(&statement)) {
      entries_.emplace(std::pair(database, foldName(table->table.name)), tableInfo(database, *table));
    } else if (auto* view = std::get_if<tsql::CreateView>(&statement)) {
      const std::string name = view->view.name;
      entries_.emplace(std::pair(database, foldName(name)), ViewInfo{database, name, std::move(*view)});
    } else if (auto* synonym = std::get_if<tsql::CreateSynonym>(&statement)) {
      entries_.emplace(std::pair(database, foldName(synonym->synonym.name)),
                       SynonymInfo{database, synonym->synonym.name, synonym->target});
    }
  }
}

const Catalogue::Entry* Catalogue::lookUp(std::size_t database, const std::string& name) const {
  const auto entry = entries_.find({database, foldName(name)});
  return entry == entries_.end() ? nullptr : &entry->second;
}

Object Catalogue::find(const tsql::ObjectName& name, std::size_t currentDatabase) const {
  const auto database = name.database.empty() ? std::optional(currentDatabase) : databaseByName(name.database);
  const Entry* entry = database && isOwner(name.owner) ? lookUp(*database, name.name) : nullptr;
  // A synonym names a table or a view, never another synonym, so one step is enough.
  if (entry)
    if (const auto* synonym = std::get_if<SynonymInfo>(entry))
      entry = lookUp(databaseByName(synonym->target.database).value_or(synonym->database), synonym->target.name);
  if (entry) {
    if (const auto* table = std::get_if<TableInfo>(entry)) return table;
    if (const auto* view = std::get_if<ViewInfo>(entry)) return view;
  }
  if (database) requireReadable(*database);
  throw tsql::sqlFailure(208, "Invalid object name '" + dotted(name) + "'.");
}

bool Catalogue::exists(std::size_t database, const std::string& name) const {
  return lookUp(database, name) != nullptr;
}

const SynonymInfo* Catalogue::synonym(std::size_t database, const std::string& name) const {
  const Entry* entry = lookUp(database, name);
  return entry ? std::get_if<SynonymInfo>(entry) : nullptr;
}

}  // namespace QVSa::embedded
