#include <algorithm>
#include <set>

#include "providers/embedded/bind/Binder.h"
#include "providers/tsql/SqlFailure.h"
#include "providers/tsql/TreeWalk.h"

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

Failure repeatedColumn(const std::string& name) {
  return tsql::sqlFailure(
      264, "The column name '" + name + "' is specified more than once in the SET clause or column list of an INSERT.");
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
  source.database = target.database.empty() ? std::optional(database_) : databaseByName(target.database);
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
  if (where) core.where.push_back(bindWhere(*where, scope));
  return select;
}

BoundPtr Binder::bindStored(const tsql::Expression& expression, const ColumnInfo& column, const Scope& scope) {
  stores_ = true;
  BoundPtr value = bind(expression, scope);
  stores_ = false;
  if (value->aggregate)
    throw tsql::sqlFailure(157, "An aggregate may not appear in the set list of an UPDATE statement.");
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
  std::set<std::size_t> known;
  for (const auto& name : insert.columns) {
    const auto column = table.find(name);
    if (!column) throw tsql::sqlFailure(207, "Invalid column name '" + name + "'.");
    if (!known.insert(*column).second) throw repeatedColumn(name);
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
  if (bound.givesIdentity) requireIdentity(bound);
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

// SQLite would make a value where the statement gives NULL.
void Binder::requireIdentity(BoundInsert& insert) {
  const auto place =
      static_cast<std::size_t>(std::ranges::find(insert.columns, *insert.table->identity) - insert.columns.begin());
  const auto require = [](BoundPtr& value) {
    const Type type = value->type;
    std::vector<BoundPtr> operands;
    operands.push_back(std::move(value));
    operands.push_back(call("t_no_identity", type, {}));
    value = call("ifnull", type, std::move(operands));
  };
  for (auto& row : insert.rows) require(row[place]);
  if (!insert.select) return;
  for (auto& part : insert.select->parts) require(part.core.items[place].expression);
}

void Binder::checkDefault(const ColumnInfo& column) {
  if (!column.defaultValue) return;
  tsql::walkExpression(*column.defaultValue, [](const tsql::Expression& part) {
    if (part.kind == tsql::Expression::Kind::column)
      throw tsql::sqlFailure(128, "The name \"" + part.name +
                                      "\" is not permitted in this context. Valid expressions are constants, constant "
                                      "expressions, and (in some contexts) variables. Column names are not permitted.");
    if (part.select)
      throw tsql::sqlFailure(1046, "Subqueries are not allowed in this context. Only scalar expressions are allowed.");
  });
  bindStored(*column.defaultValue, column, {});
}

void Binder::storeItems(BoundSelect& select, const BoundInsert& insert) {
  for (auto& part : select.parts)
    for (std::size_t i = 0; i < part.core.items.size(); ++i) {
      BoundPtr& item = part.core.items[i].expression;
      item = coerce(std::move(item), insert.table->columns[insert.columns[i]].type, Purpose::store);
    }
}

// The rows of an update with their new values, as one select: the row's key is its first item.
BoundSelectPtr Binder::bindNewValues(const tsql::Update& update) {
  const TableInfo& table = writeTarget(update.target, update.from);
  auto select = std::make_unique<BoundSelect>();
  BoundCore& core = select->parts.emplace_back().core;
  Scope scope;
  const ScopeSource& target = scope.sources[bindWriteScope(update.target, update.from, scope, core)];
  core.items.push_back({rowid(target.alias), "", std::nullopt});
  std::set<std::size_t> assigned;
  for (const auto& assignment : update.assignments) {
    if (!assignment.qualifier.empty() && !isNamed(target, assignment.qualifier))
      throw tsql::sqlFailure(4104, "The multi-part identifier \"" + assignment.qualifier.back() + "." +
                                       assignment.column + "\" could not be bound.");
    const auto column = table.find(assignment.column);
    if (!column) throw tsql::sqlFailure(207, "Invalid column name '" + assignment.column + "'.");
    if (column == table.identity)
      throw tsql::sqlFailure(8102, "Cannot update identity column '" + assignment.column + "'.");
    if (!assigned.insert(*column).second) throw repeatedColumn(assignment.column);
    core.items.push_back({bindStored(*assignment.value, table.columns[*column], scope), "", *column});
  }
  if (update.where) core.where.push_back(bindWhere(*update.where, scope));
  return select;
}

BoundUpdate Binder::bindUpdate(const tsql::Update& update) {
  BoundUpdate bound;
  BoundSelectPtr rows = bindNewValues(update);
  BoundCore& core = rows->parts.front().core;
  bound.table = &writeTarget(update.target, update.from);
  bound.alias = core.items.front().expression->source;
  for (std::size_t i = 1; i < core.items.size(); ++i) {
    BoundItem& item = core.items[i];
    bound.assignments.emplace_back(*item.tableColumn, update.from.empty() ? std::move(item.expression) : nullptr);
  }
  if (update.from.empty())
    bound.where = std::move(core.where);
  else
    bound.from = std::move(rows);
  return bound;
}

BoundDelete Binder::bindDelete(const tsql::Delete& erase) {
  BoundDelete bound;
  bound.table = &writeTarget(erase.target, erase.from);
  if (erase.from.empty()) {
    BoundCore core;
    Scope scope;
    bound.alias = scope.sources[bindWriteScope(erase.target, {}, scope, core)].alias;
    if (erase.where) bound.where.push_back(bindWhere(*erase.where, scope));
  } else {
    bound.from = keysOf(erase.target, erase.from, erase.where.get());
  }
  return bound;
}

}  // namespace QVSa::embedded
