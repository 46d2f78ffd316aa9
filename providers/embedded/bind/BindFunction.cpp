#include <algorithm>

#include "providers/embedded/bind/Binder.h"
#include "providers/embedded/bind/TypeRules.h"
#include "providers/embedded/functions/Decimal.h"
#include "providers/embedded/storage/StorageFailure.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

using tsql::Form;
using tsql::Gives;
using tsql::Operation;
using tsql::Takes;

constexpr Type whole{Base::integer, -1};
constexpr Type number{Base::real, -1};
constexpr Type moment{Base::datetime, -1};
constexpr int averageScale = 6;

Failure invalidOperand(const Operation& row, std::size_t place, const Type& type) {
  if (row.form == Form::function || row.form == Form::predicate)
    return tsql::sqlFailure(8116, std::string("Argument data type ") + nameOf(type.base) + " is invalid for argument " +
                                      std::to_string(place + 1) + " of " + std::string(row.name) + " function.");
  return tsql::sqlFailure(8117, std::string("Operand data type ") + nameOf(type.base) + " is invalid for " +
                                    std::string(row.name) + " operator.");
}

bool isFit(const Operation& row, Takes takes, const Type& type) {
  const bool isNumeric = takes == Takes::number || takes == Takes::integral;
  if (row.form == Form::sign && isNumeric && type.isText()) return false;
  switch (takes) {
    case Takes::text:
    case Takes::moment:
      return type.base != Base::image;
    case Takes::whole:
    case Takes::real:
    case Takes::number:
      return type.isNumber() || type.isText();
    case Takes::integral:
      return type.isWhole() || type.isText();
    case Takes::summable:
      return type.isNumber() && type.base != Base::bit;
    case Takes::comparable:
      return type.base != Base::bit && type.base != Base::ntext && type.base != Base::image;
    default:
      return true;
  }
}

// What functions give where they take the type of an operand: a long text of any kind is one that can be long.
Type plain(const Type& type) { return type.base == Base::ntext ? Type{Base::nvarchar, -1} : type; }

Type cutText(const Operation& row, const std::vector<BoundPtr>& operands) {
  bool isWide = false;
  bool isLong = false;
  for (std::size_t i = 0; i < operands.size(); ++i) {
    if (row.operand(i) != Takes::text) continue;
    isWide = isWide || operands[i]->type.base > Base::varchar;
    isLong = isLong || operands[i]->type.isLong();
  }
  return textType(isWide ? Base::nvarchar : Base::varchar, isLong);
}

Type resultType(const Operation& row, const std::vector<BoundPtr>& operands) {
  switch (row.gives) {
    case Gives::identity:
      return {Base::decimal, 38};
    case Gives::moment:
      return moment;
    case Gives::shortText:
      return textType(Base::varchar, false);
    case Gives::first:
    case Gives::common:
      return plain(operands.front()->type);
    case Gives::cutText:
      return cutText(row, operands);
    case Gives::floor: {
      const Type& type = operands.front()->type;
      return type.base == Base::decimal ? Type{Base::decimal, type.size} : type;
    }
    default:
      return whole;
  }
}

}  // namespace

BoundPtr Binder::bindFunction(const tsql::Expression& expression, const Scope& scope) {
  const Operation& row = *tsql::functionNamed(expression.name);
  if (row.form == Form::aggregate) return bindAggregate(row, expression, scope);
  if (row.name == "nullif") return bindNullIf(expression, scope);
  std::vector<BoundPtr> operands = bindOperands(row, expression, scope);
  const Type type = resultType(row, operands);
  if (row.behind == tsql::Behind::type) operands.push_back(constant(std::to_string(codeOf(operands.front()->type))));
  // What is stored is never cut in silence.
  if (row.behind == tsql::Behind::limit)
    operands.push_back(constant(std::to_string(stores_ && !type.isLong() ? -type.size : type.size)));
  if (!expression.datePart.empty()) operands.insert(operands.begin(), constant("'" + expression.datePart + "'"));
  return call(std::string(row.emitted), type, std::move(operands));
}

std::vector<BoundPtr> Binder::bindOperands(const Operation& row, const tsql::Expression& expression,
                                           const Scope& scope) {
  const std::size_t before = expression.datePart.empty() ? 0 : 1;
  std::vector<BoundPtr> operands;
  Type common;
  for (const auto& operand : expression.operands) {
    operands.push_back(bind(*operand, scope));
    common = commonType(common, operands.back()->type);
  }
  for (std::size_t i = 0; i < operands.size(); ++i) {
    const Takes takes = row.operand(before + i);
    if (takes == Takes::common) {
      operands[i] = coerce(std::move(operands[i]), common, Purpose::compute);
    } else if (takes == Takes::first) {
      Type& first = operands.front()->type;
      if (first.base == Base::unknown) first = operands[i]->type;
      operands[i] = coerce(std::move(operands[i]), Type(first), Purpose::cast);
    } else {
      operands[i] = taken(row, before + i, std::move(operands[i]));
    }
  }
  return operands;
}

BoundPtr Binder::taken(const Operation& row, std::size_t place, BoundPtr operand) {
  const Takes takes = row.operand(place);
  const Type type = operand->type;
  if (type.base != Base::unknown && !isFit(row, takes, type)) throw invalidOperand(row, place, type);
  switch (takes) {
    case Takes::text:
      return type.isText() ? std::move(operand)
                           : coerce(std::move(operand), textType(Base::varchar, false), Purpose::compute);
    case Takes::whole:
      return coerce(std::move(operand), whole, Purpose::compute);
    case Takes::integral:
      return type.isWhole() ? std::move(operand) : coerce(std::move(operand), whole, Purpose::compute);
    case Takes::real:
      return coerce(std::move(operand), number, Purpose::compute);
    case Takes::number:
      return type.isNumber() ? std::move(operand) : coerce(std::move(operand), number, Purpose::compute);
    case Takes::moment:
      return coerce(std::move(operand), moment, Purpose::compute);
    default:
      return operand;
  }
}

BoundPtr Binder::bindAggregate(const Operation& row, const tsql::Expression& expression, const Scope& scope) {
  const tsql::Expression& argument = *expression.operands[0];
  BoundPtr operand = argument.kind == tsql::Expression::Kind::star ? constant("*") : bind(argument, scope);
  if (operand->aggregate)
    throw tsql::sqlFailure(130,
                           "Cannot perform an aggregate function on an expression containing an aggregate or a "
                           "subquery.");
  if (readsColumn(*operand) && !readsOwn(*operand, scope))
    throw unsupported("An aggregate over a column of the query outside");
  operand = collate(taken(row, 0, std::move(operand)));
  const Type type = operand->type.base == Base::unknown ? whole : operand->type;
  Type result = row.gives == Gives::first ? type : whole;
  if (row.gives == Gives::total || row.gives == Gives::average) {
    result = type.isWhole() && type.base < Base::integer ? whole : type;
    if (type.base == Base::decimal) result.size = mostDecimalDigits;
    if (type.base == Base::decimal && row.gives == Gives::average) {
      result.scale = std::max(type.scale, averageScale);
      operand = coerce(std::move(operand), result, Purpose::compute);
    }
  }
  std::vector<BoundPtr> operands;
  operands.push_back(std::move(operand));
  BoundPtr bound = call(std::string(row.emitted), result, std::move(operands));
  bound->distinct = expression.distinct;
  bound->aggregate = true;
  if (row.gives != Gives::total || result.base != Base::integer) return bound;
  // A sum of whole numbers overflows as its type does.
  bound->type = {Base::bigint, -1};
  return coerce(std::move(bound), whole, Purpose::compute);
}

// Both operands are compared in the type that they meet in; the first one is given as it is.
BoundPtr Binder::bindNullIf(const tsql::Expression& expression, const Scope& scope) {
  BoundPtr value = bind(*expression.operands[0], scope);
  BoundPtr left = bind(*expression.operands[0], scope);
  BoundPtr right = bind(*expression.operands[1], scope);
  alignForComparison(left, right);
  auto null = std::make_unique<BoundExpression>();
  auto choice = std::make_unique<BoundExpression>();
  choice->kind = BoundExpression::Kind::caseOf;
  choice->type = null->type = value->type;
  choice->aggregate = value->aggregate || right->aggregate;
  choice->operands.push_back(infix("=", {Base::bit, -1}, std::move(left), std::move(right)));
  choice->operands.push_back(std::move(null));
  choice->operands.push_back(std::move(value));
  return choice;
}

}  // namespace QVSa::embedded
