#include <algorithm>
#include <utility>

#include "providers/tsql/ParserState.h"
#include "providers/tsql/SqlFailure.h"
#include "providers/tsql/Words.h"

namespace QVSa::tsql {
namespace {

// A select within a select takes far more of the stack than a parenthesis does.
constexpr std::size_t kSelectWeight = 5;
constexpr std::size_t kMostTables = 256;

constexpr std::string_view kHints[] = {"holdlock", "nolock",          "nowait",         "paglock", "readcommitted",
                                       "readpast", "readuncommitted", "repeatableread", "rowlock", "serializable",
                                       "tablock",  "tablockx",        "updlock",        "xlock"};

}  // namespace

Statement Parser::query() { return selectWithTables(); }

// Common tables stand before a whole query only, never before a subquery.
SelectPtr Parser::selectWithTables() {
  std::vector<Select::CommonTable> tables;
  if (takeWord("with")) {
    do tables.push_back(commonTable());
    while (takeSymbol(","));
  }
  SelectPtr whole = select();
  whole->with = std::move(tables);
  return whole;
}

SelectPtr Parser::select() {
  const Nesting nesting(*this, kSelectWeight);
  auto select = std::make_unique<Select>();
  select->parts.push_back({false, core()});
  while (takeWord("union")) {
    const bool all = takeWord("all");
    select->parts.push_back({all, core()});
  }
  if (isWord("order")) select->orderBy = orderBy();
  return select;
}

Select::CommonTable Parser::commonTable() {
  Select::CommonTable table;
  table.name = expectName();
  if (isSymbol("(")) table.columns = columnNames();
  expectWord("as");
  expectSymbol("(");
  table.select = select();
  expectSymbol(")");
  return table;
}

SelectCore Parser::core() {
  expectWord("select");
  SelectCore core;
  core.distinct = takeWord("distinct");
  if (!core.distinct) takeWord("all");
  if (takeWord("top")) top(core);
  do core.items.push_back(selectItem());
  while (takeSymbol(","));
  if (isWord("from")) core.from = from();
  core.where = where();
  groupAndHaving(core);
  return core;
}

void Parser::top(SelectCore& core) {
  const bool isOpen = takeSymbol("(");
  if (isSymbol("-") && ahead(1).kind == TokenKind::integer)
    throw sqlFailure(1014, "A TOP or FETCH clause contains an invalid value.");
  if (now().kind != TokenKind::integer) refuse();
  core.top = take();
  if (isOpen) expectSymbol(")");
  core.topPercent = takeWord("percent");
}

SelectItem Parser::selectItem() {
  SelectItem item;
  if (isStar()) {
    item.expression = star();
  } else if (isName() && isSymbol("=", 1)) {
    item.alias = take().text;
    take();
    item.expression = value();
  } else {
    item.expression = value();
    item.alias = alias();
  }
  return item;
}

std::optional<String> Parser::alias() {
  const bool isTold = takeWord("as");
  if (isTold && now().kind == TokenKind::string && !now().text.empty()) return take().text;
  if (isName()) return take().text;
  if (isTold) refuse();
  return std::nullopt;
}

bool Parser::isStar() const {
  std::size_t distance = 0;
  while (isName(distance) && isSymbol(".", distance + 1)) {
    distance += 2;
    while (isSymbol(".", distance)) ++distance;
  }
  return isSymbol("*", distance);
}

ExpressionPtr Parser::star() {
  auto star = std::make_unique<Expression>(Expression::Kind::star, now().position);
  while (!takeSymbol("*")) {
    star->qualifier.push_back(take().text);
    take();
    while (takeSymbol(".")) star->qualifier.emplace_back();
  }
  return star;
}

std::vector<TableSourcePtr> Parser::from() {
  expectWord("from");
  const std::size_t around = std::exchange(tables_, 0);
  std::vector<TableSourcePtr> sources;
  do sources.push_back(tableSource());
  while (takeSymbol(","));
  tables_ = around;
  return sources;
}

TableSourcePtr Parser::tableSource() {
  const Nesting nesting(*this);
  TableSourcePtr source = tablePrimary();
  while (const auto join = joinWord()) source = joined(std::move(source), *join);
  return source;
}

std::optional<TableSource::Join> Parser::joinWord() {
  using Join = TableSource::Join;
  static constexpr std::pair<std::string_view, Join> kOuter[] = {
      {"left", Join::left}, {"right", Join::right}, {"full", Join::full}};
  for (const auto& [word, join] : kOuter) {
    if (!takeWord(word)) continue;
    takeWord("outer");
    expectWord("join");
    return join;
  }
  const bool isCross = takeWord("cross");
  const bool isInner = !isCross && takeWord("inner");
  if (isCross || isInner)
    expectWord("join");
  else if (!takeWord("join"))
    return std::nullopt;
  return isCross ? Join::cross : Join::inner;
}

// Of "a join b join c on .. on ..", the first condition belongs to the last join.
TableSourcePtr Parser::joined(TableSourcePtr left, TableSource::Join join) {
  auto source = std::make_unique<TableSource>();
  source->kind = TableSource::Kind::join;
  source->join = join;
  source->left = std::move(left);
  if (join == TableSource::Join::cross) {
    source->right = tablePrimary();
    return source;
  }
  source->right = tableSource();
  expectWord("on");
  source->on = condition();
  return source;
}

TableSourcePtr Parser::tablePrimary() {
  if (!isSymbol("(") || isWord("select", 1))
    if (++tables_ > kMostTables)
      throw sqlFailure(106, "Too many table names in the query. The maximum allowable is 256.");
  if (isSymbol("(") && isWord("select", 1)) return derivedTable();
  if (takeSymbol("(")) {
    TableSourcePtr source = tableSource();
    expectSymbol(")");
    return source;
  }
  auto source = std::make_unique<TableSource>();
  source->table = objectName();
  if (takeWord("as"))
    source->alias = expectName();
  else if (isName())
    source->alias = take().text;
  source->hints = hints(true);
  return source;
}

TableSourcePtr Parser::derivedTable() {
  auto source = std::make_unique<TableSource>();
  source->kind = TableSource::Kind::derived;
  expectSymbol("(");
  source->derived = select();
  expectSymbol(")");
  takeWord("as");
  source->alias = expectName();
  if (isSymbol("(")) source->columnNames = columnNames();
  return source;
}

// with (a b, c), or without the word where `bare` allows it.
std::vector<String> Parser::hints(bool bare) {
  std::vector<String> hints;
  if (isWord("with") && isSymbol("(", 1))
    take();
  else if (!bare || !isSymbol("("))
    return hints;
  expectSymbol("(");
  do {
    if (now().kind != TokenKind::word) refuse();
    hints.push_back(lowered(now().text));
    if (std::find(std::begin(kHints), std::end(kHints), hints.back()) == std::end(kHints))
      throw sqlFailure(321, "\"" + now().text + "\" is not a recognized table hints option.");
    take();
  } while (takeSymbol(",") || !isSymbol(")"));
  expectSymbol(")");
  return hints;
}

ExpressionPtr Parser::where() { return takeWord("where") ? condition() : nullptr; }

void Parser::groupAndHaving(SelectCore& core) {
  if (takeWord("group")) {
    expectWord("by");
    do core.groupBy.push_back(value());
    while (takeSymbol(","));
  }
  if (takeWord("having")) core.having = condition();
}

std::vector<OrderItem> Parser::orderBy() {
  expectWord("order");
  expectWord("by");
  std::vector<OrderItem> items;
  do {
    OrderItem item;
    item.expression = value();
    item.descending = takeWord("desc");
    if (!item.descending) takeWord("asc");
    items.push_back(std::move(item));
  } while (takeSymbol(","));
  return items;
}

}  // namespace QVSa::tsql
