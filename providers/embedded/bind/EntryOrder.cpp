#include "providers/embedded/bind/EntryOrder.h"

#include <algorithm>

namespace QVSa::embedded {

namespace {

using Kind = BoundExpression::Kind;

// What a column of a key is held to: a column of another table, or a value.
struct Equality {
  const BoundExpression* column;
  const BoundExpression* other;
};

const BoundExpression& plain(const BoundExpression& expression) {
  const bool isCollated = expression.kind == Kind::infix && expression.text == "collate";
  return isCollated ? *expression.operands[0] : expression;
}

void addEqualities(const BoundExpression& condition, std::vector<Equality>& equalities) {
  if (condition.kind != Kind::infix) return;
  if (condition.text == "and") {
    for (const auto& operand : condition.operands) addEqualities(*operand, equalities);
  } else if (condition.text == "=") {
    const BoundExpression& left = plain(*condition.operands[0]);
    const BoundExpression& right = plain(*condition.operands[1]);
    equalities.push_back({&left, &right});
    equalities.push_back({&right, &left});
  }
}

std::vector<Equality> equalitiesOf(const BoundCore& core) {
  std::vector<Equality> equalities;
  for (const auto& condition : core.where) addEqualities(*condition, equalities);
  for (const auto& source : core.from)
    if (source.on) addEqualities(*source.on, equalities);
  return equalities;
}

using Aliases = std::vector<std::string>;

bool isKnown(const BoundExpression& value, const Aliases& reached) {
  if (value.kind == Kind::parameter) return true;
  return value.kind == Kind::column && std::ranges::find(reached, value.source) != reached.end();
}

// Whether what is reached names one row of the source at most.
bool isReached(const BoundSource& source, const std::vector<Equality>& equalities, const Aliases& reached) {
  if (!source.table) return false;
  const auto isHeld = [&](std::size_t column) {
    const std::string name = quoteName(source.table->columns[column].name);
    return std::ranges::any_of(equalities, [&](const Equality& equality) {
      return equality.column->kind == Kind::column && equality.column->source == source.alias &&
             equality.column->text == name && isKnown(*equality.other, reached);
    });
  };
  return std::ranges::any_of(source.table->keys, [&](const auto& key) { return std::ranges::all_of(key, isHeld); });
}

bool reachesAll(const BoundSource& begin, const BoundCore& core, const std::vector<Equality>& equalities) {
  Aliases reached = {begin.alias};
  for (std::size_t before = 0; before != reached.size();) {
    before = reached.size();
    for (const auto& source : core.from)
      if (std::ranges::find(reached, source.alias) == reached.end() && isReached(source, equalities, reached))
        reached.push_back(source.alias);
  }
  return reached.size() == core.from.size();
}

}  // namespace

const BoundSource* rowsOf(const BoundCore& core) {
  if (core.from.size() == 1) return core.from.front().table ? &core.from.front() : nullptr;
  const auto equalities = equalitiesOf(core);
  const auto found = std::ranges::find_if(core.from, [&](const BoundSource& source) {
    return source.table && !source.leftJoin && reachesAll(source, core, equalities);
  });
  return found == core.from.end() ? nullptr : &*found;
}

}  // namespace QVSa::embedded
