#pragma once

#include <array>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <variant>
#include <vector>

#include "providers/embedded/bind/Types.h"
#include "providers/embedded/storage/Handle.h"
#include "providers/embedded/storage/Names.h"
#include "providers/tsql/Tree.h"

namespace QVSa::embedded {

struct ColumnInfo {
  std::string name;
  Type type;
  bool nullable = true;
  tsql::ExpressionPtr defaultValue;  // empty where the column has none
};

struct TableInfo {
  std::size_t database = 0;  // position in databaseNames
  std::string name;
  std::vector<ColumnInfo> columns;
  std::optional<std::size_t> identity;         // the identity column, which is the row's key in the file as well
  std::vector<std::vector<std::size_t>> keys;  // primary and unique, by the places of their columns

  std::optional<std::size_t> find(const std::string& column) const;
};

// A table by its database and its name as names are compared.
using TableKey = std::pair<std::size_t, std::string>;
TableKey keyOf(const TableInfo& table);

// What a definition makes; its defaults go over.
TableInfo tableInfo(std::size_t database, tsql::CreateTable& definition);

struct ViewInfo {
  std::size_t database = 0;
  std::string name;
  tsql::CreateView definition;
};

struct SynonymInfo {
  std::size_t database = 0;
  std::string name;
  tsql::ObjectName target;
};

using Object = std::variant<const TableInfo*, const ViewInfo*>;

// What the databases of an installation hold, as it was when it was loaded.
class Catalogue {
 public:
  // Throws 4060 for a database whose definitions can't be read, if the handle does not replace such ones.
  explicit Catalogue(Handle& handle);

  // A catalogue of another version than the handle's is out of date.
  std::int64_t version() const { return version_; }

  // The table or view of that name, through synonyms. Throws 208 where there is none, 4060 for a database that can't be
  // read.
  Object find(const tsql::ObjectName& name, std::size_t currentDatabase) const;
  // Whether a name is taken in a database by a table, a view or a synonym.
  bool exists(std::size_t database, const std::string& name) const;
  const SynonymInfo* synonym(std::size_t database, const std::string& name) const;
  // Throws 4060 for a database that can't be read.
  void requireReadable(std::size_t database) const;

 private:
  using Entry = std::variant<TableInfo, ViewInfo, SynonymInfo>;
  const Entry* lookUp(std::size_t database, const std::string& name) const;
  void load(Handle& handle, std::size_t database);
  void loadText(std::size_t database, const std::string& definition);

  std::int64_t version_ = 0;
  std::map<std::pair<std::size_t, std::string>, Entry> entries_;
  std::array<std::optional<Failure>, databaseNames.size()> unreadable_;
};

}  // namespace QVSa::embedded
