#include <algorithm>

#include "providers/embedded/bind/Binder.h"
#include "providers/embedded/bind/EntryOrder.h"
#include "providers/embedded/bind/TypeRules.h"
#include "providers/embedded/storage/StorageFailure.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

using Kind = tsql::Expression::Kind;

// SQLite takes 500.
constexpr std::size_t mostParts = 500;
// SQLite takes 2,000 results, groups and keys of an order; an updatable row set has a column more, an order one or two
// keys.
constexpr std::size_t mostColumns = 1990;

std::string resultColumn(std::size_t place) { return "\"c" + std::to_string(place) + "\""; }

void requireNoOrder(const tsql::Select& select) {
  if (select.orderBy.empty() || select.parts.front().core.top) return;
  throw tsql::sqlFailure(1033,
                         "The ORDER BY clause is invalid in views, inline functions, derived tables, subqueries, and "
                         "common table expressions, unless TOP, OFFSET or FOR XML is also specified.");
}

// What the part of a common table that reads the table itself cannot have.
void checkRecursive(const tsql::Select::Part& part, const BoundCore& bound, const std::string& table) {
  const auto refuse = [&](Long number, const std::string& what) {
    throw tsql::sqlFailure(number,
                           what + " in the recursive part of a recursive common table expression '" + table + "'.");
  };
  if (!part.all)
    throw tsql::sqlFailure(
        252, "Recursive common table expression '" + table + "' does not contain a top-level UNION ALL operator.");
  if (bound.distinct) refuse(460, "DISTINCT operator is not allowed");
  if (bound.top) refuse(461, "TOP operator is not allowed");
  const bool hasOuter = std::ranges::any_of(bound.from, &BoundSource::leftJoin);
  if (hasOuter) refuse(462, "Outer join is not allowed");
  const bool hasAggregates =
      std::ranges::any_of(bound.items, [](const BoundItem& item) { return item.expression->aggregate; });
  if (hasAggregates || bound.having || !bound.groupBy.empty())
    refuse(467, "GROUP BY, HAVING, or aggregate functions are not allowed");
}

const BoundExpression& withoutCollation(const BoundExpression& expression) {
  const bool collation = expression.kind == BoundExpression::Kind::infix && expression.text == "collate";
  return collation ? *expression.operands[0] : expression;
}

}  // namespace

void requireOneColumn(const BoundSelect& select) {
  for (const auto& part : select.parts)
    if (part.core.items.size() != 1)
      throw tsql::sqlFailure(116,
                             "Only one expression can be specified in the select list when the subquery is not "
                             "introduced with EXISTS.");
}

BoundQuery Binder::bindQuery(const tsql::Select& select, bool updatable) {
  BoundQuery query;
  query.select = bindSelect(select, nullptr);
  BoundCore& core = query.select->parts.front().core;
  const bool oneTable = select.parts.size() == 1 && core.from.size() == 1 && core.from.front().table;
  const bool hasAggregates =
      std::ranges::any_of(core.items, [](const BoundItem& item) { return item.expression->aggregate; });
  if (updatable && oneTable && !core.distinct && core.groupBy.empty() && !core.having && !hasAggregates) {
    query.updatable = core.from.front().table;
    core.items.push_back({rowid(core.from.front().alias), "", std::nullopt});
  }
  if (!oneTable || select.parts.front().core.from.front()->hints.empty()) return query;

  const auto& source = *select.parts.front().core.from.front();
  const auto hinted = [&](const char* hint) { return std::ranges::find(source.hints, hint) != source.hints.end(); };
  if (!hinted("xlock") && !hinted("readpast")) return query;
  RowClaim claim{core.from.front().table, nullptr, hinted("xlock"), hinted("readpast")};
  tsql::ObjectName table = source.table;
  if (source.alias) table = {"", "", *source.alias, 0};
  claim.candidates = keysOf(table, select.parts.front().core.from, select.parts.front().core.where.get());
  Parameter locked;
  locked.source = Parameter::Source::lockedRows;
  BoundPtr mine = std::make_unique<BoundExpression>();
  mine->kind = BoundExpression::Kind::call;
  mine->text = "t_listed";
  mine->operands.push_back(rowid(core.from.front().alias));
  mine->operands.push_back(parameter(locked));
  core.where.push_back(std::move(mine));
  query.claim = std::move(claim);
  return query;
}

BoundSelectPtr Binder::bindSelect(const tsql::Select& select, const Scope* outer) {
  auto bound = std::make_unique<BoundSelect>();
  const std::size_t visible = commonTables_.size();
  ++selectDepth_;
  bindCommonTables(select, *bound, outer);
  Scope scope;
  if (select.parts.size() > mostParts) tsql::refuseDepth();
  for (const auto& part : select.parts) {
    scope = {};
    scope.outer = outer;
    bound->parts.push_back({part.all, bindCore(part.core, scope)});
  }
  if (select.parts.size() > 1) unifyParts(*bound);
  collateResult(*bound);
  bindOrder(select, *bound, scope);
  commonTables_.resize(visible);
  --selectDepth_;
  return bound;
}

BoundSelectPtr Binder::bindInner(const tsql::Select& select, const Scope* outer) {
  requireNoOrder(select);
  return bindSelect(select, outer);
}

// A select that stands for a value fails where it has a second row.
BoundPtr Binder::bindSubquery(const tsql::Select& select, const Scope& scope) {
  auto subquery = std::make_unique<BoundExpression>();
  subquery->kind = BoundExpression::Kind::subquery;
  subquery->select = bindInner(select, &scope);
  requireOneColumn(*subquery->select);
  BoundCore& core = subquery->select->parts.front().core;
  subquery->type = core.items.front().expression->type;
  const bool isPlain = subquery->select->parts.size() == 1 && !core.top && !core.distinct && core.groupBy.empty();
  if (isPlain && (core.from.empty() || core.having || core.items.front().expression->aggregate)) return subquery;
  const auto single = [&](BoundPtr value) {
    std::vector<BoundPtr> operands;
    operands.push_back(std::move(value));
    BoundPtr one = call("t_single", subquery->type, std::move(operands));
    one->aggregate = true;
    return one;
  };
  // An aggregate over a column from outside would be one of the select outside.
  const BoundExpression& item = *core.items.front().expression;
  const bool isOwn = item.kind == BoundExpression::Kind::column &&
                     std::ranges::find(core.from, item.source, &BoundSource::alias) != core.from.end();
  if (isPlain && isOwn) {
    core.items.front().expression = single(std::move(core.items.front().expression));
    return subquery;
  }
  auto outer = std::make_unique<BoundSelect>();
  BoundCore& whole = outer->parts.emplace_back().core;
  const std::string alias = newAlias();
  auto column = std::make_unique<BoundExpression>();
  column->kind = BoundExpression::Kind::column;
  column->source = alias;
  column->text = resultColumn(0);
  whole.items.push_back({single(std::move(column)), "", std::nullopt});
  whole.from.push_back({.alias = alias, .derived = std::move(subquery->select)});
  subquery->select = std::move(outer);
  return subquery;
}

void Binder::checkView(const tsql::CreateView& view) {
  requireNoOrder(*view.select);
  const BoundSelectPtr bound = bindSelect(*view.select, nullptr);
  nameColumns(bound->parts.front().core, view.columns, view.view.name);
}

void Binder::bindCommonTables(const tsql::Select& select, BoundSelect& bound, const Scope* outer) {
  for (const auto& table : select.with) {
    const std::string emitted = "c" + std::to_string(++aliases_);
    BoundSelectPtr body = bindRecursion(table, emitted, outer);
    const std::size_t columns = body->parts.front().core.items.size();
    commonTables_.back().isOpen = false;
    commonTables_.back().tables = tablesIn(*body);
    bound.with.push_back({emitted, columns, std::move(body)});
  }
}

// A common table may read itself: its first parts give the columns, those behind them are bound with the name known.
BoundSelectPtr Binder::bindRecursion(const tsql::Select::CommonTable& table, const std::string& emitted,
                                     const Scope* outer) {
  const auto& parts = table.select->parts;
  const auto add = [&](BoundSelect& body) {
    nameColumns(body.parts.front().core, table.columns, table.name);
    commonTables_.push_back({table.name, emitted, resultColumns(body), 1, true, selectDepth_, 0});
  };
  BoundSelectPtr body;
  if (parts.size() == 1) {
    body = bindInner(*table.select, outer);
    add(*body);
    return body;
  }
  requireNoOrder(*table.select);
  if (parts.size() > mostParts) tsql::refuseDepth();
  body = std::make_unique<BoundSelect>();
  bool isRecursive = false;
  for (const auto& part : parts) {
    Scope scope;
    scope.outer = outer;
    const bool isFirst = body->parts.empty();
    if (!isFirst) commonTables_.back().reads = 0;
    body->parts.push_back({part.all, bindCore(part.core, scope)});
    if (isFirst) {
      add(*body);
      continue;
    }
    const bool reads = commonTables_.back().reads > 0;
    if (reads) checkRecursive(part, body->parts.back().core, table.name);
    if (isRecursive && !reads)
      throw tsql::sqlFailure(
          247, "An anchor member was found in the recursive query part of recursive query \"" + table.name + "\".");
    isRecursive = reads;
  }
  unifyParts(*body);
  return body;
}

BoundPtr Binder::bindWhere(const tsql::Expression& where, const Scope& scope) {
  BoundPtr condition = bind(where, scope);
  if (condition->aggregate)
    throw tsql::sqlFailure(147,
                           "An aggregate may not appear in the WHERE clause unless it is in a subquery contained in a "
                           "HAVING clause or a select list, and the column being aggregated is an outer reference.");
  return condition;
}

BoundCore Binder::bindCore(const tsql::SelectCore& core, Scope& scope) {
  BoundCore bound;
  bound.distinct = core.distinct;
  if (core.topPercent) throw unsupported("TOP PERCENT");
  bindFrom(core.from, scope, bound);
  if (core.top) {
    Parameter top = literalParameter(*core.top, Parameter::Source::literal);
    top.type = {Base::bigint, -1};
    top.converted = true;
    bound.top = parameter(top)->parameter;
  }
  if (core.where) bound.where.push_back(bindWhere(*core.where, scope));
  bindItems(core, scope, bound);
  if (bound.items.size() > mostColumns)
    throw tsql::sqlFailure(1056, "The number of elements in the select list exceeds the maximum allowed number of " +
                                     std::to_string(mostColumns) + " elements.");
  if (core.groupBy.size() > mostColumns) refuseSize();
  for (const auto& expression : core.groupBy) {
    bound.groupBy.push_back(collate(bind(*expression, scope)));
    if (!readsOwn(*bound.groupBy.back(), scope))
      throw tsql::sqlFailure(
          164, "Each GROUP BY expression must contain at least one column that is not an outer reference.");
    if (bound.groupBy.back()->aggregate)
      throw tsql::sqlFailure(144,
                             "Cannot use an aggregate or a subquery in an expression used for the group by list of a "
                             "GROUP BY clause.");
  }
  if (core.having) bound.having = bind(*core.having, scope);
  checkGroup(bound, scope);
  return bound;
}

void Binder::bindItems(const tsql::SelectCore& core, const Scope& scope, BoundCore& bound) {
  for (const auto& item : core.items) {
    const tsql::Expression& expression = *item.expression;
    if (expression.kind == Kind::star) {
      addStar(expression, scope, bound);
      continue;
    }
    BoundItem result;
    if (expression.kind == Kind::column) {
      const Found found = findColumn(expression, scope);
      result.name = found.column->name;
      result.tableColumn = found.column->tableColumn;
    }
    if (item.alias) result.name = *item.alias;
    result.aliased = item.alias.has_value();
    result.expression = bind(expression, scope);
    bound.items.push_back(std::move(result));
  }
}

void Binder::addStar(const tsql::Expression& star, const Scope& scope, BoundCore& bound) {
  bool known = false;
  for (const auto& source : scope.sources) {
    if (!star.qualifier.empty() && !isNamed(source, star.qualifier)) continue;
    known = true;
    for (const auto& column : source.columns) {
      countNode();
      auto expression = std::make_unique<BoundExpression>();
      expression->kind = BoundExpression::Kind::column;
      expression->source = source.alias;
      expression->text = column.emitted;
      expression->type = column.type;
      expression->collated = column.collated;
      bound.items.push_back({std::move(expression), column.name, column.tableColumn});
    }
  }
  if (known) return;
  if (star.qualifier.empty()) throw tsql::sqlFailure(263, "Must specify table to select from.");
  throw tsql::sqlFailure(107, "The column prefix '" + star.qualifier.back() +
                                  "' does not match with a table name or "
                                  "alias name used in the query.");
}

bool Binder::readsColumn(const BoundExpression& expression) {
  return expression.kind == BoundExpression::Kind::column ||
         std::ranges::any_of(expression.operands, [](const BoundPtr& operand) { return readsColumn(*operand); });
}

bool Binder::readsOwn(const BoundExpression& expression, const Scope& scope) {
  const bool isOwn =
      expression.kind == BoundExpression::Kind::column &&
      std::ranges::any_of(scope.sources, [&](const ScopeSource& source) { return source.alias == expression.source; });
  return isOwn ||
         std::ranges::any_of(expression.operands, [&](const BoundPtr& operand) { return readsOwn(*operand, scope); });
}

bool Binder::readsOutside(const BoundExpression& expression, const Scope& scope) {
  if (expression.kind == BoundExpression::Kind::column) return !readsOwn(expression, scope);
  return std::ranges::any_of(expression.operands,
                             [&](const BoundPtr& operand) { return readsOutside(*operand, scope); });
}

bool Binder::isGrouped(const BoundCore& core) {
  return !core.groupBy.empty() || core.having ||
         std::ranges::any_of(core.items, [](const BoundItem& item) { return item.expression->aggregate; });
}

void Binder::checkGroup(const BoundCore& core, const Scope& scope) {
  if (!isGrouped(core)) return;
  for (const auto& item : core.items) checkGrouped(*item.expression, core, scope, 8120, "select list");
  if (core.having) checkGrouped(*core.having, core, scope, 8121, "HAVING clause");
}

// Every column that is read outside an aggregate is one of the group's expressions or stands inside one.
void Binder::checkGrouped(const BoundExpression& expression, const BoundCore& core, const Scope& scope, Long number,
                          const std::string& clause) {
  if (std::ranges::any_of(core.groupBy, [&](const BoundPtr& group) { return sameExpression(*group, expression); }))
    return;
  const bool isAggregate = expression.kind == BoundExpression::Kind::call && expression.aggregate &&
                           std::ranges::none_of(expression.operands, [](const BoundPtr& o) { return o->aggregate; });
  if (isAggregate) return;
  if (expression.kind == BoundExpression::Kind::column && readsOwn(expression, scope))
    throw tsql::sqlFailure(number, "Column " + expression.text + " is invalid in the " + clause +
                                       " because it is not contained in either an aggregate function or the GROUP BY "
                                       "clause.");
  for (const auto& operand : expression.operands) checkGrouped(*operand, core, scope, number, clause);
}

// Two texts of one expression hold two parameters where they hold a literal. If the literals are equal the expressions
// are, and the literals become part of the statement's shape, since with others they would not be.
bool Binder::sameExpression(const BoundExpression& first, const BoundExpression& second) {
  const BoundExpression& a = withoutCollation(first);
  const BoundExpression& b = withoutCollation(second);
  if (a.kind != b.kind || a.text != b.text || a.source != b.source || a.negated != b.negated || a.select || b.select ||
      a.operands.size() != b.operands.size())
    return false;
  if (a.kind == BoundExpression::Kind::parameter) {
    Parameter& left = parameters_[a.parameter];
    Parameter& right = parameters_[b.parameter];
    if (left.text != right.text || !(left.type == right.type) || left.negate != right.negate) return false;
    left.structural = right.structural = true;
    return true;
  }
  if (a.kind == BoundExpression::Kind::inList) return false;
  for (std::size_t i = 0; i < a.operands.size(); ++i)
    if (!sameExpression(*a.operands[i], *b.operands[i])) return false;
  return true;
}

// The parts of a union have one type a column, that of the highest precedence.
void Binder::unifyParts(BoundSelect& select) {
  auto& first = select.parts.front().core.items;
  for (auto& part : select.parts)
    if (part.core.items.size() != first.size())
      throw tsql::sqlFailure(205,
                             "All queries combined using a UNION, INTERSECT or EXCEPT operator must have an equal "
                             "number of expressions in their target lists.");
  for (std::size_t i = 0; i < first.size(); ++i) {
    Type type;
    for (const auto& part : select.parts) type = commonType(type, part.core.items[i].expression->type);
    for (auto& part : select.parts) {
      BoundPtr& item = part.core.items[i].expression;
      item = coerce(std::move(item), type, Purpose::compute);
    }
  }
}

// Rows are told apart by the dialect's collation.
void Binder::collateResult(BoundSelect& select) {
  const bool distinct =
      std::ranges::any_of(select.parts, [](const BoundSelect::Part& part) { return part.core.distinct; });
  if (select.parts.size() == 1 && !distinct) return;
  for (auto& part : select.parts)
    for (auto& item : part.core.items) item.expression = collate(std::move(item.expression));
}

std::optional<std::size_t> Binder::ordinalOf(const tsql::Expression& expression, const tsql::Select& select,
                                             const BoundCore& core) const {
  if (expression.kind == Kind::literal && expression.token.kind == tsql::TokenKind::integer) {
    const std::size_t ordinal = std::stoul(expression.token.text);
    if (ordinal < 1 || ordinal > core.items.size())
      throw tsql::sqlFailure(108, "The ORDER BY position number " + expression.token.text +
                                      " is out of range of the number of items in the select list.");
    return ordinal;
  }
  if (expression.kind != Kind::column || !expression.qualifier.empty()) return std::nullopt;
  // An alias hides a column of its name. In a union the result's names are all that there is.
  for (std::size_t i = 0; i < core.items.size(); ++i)
    if ((core.items[i].aliased || select.parts.size() > 1) && sameName(core.items[i].name, expression.name))
      return i + 1;
  return std::nullopt;
}

void Binder::bindOrder(const tsql::Select& select, BoundSelect& bound, const Scope& scope) {
  BoundCore& core = bound.parts.front().core;
  if (select.orderBy.size() > mostColumns) refuseSize();
  const bool grouped = isGrouped(core);
  for (const auto& item : select.orderBy) {
    BoundOrder order;
    order.descending = item.descending;
    if (const auto ordinal = ordinalOf(*item.expression, select, core)) {
      order.ordinal = *ordinal;
      BoundPtr& target = core.items[*ordinal - 1].expression;
      target = collate(std::move(target));
      bound.orderBy.push_back(std::move(order));
      continue;
    }
    if (select.parts.size() > 1)
      throw tsql::sqlFailure(104,
                             "ORDER BY items must appear in the select list if the statement contains a UNION, "
                             "INTERSECT or EXCEPT operator.");
    order.expression = collate(bind(*item.expression, scope));
    if (grouped) {
      checkGrouped(*order.expression, core, scope, 8127, "ORDER BY clause");
    } else if (order.expression->aggregate) {
      for (const auto& result : core.items) checkGrouped(*result.expression, core, scope, 8120, "select list");
      throw unsupported("An aggregate in the ORDER BY clause of a query without groups");
    }
    if (readsOutside(*order.expression, scope)) {
      // The same for all rows, if it reads nothing else.
      if (!readsOwn(*order.expression, scope)) continue;
      throw unsupported("An ORDER BY clause with a column of the query outside");
    }
    if (core.distinct) {
      const auto same = std::ranges::find_if(core.items, [&](const BoundItem& candidate) {
        return sameExpression(*candidate.expression, *order.expression);
      });
      if (same == core.items.end())
        throw tsql::sqlFailure(145, "ORDER BY items must appear in the select list if SELECT DISTINCT is specified.");
      order.ordinal = static_cast<std::size_t>(same - core.items.begin()) + 1;
      order.expression.reset();
    }
    bound.orderBy.push_back(std::move(order));
  }
  addEntryOrder(bound);
}

// Rows of one table that are equal come in the order of their entry, in the direction of the last key.
void Binder::addEntryOrder(BoundSelect& bound) {
  const BoundCore& core = bound.parts.front().core;
  if (bound.orderBy.empty() || bound.parts.size() > 1 || core.distinct || isGrouped(core)) return;
  const BoundSource* const rows = rowsOf(core);
  if (rows) bound.orderBy.push_back({0, rowid(rows->alias), bound.orderBy.back().descending});
}

std::vector<Binder::SourceColumn> Binder::resultColumns(const BoundSelect& select) {
  std::vector<SourceColumn> columns;
  for (const auto& item : select.parts.front().core.items)
    columns.push_back({item.name, resultColumn(columns.size()), item.expression->type, false, std::nullopt});
  return columns;
}

}  // namespace QVSa::embedded
