#include <algorithm>
#include <set>

#include "providers/embedded/bind/Binder.h"
#include "providers/embedded/storage/StorageFailure.h"
#include "providers/tsql/OuterJoins.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

// Deeper than any view of ours stands on others; a view that reads itself ends here.
constexpr std::size_t viewDepthLimit = 32;
// SQLite joins 64, and draws those of a derived table into the select around it. A write adds one or two.
constexpr std::size_t mostTables = 60;

std::size_t tablesIn(const BoundCore& core) {
  std::size_t tables = 0;
  for (const auto& source : core.from) tables += source.tables;
  return tables;
}

}  // namespace

std::size_t Binder::tablesIn(const BoundSelect& select) {
  std::size_t most = 0;
  for (const auto& part : select.parts) most = std::max(most, embedded::tablesIn(part.core));
  return most;
}

void Binder::bindFrom(const std::vector<tsql::TableSourcePtr>& from, Scope& scope, BoundCore& core) {
  for (const auto& source : from) bindSource(*source, scope, core);
  if (embedded::tablesIn(core) > mostTables)
    throw tsql::sqlFailure(
        106, "Too many table names in the query. The maximum allowable is " + std::to_string(mostTables) + ".");
}

void Binder::bindSource(const tsql::TableSource& source, Scope& scope, BoundCore& core) {
  switch (source.kind) {
    case tsql::TableSource::Kind::table:
      return bindTable(source, scope, core);
    case tsql::TableSource::Kind::derived:
      return bindDerived(source, scope, core);
    case tsql::TableSource::Kind::join:
      return bindJoin(source, scope, core);
  }
}

// The bound from clause is one list, read from the left: a right join is a left join turned round, and the condition of
// an inner join is a condition of the whole, which is the same as long as what it joins was not outer-joined before.
void Binder::bindJoin(const tsql::TableSource& join, Scope& scope, BoundCore& core) {
  using Join = tsql::TableSource::Join;
  const bool turned = join.join == Join::right;
  const tsql::TableSource& first = turned ? *join.right : *join.left;
  const tsql::TableSource& second = turned ? *join.left : *join.right;
  const bool outer = turned || join.join == Join::left;
  if (join.join == Join::full || (outer && second.kind == tsql::TableSource::Kind::join))
    throw unsupported("This form of outer join");
  bindSource(first, scope, core);
  bindSource(second, scope, core);
  core.from.back().crossJoin = join.join == Join::cross;
  if (!join.on) return;
  BoundPtr on = bind(*join.on, scope);
  if (on->aggregate)
    throw tsql::sqlFailure(1015,
                           "An aggregate cannot appear in an ON clause unless it is in a subquery contained in a "
                           "HAVING clause or select list, and the column being aggregated is an outer reference.");
  if (outer) {
    core.from.back().leftJoin = true;
    core.from.back().on = std::move(on);
  } else {
    core.where.push_back(std::move(on));
  }
}

Binder::ScopeSource Binder::tableScope(const TableInfo& table, const std::string& name) {
  ScopeSource source{name, newAlias(), {}, &table, {}};
  for (std::size_t i = 0; i < table.columns.size(); ++i) {
    const ColumnInfo& column = table.columns[i];
    source.columns.push_back({column.name, quoteName(column.name), column.type, column.type.isText(), i});
  }
  return source;
}

std::optional<std::size_t> Binder::databaseOf(const tsql::TableSource& source) const {
  if (source.alias) return std::nullopt;
  return source.table.database.empty() ? std::optional(database_) : databaseByName(source.table.database);
}

bool Binder::isNamed(const ScopeSource& source, const std::vector<String>& qualifier) {
  if (!sameName(source.name, qualifier.back())) return false;
  if (qualifier.size() == 1) return true;
  const String& owner = qualifier[qualifier.size() - 2];
  if (!source.database || !isOwner(owner)) return false;
  const String& database = qualifier.size() > 2 ? qualifier[qualifier.size() - 3] : String();
  return database.empty() || databaseByName(database) == source.database;
}

void Binder::addScope(Scope& scope, ScopeSource source) {
  for (const auto& other : scope.sources)
    if (!source.name.empty() && sameName(other.name, source.name))
      throw tsql::sqlFailure(1013, "The objects \"" + source.name + "\" and \"" + other.name +
                                       "\" in the FROM clause have the same exposed names. Use correlation names to "
                                       "distinguish them.");
  scope.sources.push_back(std::move(source));
}

Binder::CommonTable* Binder::commonTable(const tsql::ObjectName& name) {
  if (!name.database.empty() || !name.owner.empty()) return nullptr;
  const auto found = std::find_if(commonTables_.rbegin(), commonTables_.rend(),
                                  [&](const CommonTable& table) { return sameName(table.name, name.name); });
  return found == commonTables_.rend() ? nullptr : &*found;
}

// A common table reads itself once in each part behind its first, and directly.
void Binder::readRecursively(CommonTable& table) {
  if (selectDepth_ != table.depth) throw tsql::sqlFailure(465, "Recursive references are not allowed in subqueries.");
  if (++table.reads > 1)
    throw tsql::sqlFailure(
        253, "Recursive member of a common table expression '" + table.name + "' has multiple recursive references.");
}

void Binder::bindTable(const tsql::TableSource& source, Scope& scope, BoundCore& core) {
  const std::string name = source.alias.value_or(source.table.name);
  if (CommonTable* common = commonTable(source.table)) {
    if (common->isOpen) readRecursively(*common);
    ScopeSource found{name, newAlias(), common->columns, nullptr, {}};
    core.from.push_back({.alias = found.alias, .commonTable = common->emitted, .tables = common->tables});
    return addScope(scope, std::move(found));
  }
  const Object object = catalogue_.find(source.table, database_);
  if (const auto* table = std::get_if<const TableInfo*>(&object)) {
    ScopeSource found = tableScope(**table, name);
    found.database = databaseOf(source);
    core.from.push_back({.alias = found.alias, .table = *table});
    return addScope(scope, std::move(found));
  }
  BoundSelectPtr view = bindView(*std::get<const ViewInfo*>(object));
  ScopeSource found{name, newAlias(), resultColumns(*view), nullptr, databaseOf(source)};
  const std::size_t tables = tablesIn(*view);
  core.from.push_back({.alias = found.alias, .derived = std::move(view), .tables = tables});
  addScope(scope, std::move(found));
}

BoundSelectPtr Binder::bindView(const ViewInfo& view) {
  if (viewDepth_ == viewDepthLimit)
    throw tsql::sqlFailure(4413, "Could not use view or function '" + view.name + "' because of binding errors.");
  // The view's names mean what they mean in its own database, whatever surrounds it.
  Binder inner(catalogue_, view.database, deadline_);
  inner.parameters_ = std::move(parameters_);
  inner.aliases_ = aliases_;
  inner.nodes_ = nodes_;
  inner.viewDepth_ = viewDepth_ + 1;
  inner.ownLiterals_ = true;
  BoundSelectPtr select = inner.bindSelect(*view.definition.select, nullptr);
  parameters_ = std::move(inner.parameters_);
  aliases_ = inner.aliases_;
  nodes_ = inner.nodes_;
  nameColumns(select->parts.front().core, view.definition.columns, view.name);
  return select;
}

void Binder::bindDerived(const tsql::TableSource& source, Scope& scope, BoundCore& core) {
  BoundSelectPtr select = bindInner(*source.derived, scope.outer);
  const std::string name = source.alias.value_or("");
  nameColumns(select->parts.front().core, source.columnNames, name);
  ScopeSource found{name, newAlias(), resultColumns(*select), nullptr, {}};
  const std::size_t tables = tablesIn(*select);
  core.from.push_back({.alias = found.alias, .derived = std::move(select), .tables = tables});
  addScope(scope, std::move(found));
}

// Gives the columns of a derived or common table the names of its list. Each has to have one, of its own.
void Binder::nameColumns(BoundCore& core, const std::vector<String>& names, const std::string& table) {
  auto& items = core.items;
  if (!names.empty() && items.size() != names.size())
    throw tsql::sqlFailure(items.size() > names.size() ? 8158 : 8159,
                           "'" + table + "' has " + (items.size() > names.size() ? "more" : "fewer") +
                               " columns than were specified in the column list.");
  std::set<std::string> known;
  for (std::size_t i = 0; i < items.size(); ++i) {
    if (!names.empty()) items[i].name = names[i];
    if (items[i].name.empty())
      throw tsql::sqlFailure(
          8155, "No column name was specified for column " + std::to_string(i + 1) + " of '" + table + "'.");
    if (!known.insert(foldName(items[i].name)).second)
      throw tsql::sqlFailure(8156,
                             "The column '" + items[i].name + "' was specified multiple times for '" + table + "'.");
  }
}

}  // namespace QVSa::embedded
