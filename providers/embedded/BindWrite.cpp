#include <algorithm>
#include <set>

#include "providers/embedded/Binder.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

// The table source of a from clause that a write's target names: by its alias, else by its table.
const tsql::TableSource* sourceNamed(const std::vector<tsql::TableSourcePtr>& from, const tsql::ObjectName& target) {
  const auto find = [&](auto&& self, const tsql::TableSource& source) -> const tsql::TableSource* {
    if (source.kind == tsql::TableSource::Kind::join) {
      const auto* left = self(self, *source.left);
      return left ? left : self(self, *source.right);
    }
    if (source.kind != tsql::TableSource::Kind::table) return nullptr;
    return sameName(source.alias.value_or(source.table.name), target.name) ? &source : nullptr;
  };
  for (const auto& source : from)
    if (const auto* found = find(find, *source)) return found;
  return nullptr;
}

}  // namespace

const TableInfo& Binder::writeTarget(const tsql::ObjectName& target,
                                     const std::vector<tsql::TableSourcePtr>& from) const {
  const tsql::TableSource* source = sourceNamed(from, target);
  const Object object = catalogue_.find(source ? source->table : target, database_);
  if (const auto* table = std::get_if<const TableInfo*>(&object)) return **table;
  throw tsql::sqlFailure(4406, "Update or insert of view or function '" + target.name +
                                   "' failed because it is not "
                                   "updatable by the embedded engine.");
}

std::size_t Binder::bindWriteScope(const tsql::ObjectName& target, const std::vector<tsql::TableSourcePtr>& from,
                                   Scope& scope, BoundCore& core) {
  bindFrom(from, scope, core);
  const auto named = std::ranges::find_if(
      scope.sources, [&](const ScopeSource& source) { return sameName(source.name, target.name) && source.table; });
  if (named != scope.sources.end()) return static_cast<std::size_t>(named - scope.sources.begin());
  // By its table where it stands there under another name; a target that does not stand there is joined to the rest.
  const TableInfo& table = writeTarget(target, from);
  const auto isTarget = [&](const ScopeSource& source) { return source.table == &table; };
  if (std::ranges::count_if(scope.sources, isTarget) > 1)
    throw tsql::sqlFailure(8154, "The table '" + target.name + "' is ambiguous.");
  if (const auto found = std::ranges::find_if(scope.sources, isTarget); found != scope.sources.end())
    return static_cast<std::size_t>(found - scope.sources.begin());
  ScopeSource source = tableScope(table, target.name);
  core.from.insert(core.from.begin(), {.alias = source.alias, .table = &table});
  scope.sources.insert(scope.sources.begin(), std::move(source));
  return 0;
}

BoundSelectPtr Binder::keysOf(const tsql::ObjectName& target, const std::vector<tsql::TableSourcePtr>& from,
                              const tsql::Expression* where) {
  auto select = std::make_unique<BoundSelect>();
  select->parts.emplace_back();
  BoundCore& core = select->parts.front().core;
  Scope scope;
  const std::size_t place = bindWriteScope(target, from, scope, core);
  core.items.push_back({rowid(scope.sources[place].alias), "", std::nullopt});
  if (where) core.where.push_back(bind(*where, scope));
  return select;
}

BoundPtr Binder::bindStored(const tsql::Expression& expression, const ColumnInfo& column, const Scope& scope) {
  stores_ = true;
  BoundPtr value = bind(expression, scope);
  stores_ = false;
  if (value->type.isDate() && column.type.isNumber() && column.type.isWhole())
    throw tsql::sqlFailure(257,
                           "Implicit conversion from data type datetime to int is not allowed. Use the CONVERT "
                           "function to run this query.");
  return coerce(std::move(value), column.type, Purpose::store);
}

std::vector<std::size_t> Binder::insertColumns(const tsql::Insert& insert, const TableInfo& table) const {
  std::vector<std::size_t> columns;
  if (insert.columns.empty()) {
    for (std::size_t i = 0; i < table.columns.size(); ++i)
      if (i != table.identity) columns.push_back(i);
    return columns;
  }
  for (const auto& name : insert.columns) {
    const auto column = table.find(name);
    if (!column) throw tsql::sqlFailure(207, "Invalid column name '" + name + "'.");
    if (std::ranges::find(columns, *column) != columns.end())
      throw tsql::sqlFailure(264, "The column name '" + name +
                                      "' is specified more than once in the SET clause or column "
                                      "list of an INSERT.");
    columns.push_back(*column);
  }
  return columns;
}

BoundInsert Binder::bindInsert(const tsql::Insert& insert) {
  BoundInsert bound;
  bound.table = &writeTarget(insert.table, {});
  bound.columns = insertColumns(insert, *bound.table);
  bound.givesIdentity =
      bound.table->identity && std::ranges::find(bound.columns, *bound.table->identity) != bound.columns.end();
  const std::size_t given = bound.columns.size();
  const auto countFailure = [] {
    return tsql::sqlFailure(213, "Column name or number of supplied values does not match table definition.");
  };
  if (insert.select) {
    stores_ = true;
    bound.select = bindSelect(*insert.select, nullptr);
    stores_ = false;
    for (const auto& part : bound.select->parts)
      if (part.core.items.size() != given)
        throw insert.columns.empty() ? countFailure()
        : part.core.items.size() < given
            ? tsql::sqlFailure(120,
                               "The select list for the INSERT statement contains fewer items than the insert "
                               "list. The number of SELECT values must match the number of INSERT columns.")
            : tsql::sqlFailure(121,
                               "The select list for the INSERT statement contains more items than the insert "
                               "list. The number of SELECT values must match the number of INSERT columns.");
  }
  for (const auto& values : insert.values) {
    if (values.size() != given) throw countFailure();
    std::vector<BoundPtr> row;
    for (std::size_t i = 0; i < given; ++i)
      row.push_back(bindStored(*values[i], bound.table->columns[bound.columns[i]], {}));
    bound.rows.push_back(std::move(row));
  }
  addDefaults(bound, given);
  if (bound.select) storeItems(*bound.select, bound);
  return bound;
}

// A column that is not named gets its default by the statement itself, so that the default's own dialect holds.
void Binder::addDefaults(BoundInsert& insert, std::size_t given) {
  for (std::size_t i = 0; i < insert.table->columns.size(); ++i) {
    const ColumnInfo& column = insert.table->columns[i];
    const bool named = std::find(insert.columns.begin(), insert.columns.begin() + static_cast<std::ptrdiff_t>(given),
                                 i) != insert.columns.begin() + static_cast<std::ptrdiff_t>(given);
    if (named || !column.defaultValue) continue;
    insert.columns.push_back(i);
    const auto value = [&] {
      ownLiterals_ = true;
      BoundPtr bound = bindStored(*column.defaultValue, column, {});
      ownLiterals_ = false;
      return bound;
    };
    for (auto& row : insert.rows) row.push_back(value());
    if (!insert.select) continue;
    for (auto& part : insert.select->parts) part.core.items.push_back({value(), "", std::nullopt});
  }
}

void Binder::storeItems(BoundSelect& select, const BoundInsert& insert) {
  for (auto& part : select.parts)
    for (std::size_t i = 0; i < part.core.items.size(); ++i) {
      BoundPtr& item = part.core.items[i].expression;
      item = coerce(std::move(item), insert.table->columns[insert.columns[i]].type, Purpose::store);
    }
}

BoundUpdate Binder::bindUpdate(const tsql::Update& update) {
  BoundUpdate bound;
  bound.table = &writeTarget(update.target, update.from);
  BoundCore core;
  Scope scope;
  const std::size_t place = bindWriteScope(update.target, update.from, scope, core);
  bound.alias = scope.sources[place].alias;
  for (const auto& assignment : update.assignments) {
    const auto column = bound.table->find(assignment.column);
    if (!column) throw tsql::sqlFailure(207, "Invalid column name '" + assignment.column + "'.");
    if (column == bound.table->identity)
      throw tsql::sqlFailure(8102, "Cannot update identity column '" + assignment.column + "'.");
    BoundPtr value = bindStored(*assignment.value, bound.table->columns[*column], scope);
    if (value->aggregate)
      throw tsql::sqlFailure(157, "An aggregate may not appear in the set list of an UPDATE statement.");
    bound.assignments.emplace_back(*column, std::move(value));
  }
  if (update.where) core.where.push_back(bind(*update.where, scope));
  if (update.from.empty()) {
    bound.where = std::move(core.where);
  } else {
    core.items.push_back({rowid(bound.alias), "", std::nullopt});
    for (auto& [column, value] : bound.assignments) core.items.push_back({std::move(value), "", std::nullopt});
    bound.from = std::make_unique<BoundSelect>();
    bound.from->parts.push_back({false, std::move(core)});
  }
  bound.claim = {bound.table, keysOf(update.target, update.from, update.where.get()), false, false};
  return bound;
}

BoundDelete Binder::bindDelete(const tsql::Delete& erase) {
  BoundDelete bound;
  bound.table = &writeTarget(erase.target, erase.from);
  if (erase.from.empty()) {
    BoundCore core;
    Scope scope;
    bound.alias = scope.sources[bindWriteScope(erase.target, {}, scope, core)].alias;
    if (erase.where) bound.where.push_back(bind(*erase.where, scope));
  } else {
    bound.from = keysOf(erase.target, erase.from, erase.where.get());
  }
  bound.claim = {bound.table, keysOf(erase.target, erase.from, erase.where.get()), false, false};
  return bound;
}

}  // namespace QVSa::embedded
