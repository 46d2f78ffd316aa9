#include "providers/embedded/bind/PushDown.h"

#include <algorithm>
#include <set>

namespace QVSa::embedded {

namespace {

using Kind = BoundExpression::Kind;

// Whether the expression means the same in another place: no select stands in it, no aggregate.
bool isMovable(const BoundExpression& expression) {
  return !expression.select && !expression.aggregate && expression.kind != Kind::rowid &&
         std::ranges::all_of(expression.operands, [](const BoundPtr& operand) { return isMovable(*operand); });
}

bool givesMovables(const BoundCore& core) {
  return !core.top && core.groupBy.empty() && !core.having &&
         std::ranges::all_of(core.items, [](const BoundItem& item) { return isMovable(*item.expression); });
}

bool reads(const BoundSource& source, const std::string& commonTable) { return source.commonTable == commonTable; }

// Whether no select stands in the block, neither in an expression nor as a source.
bool isOpen(const BoundCore& core) {
  return givesMovables(core) && std::ranges::all_of(core.where, [](const BoundPtr& p) { return isMovable(*p); }) &&
         std::ranges::all_of(core.from, [](const BoundSource& s) { return !s.derived && (!s.on || isMovable(*s.on)); });
}

// Whether one source alone reads a common table, itself aside.
bool isReadOnce(const BoundSelect& select, const BoundSelect::CommonTable& table) {
  std::vector<const BoundCore*> readers;
  for (const auto& part : select.parts) readers.push_back(&part.core);
  for (const auto& other : select.with)
    if (&other != &table)
      for (const auto& part : other.select->parts) readers.push_back(&part.core);
  std::ptrdiff_t sources = 0;
  for (const BoundCore* core : readers) {
    if (!isOpen(*core)) return false;
    sources += std::ranges::count_if(core->from, [&](const BoundSource& source) { return reads(source, table.name); });
  }
  return sources == 1;
}

void addColumns(const BoundExpression& expression, std::vector<const BoundExpression*>& columns) {
  if (expression.kind == Kind::column) columns.push_back(&expression);
  for (const auto& operand : expression.operands) addColumns(*operand, columns);
}

std::vector<const BoundExpression*> columnsOf(const BoundExpression& expression) {
  std::vector<const BoundExpression*> columns;
  addColumns(expression, columns);
  return columns;
}

// The one source that the condition speaks of; none where a join may put nulls into its columns.
BoundSource* subjectOf(const BoundExpression& condition, BoundCore& core) {
  const auto columns = columnsOf(condition);
  if (columns.empty()) return nullptr;
  const std::string& alias = columns.front()->source;
  if (!std::ranges::all_of(columns, [&](const BoundExpression* column) { return column->source == alias; }))
    return nullptr;
  const auto found = std::ranges::find(core.from, alias, &BoundSource::alias);
  return found == core.from.end() || found->leftJoin ? nullptr : &*found;
}

// The place of a column among the results of the select that it reads.
std::size_t placeOf(const BoundExpression& column) { return std::stoul(column.text.substr(std::size("\"c") - 1)); }

BoundPtr copyOf(const BoundExpression& expression) {
  auto copy = std::make_unique<BoundExpression>();
  copy->kind = expression.kind;
  copy->type = expression.type;
  copy->text = expression.text;
  copy->source = expression.source;
  copy->parameter = expression.parameter;
  copy->negated = expression.negated;
  copy->distinct = expression.distinct;
  copy->collated = expression.collated;
  for (const auto& operand : expression.operands) copy->operands.push_back(copyOf(*operand));
  return copy;
}

void replaceColumns(BoundPtr& expression, const BoundCore& core) {
  if (expression->kind == Kind::column) {
    expression = copyOf(*core.items.at(placeOf(*expression)).expression);
    return;
  }
  for (auto& operand : expression->operands) replaceColumns(operand, core);
}

// A condition on the results of the core, asked of what the core reads.
BoundPtr inside(const BoundCore& core, const BoundExpression& condition) {
  BoundPtr moved = copyOf(condition);
  replaceColumns(moved, core);
  return moved;
}

bool handsOn(const BoundCore& core, const BoundSource& itself, std::size_t place) {
  const BoundExpression& item = *core.items.at(place).expression;
  return item.kind == Kind::column && item.source == itself.alias && placeOf(item) == place;
}

void ask(BoundSelect& select, const BoundExpression& condition);
void askSubject(BoundSelect& select, BoundCore& core, const BoundExpression& condition);

void askWhereItBegins(BoundSelect& select, BoundSelect::CommonTable& table, const BoundExpression& condition) {
  std::vector<BoundCore*> beginnings;
  for (auto& part : table.select->parts) {
    if (!givesMovables(part.core)) return;
    const auto itself =
        std::ranges::find_if(part.core.from, [&](const auto& source) { return reads(source, table.name); });
    if (itself == part.core.from.end())
      beginnings.push_back(&part.core);
    else if (!std::ranges::all_of(columnsOf(condition), [&](const BoundExpression* column) {
               return handsOn(part.core, *itself, placeOf(*column));
             }))
      return;
  }
  for (BoundCore* core : beginnings) {
    core->where.push_back(inside(*core, condition));
    askSubject(select, *core, *core->where.back());
  }
}

// Asks a condition in a block of the select of the one source that it speaks of.
void askSubject(BoundSelect& select, BoundCore& core, const BoundExpression& condition) {
  BoundSource* const subject = subjectOf(condition, core);
  if (!subject) return;
  if (subject->derived) return ask(*subject->derived, condition);
  for (auto& table : select.with)
    if (reads(*subject, table.name) && isReadOnce(select, table)) return askWhereItBegins(select, table, condition);
}

// `condition` is one on the results of the select.
void ask(BoundSelect& select, const BoundExpression& condition) {
  if (select.parts.size() != 1 || !givesMovables(select.parts.front().core)) return;
  BoundCore& core = select.parts.front().core;
  askSubject(select, core, *inside(core, condition));
}

void askOfSources(const BoundExpression& condition, BoundCore& core) {
  if (condition.kind == Kind::infix && condition.text == "and") {
    for (const auto& operand : condition.operands) askOfSources(*operand, core);
    return;
  }
  if (!isMovable(condition)) return;
  BoundSource* const subject = subjectOf(condition, core);
  if (subject && subject->derived) ask(*subject->derived, condition);
}

}  // namespace

void pushDown(BoundSelect& select) {
  for (auto& part : select.parts)
    for (const auto& condition : part.core.where) askOfSources(*condition, part.core);
}

}  // namespace QVSa::embedded
