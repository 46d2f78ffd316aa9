#include "providers/tsql/OuterJoins.h"

#include <algorithm>

#include "providers/tsql/SqlFailure.h"
#include "providers/tsql/TreeWalk.h"
#include "providers/tsql/Words.h"

namespace QVSa::tsql {
namespace {

using Kind = Expression::Kind;

bool isOldJoin(const Expression& expression) {
  return expression.kind == Kind::comparison && (expression.op == "*=" || expression.op == "=*");
}

bool isConjunction(const Expression& expression) { return expression.kind == Kind::logical && expression.op == "and"; }

[[noreturn]] void refuseRequest() {
  throw sqlFailure(301, "Query contains an outer-join request that is not permitted.");
}

void split(ExpressionPtr condition, std::vector<ExpressionPtr>& conjuncts) {
  if (!isConjunction(*condition)) {
    conjuncts.push_back(std::move(condition));
    return;
  }
  for (ExpressionPtr& operand : condition->operands) split(std::move(operand), conjuncts);
}

ExpressionPtr combine(std::vector<ExpressionPtr> conjuncts) {
  if (conjuncts.empty()) return nullptr;
  if (conjuncts.size() == 1) return std::move(conjuncts.front());
  auto whole = std::make_unique<Expression>(Kind::logical, conjuncts.front()->position);
  whole->op = "and";
  whole->operands = std::move(conjuncts);
  return whole;
}

bool holdsOldJoin(const ExpressionPtr& condition) {
  if (!condition) return false;
  if (!isConjunction(*condition)) return isOldJoin(*condition);
  return std::any_of(condition->operands.begin(), condition->operands.end(), holdsOldJoin);
}

TableSourcePtr joined(TableSourcePtr left, TableSource::Join join, TableSourcePtr right, ExpressionPtr on) {
  auto source = std::make_unique<TableSource>();
  source->kind = TableSource::Kind::join;
  source->join = join;
  source->left = std::move(left);
  source->right = std::move(right);
  source->on = std::move(on);
  return source;
}

// The tables of a block that a condition speaks of.
struct Uses {
  std::vector<bool> tables;
  const Expression* foreign = nullptr;  // a column whose qualifier names no table of the block
  bool unqualified = false;

  std::size_t count() const { return static_cast<std::size_t>(std::count(tables.begin(), tables.end(), true)); }
  bool isAlone(std::size_t table) const { return tables[table] && count() == 1 && !foreign && !unqualified; }
};

// One from list with its where clause.
class Block {
 public:
  explicit Block(std::vector<TableSourcePtr>& from) {
    for (TableSourcePtr& source : from) {
      if (source->kind == TableSource::Kind::join)
        throw sqlFailure(1016, "Outer join operators cannot be specified in a query containing joined tables.");
      Table table;
      table.name = exposedName(*source);
      table.source = std::move(source);
      tables_.push_back(std::move(table));
    }
  }

  ExpressionPtr sort(ExpressionPtr where);
  TableSourcePtr build();

 private:
  struct Table {
    String name;
    TableSourcePtr source;
    bool isInner = false;
    std::vector<ExpressionPtr> on;
    std::vector<bool> uses;  // the tables that these conditions speak of
  };

  Uses usesOf(const Expression& expression) const;
  void collect(const Expression& expression, std::vector<String>& hidden, bool isInside, Uses& uses) const;
  void collectColumn(const Expression& column, const std::vector<String>& hidden, bool isInside, Uses& uses) const;
  void takeOldJoin(ExpressionPtr condition);
  static void give(Table& table, ExpressionPtr condition, const std::vector<bool>& uses);
  bool takeCondition(ExpressionPtr& condition);
  void refuseOrdinaryJoin(const Expression& condition) const;
  bool isReady(const Table& table, const std::vector<bool>& placed) const;

  std::vector<Table> tables_;
};

void Block::collectColumn(const Expression& column, const std::vector<String>& hidden, bool isInside,
                          Uses& uses) const {
  if (column.qualifier.empty()) {
    if (!isInside && column.kind == Kind::column) uses.unqualified = true;
    return;
  }
  const String& qualifier = column.qualifier.back();
  const auto isIt = [&](const String& name) { return sameWord(name, qualifier); };
  if (std::any_of(hidden.begin(), hidden.end(), isIt)) return;
  const auto table =
      std::find_if(tables_.begin(), tables_.end(), [&](const Table& candidate) { return isIt(candidate.name); });
  if (table != tables_.end())
    uses.tables[static_cast<std::size_t>(table - tables_.begin())] = true;
  else if (!isInside)
    uses.foreign = &column;
}

// Within a subquery its own tables hide those of the same name outside, and columns without a qualifier are its own.
void Block::collect(const Expression& expression, std::vector<String>& hidden, bool isInside, Uses& uses) const {
  walkExpression(expression, [&](const Expression& part) {
    if (part.kind == Kind::column || part.kind == Kind::star) collectColumn(part, hidden, isInside, uses);
    if (!part.select) return;
    const std::size_t visible = hidden.size();
    walkSelect(
        *part.select, [&](const TableSource& source) { hidden.push_back(exposedName(source)); },
        [&](const Expression& inner) { collect(inner, hidden, true, uses); });
    hidden.resize(visible);
  });
}

Uses Block::usesOf(const Expression& expression) const {
  Uses uses;
  uses.tables.resize(tables_.size());
  std::vector<String> hidden;
  collect(expression, hidden, false, uses);
  return uses;
}

void Block::takeOldJoin(ExpressionPtr condition) {
  const bool isRightInner = condition->op == "*=";
  const Uses outer = usesOf(*condition->operands[isRightInner ? 0 : 1]);
  const Uses inner = usesOf(*condition->operands[isRightInner ? 1 : 0]);
  if (const Expression* column = outer.foreign ? outer.foreign : inner.foreign) {
    String name;
    for (const String& part : column->qualifier) name += part + ".";
    throw sqlFailure(4104, "The multi-part identifier \"" + name + column->name + "\" could not be bound.");
  }
  if (inner.count() != 1 || inner.unqualified) refuseRequest();
  const auto table = std::find(inner.tables.begin(), inner.tables.end(), true) - inner.tables.begin();
  if (outer.tables[static_cast<std::size_t>(table)]) refuseRequest();
  condition->op = "=";
  Table& joinedTable = tables_[static_cast<std::size_t>(table)];
  joinedTable.isInner = true;
  give(joinedTable, std::move(condition), outer.tables);
}

void Block::give(Table& table, ExpressionPtr condition, const std::vector<bool>& uses) {
  table.uses.resize(uses.size());
  for (std::size_t i = 0; i < uses.size(); ++i) table.uses[i] = table.uses[i] || uses[i];
  table.on.push_back(std::move(condition));
}

void Block::refuseOrdinaryJoin(const Expression& condition) const {
  if (condition.kind != Kind::comparison) return;
  const Uses left = usesOf(*condition.operands[0]);
  const Uses right = usesOf(*condition.operands[1]);
  for (std::size_t i = 0; i < tables_.size(); ++i) {
    if (!tables_[i].isInner || left.tables[i] == right.tables[i]) continue;
    if ((left.tables[i] ? right : left).count() == 0) continue;
    throw sqlFailure(303, "The table '" + tables_[i].name +
                              "' is an inner member of an outer-join clause. This is not allowed if the table also "
                              "participates in a regular join clause.");
  }
}

// A condition on an inner table alone decides which of its rows are joined, not which rows stay.
bool Block::takeCondition(ExpressionPtr& condition) {
  const Uses uses = usesOf(*condition);
  for (std::size_t i = 0; i < tables_.size(); ++i) {
    if (!tables_[i].isInner || !uses.isAlone(i)) continue;
    give(tables_[i], std::move(condition), uses.tables);
    return true;
  }
  refuseOrdinaryJoin(*condition);
  return false;
}

// Gives each inner table its conditions; what remains is the block's where clause.
ExpressionPtr Block::sort(ExpressionPtr where) {
  std::vector<ExpressionPtr> conjuncts;
  split(std::move(where), conjuncts);
  std::vector<ExpressionPtr> others;
  for (ExpressionPtr& conjunct : conjuncts) {
    if (isOldJoin(*conjunct))
      takeOldJoin(std::move(conjunct));
    else
      others.push_back(std::move(conjunct));
  }
  std::vector<ExpressionPtr> rest;
  for (ExpressionPtr& condition : others)
    if (!takeCondition(condition)) rest.push_back(std::move(condition));
  return combine(std::move(rest));
}

bool Block::isReady(const Table& table, const std::vector<bool>& placed) const {
  for (std::size_t i = 0; i < tables_.size(); ++i)
    if (table.uses[i] && !placed[i] && &tables_[i] != &table) return false;
  return true;
}

// The tables that keep all their rows first, then each inner one behind those that its conditions name.
TableSourcePtr Block::build() {
  TableSourcePtr tree;
  std::vector<bool> placed(tables_.size());
  const auto place = [&](std::size_t i, TableSource::Join join, ExpressionPtr on) {
    placed[i] = true;
    tree = tree ? joined(std::move(tree), join, std::move(tables_[i].source), std::move(on))
                : std::move(tables_[i].source);
  };
  for (std::size_t i = 0; i < tables_.size(); ++i)
    if (!tables_[i].isInner) place(i, TableSource::Join::product, nullptr);
  if (!tree) refuseRequest();
  for (;;) {
    std::size_t next = 0;
    while (next < tables_.size() && (placed[next] || !isReady(tables_[next], placed))) ++next;
    if (next == tables_.size()) break;
    place(next, TableSource::Join::left, combine(std::move(tables_[next].on)));
  }
  if (std::find(placed.begin(), placed.end(), false) != placed.end()) refuseRequest();
  return tree;
}

void rewriteBlock(std::vector<TableSourcePtr>& from, ExpressionPtr& where) {
  if (!holdsOldJoin(where)) return;
  Block block(from);
  where = block.sort(std::move(where));
  from.clear();
  from.push_back(block.build());
}

// What is no conjunct of a where clause cannot be an old join.
void rewriteInside(Expression& expression) {
  walkExpression(expression, [](Expression& part) {
    if (isOldJoin(part)) refuseRequest();
    if (part.select) rewriteOuterJoins(*part.select);
  });
}

void rewriteInside(ExpressionPtr& expression) {
  if (expression) rewriteInside(*expression);
}

void rewriteInside(std::vector<TableSourcePtr>& from) {
  for (TableSourcePtr& source : from)
    walkSource(*source, [](TableSource& part) {
      if (part.derived) rewriteOuterJoins(*part.derived);
      rewriteInside(part.on);
    });
}

void rewriteWhole(std::vector<TableSourcePtr>& from, ExpressionPtr& where) {
  rewriteBlock(from, where);
  rewriteInside(from);
  rewriteInside(where);
}

struct StatementRewriter {
  void operator()(SelectPtr& select) const { rewriteOuterJoins(*select); }
  void operator()(CreateView& view) const { rewriteOuterJoins(*view.select); }
  void operator()(Insert& insert) const {
    if (insert.select) rewriteOuterJoins(*insert.select);
    for (auto& row : insert.values)
      for (ExpressionPtr& value : row) rewriteInside(value);
  }
  void operator()(Update& update) const {
    rewriteWhole(update.from, update.where);
    for (Assignment& assignment : update.assignments) rewriteInside(assignment.value);
  }
  void operator()(Delete& erase) const { rewriteWhole(erase.from, erase.where); }
  template <typename Other>
  void operator()(Other&) const {}
};

}  // namespace

void rewriteOuterJoins(Select& select) {
  for (Select::CommonTable& table : select.with) rewriteOuterJoins(*table.select);
  for (Select::Part& part : select.parts) {
    rewriteWhole(part.core.from, part.core.where);
    for (SelectItem& item : part.core.items) rewriteInside(item.expression);
    for (ExpressionPtr& key : part.core.groupBy) rewriteInside(key);
    rewriteInside(part.core.having);
  }
  for (OrderItem& item : select.orderBy) rewriteInside(item.expression);
}

void rewriteOuterJoins(Statement& statement) { std::visit(StatementRewriter{}, statement); }

bool hasOuterJoins(const std::vector<Token>& tokens) {
  return std::any_of(tokens.begin(), tokens.end(), [](const Token& token) {
    return token.kind == TokenKind::symbol && (token.text == "*=" || token.text == "=*");
  });
}

}  // namespace QVSa::tsql
