#include <algorithm>

#include "providers/embedded/Binder.h"
#include "providers/tsql/OuterJoins.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

// Deeper than any view of ours stands on others; a view that reads itself ends here.
constexpr std::size_t viewDepthLimit = 32;

}  // namespace

void Binder::bindFrom(const std::vector<tsql::TableSourcePtr>& from, Scope& scope, BoundCore& core) {
  for (const auto& source : from) bindSource(*source, scope, core);
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
    throw tsql::sqlFailure(40515, "This form of outer join is not supported by the embedded engine.");
  bindSource(first, scope, core);
  bindSource(second, scope, core);
  core.from.back().crossJoin = join.join == Join::cross;
  if (!join.on) return;
  BoundPtr on = bind(*join.on, scope);
  if (outer) {
    core.from.back().leftJoin = true;
    core.from.back().on = std::move(on);
  } else {
    core.where.push_back(std::move(on));
  }
}

Binder::ScopeSource Binder::tableScope(const TableInfo& table, const std::string& name) {
  ScopeSource source{name, newAlias(), {}, &table};
  for (std::size_t i = 0; i < table.columns.size(); ++i) {
    const ColumnInfo& column = table.columns[i];
    source.columns.push_back({column.name, quoteName(column.name), column.type, column.type.isText(), i});
  }
  return source;
}

void Binder::addScope(Scope& scope, ScopeSource source) {
  for (const auto& other : scope.sources)
    if (!source.name.empty() && sameName(other.name, source.name))
      throw tsql::sqlFailure(1013, "The objects \"" + source.name + "\" and \"" + other.name +
                                       "\" in the FROM clause have the same exposed names. Use correlation names to "
                                       "distinguish them.");
  scope.sources.push_back(std::move(source));
}

const Binder::CommonTable* Binder::commonTable(const tsql::ObjectName& name) const {
  if (!name.database.empty() || !name.owner.empty()) return nullptr;
  const auto found = std::find_if(commonTables_.rbegin(), commonTables_.rend(),
                                  [&](const CommonTable& table) { return sameName(table.name, name.name); });
  return found == commonTables_.rend() ? nullptr : &*found;
}

void Binder::bindTable(const tsql::TableSource& source, Scope& scope, BoundCore& core) {
  const std::string name = source.alias.value_or(source.table.name);
  if (const CommonTable* common = commonTable(source.table)) {
    ScopeSource found{name, newAlias(), common->columns, nullptr};
    core.from.push_back({.alias = found.alias, .commonTable = common->emitted});
    return addScope(scope, std::move(found));
  }
  const Object object = catalogue_.find(source.table, database_);
  if (const auto* table = std::get_if<const TableInfo*>(&object)) {
    ScopeSource found = tableScope(**table, name);
    core.from.push_back({.alias = found.alias, .table = *table});
    return addScope(scope, std::move(found));
  }
  BoundSelectPtr view = bindView(*std::get<const ViewInfo*>(object));
  ScopeSource found{name, newAlias(), resultColumns(*view), nullptr};
  core.from.push_back({.alias = found.alias, .derived = std::move(view)});
  addScope(scope, std::move(found));
}

BoundSelectPtr Binder::bindView(const ViewInfo& view) {
  if (viewDepth_ == viewDepthLimit)
    throw tsql::sqlFailure(4413, "Could not use view or function '" + view.name + "' because of binding errors.");
  // The view's names mean what they mean in its own database, whatever surrounds it.
  Binder inner(catalogue_, view.database, deadline_);
  inner.parameters_ = std::move(parameters_);
  inner.aliases_ = aliases_;
  inner.viewDepth_ = viewDepth_ + 1;
  inner.ownLiterals_ = true;
  BoundSelectPtr select = inner.bindSelect(*view.definition.select, nullptr);
  parameters_ = std::move(inner.parameters_);
  aliases_ = inner.aliases_;
  auto& items = select->parts.front().core.items;
  for (std::size_t i = 0; i < view.definition.columns.size() && i < items.size(); ++i)
    items[i].name = view.definition.columns[i];
  return select;
}

void Binder::bindDerived(const tsql::TableSource& source, Scope& scope, BoundCore& core) {
  BoundSelectPtr select = bindSelect(*source.derived, scope.outer);
  auto& items = select->parts.front().core.items;
  if (!source.columnNames.empty() && source.columnNames.size() != items.size())
    throw tsql::sqlFailure(8158, "'" + source.alias.value_or("") +
                                     "' has a different number of columns than were "
                                     "specified in the column list.");
  for (std::size_t i = 0; i < source.columnNames.size(); ++i) items[i].name = source.columnNames[i];
  ScopeSource found{source.alias.value_or(""), newAlias(), resultColumns(*select), nullptr};
  for (std::size_t i = 0; i < found.columns.size(); ++i)
    if (found.columns[i].name.empty())
      throw tsql::sqlFailure(
          8155, "No column name was specified for column " + std::to_string(i + 1) + " of '" + found.name + "'.");
  core.from.push_back({.alias = found.alias, .derived = std::move(select)});
  addScope(scope, std::move(found));
}

}  // namespace QVSa::embedded
