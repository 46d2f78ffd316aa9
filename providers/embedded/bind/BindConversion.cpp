#include <algorithm>

#include "providers/embedded/bind/Binder.h"
#include "providers/embedded/bind/TypeRules.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

// SQLite takes 32,766 in one statement as it is built by default, but compares each constant with all before it.
constexpr std::size_t mostParameters = 20'000;

bool fits(const Type& from, const Type& to) { return to.size < 0 || (from.size >= 0 && from.size <= to.size); }

// Whether a value of `from` already lies as a value of `to` does.
bool sameForm(const Type& from, const Type& to, Purpose purpose) {
  if (from.isText() && to.isText()) return purpose == Purpose::compute || fits(from, to);
  if (from.base == Base::image && to.base == Base::image) return purpose == Purpose::compute || fits(from, to);
  if (from.isWhole() && to.isWhole()) return from.base <= to.base;
  if (from.base == Base::smalldatetime && to.base == Base::datetime) return true;
  if (from.base == Base::decimal && to.base == Base::decimal) return from.scale == to.scale && from.size <= to.size;
  return from.base == to.base;
}

// Bytes become nothing else, and only a text becomes bytes.
void requireConvertible(const Type& from, const Type& to, Purpose purpose) {
  if (from.base == Base::unknown || from.base == to.base) return;
  if (from.base != Base::image && (to.base != Base::image || from.isText())) return;
  if (purpose == Purpose::cast)
    throw tsql::sqlFailure(529, std::string("Explicit conversion from data type ") + nameOf(from.base) + " to " +
                                    nameOf(to.base) + " is not allowed.");
  throw tsql::sqlFailure(
      206, std::string("Operand type clash: ") + nameOf(from.base) + " is incompatible with " + nameOf(to.base) + ".");
}

}  // namespace

void refuseSize() {
  throw tsql::sqlFailure(8623,
                         "The query processor ran out of internal resources and could not produce a query plan. This "
                         "is a rare event and only expected for extremely complex queries or queries that reference "
                         "a very large number of tables or partitions. Please simplify the query.");
}

BoundPtr Binder::parameter(const Parameter& value) {
  if (parameters_.size() == mostParameters) refuseSize();
  auto bound = std::make_unique<BoundExpression>();
  bound->kind = BoundExpression::Kind::parameter;
  bound->type = value.type;
  bound->parameter = parameters_.size();
  parameters_.push_back(value);
  return bound;
}

Parameter Binder::literalParameter(const tsql::Token& token, Parameter::Source source) const {
  Parameter literal;
  literal.source = source;
  literal.literal = token.literal;
  literal.text = token.text;
  if (ownLiterals_) literal.own = std::make_shared<tsql::Token>(token);
  return literal;
}

BoundPtr Binder::coerce(BoundPtr value, const Type& to, Purpose purpose, int style) {
  if (to.base == Base::unknown) return value;
  requireConvertible(value->type, to, purpose);
  if (value->type.base == Base::unknown) {
    value->type = to;
    return value;
  }
  if (sameForm(value->type, to, purpose) && style == 0) {
    if (!value->type.isText() || purpose != Purpose::compute) value->type = to;
    return value;
  }
  // A literal is converted once, when it is bound, and not in each row.
  if (value->kind == BoundExpression::Kind::parameter && !parameters_[value->parameter].converted) {
    Parameter& literal = parameters_[value->parameter];
    literal.converted = true;
    literal.type = to;
    literal.purpose = purpose;
    literal.style = style;
    value->type = to;
    return value;
  }
  std::vector<BoundPtr> operands;
  const std::int64_t from = codeOf(value->type);
  operands.push_back(std::move(value));
  for (const std::int64_t number : {from, codeOf(to), static_cast<std::int64_t>(purpose), std::int64_t{style}})
    operands.push_back(constant(std::to_string(number)));
  return call("t_convert", to, std::move(operands));
}

void Binder::alignForComparison(BoundPtr& left, BoundPtr& right) {
  const Type type = commonType(left->type, right->type);
  // Whole and real numbers compare as they lie.
  const auto isPlain = [](const BoundExpression& side) { return side.type.isWhole() || side.type.base == Base::real; };
  if (!isPlain(*left) || !isPlain(*right)) {
    left = coerce(std::move(left), type, Purpose::compute);
    right = coerce(std::move(right), type, Purpose::compute);
  }
  if (type.isText() && !left->collated && !right->collated) left = collate(std::move(left));
}

BoundPtr Binder::collate(BoundPtr value) {
  if (!value->type.isText() || value->collated) return value;
  const Type type = value->type;
  BoundPtr collated = infix("collate", type, std::move(value), constant("tsql"));
  collated->collated = true;
  return collated;
}

BoundPtr Binder::call(const std::string& function, const Type& type, std::vector<BoundPtr> operands) {
  auto bound = std::make_unique<BoundExpression>();
  bound->kind = BoundExpression::Kind::call;
  bound->text = function;
  bound->type = type;
  for (const auto& operand : operands) bound->aggregate = bound->aggregate || operand->aggregate;
  bound->operands = std::move(operands);
  return bound;
}

BoundPtr Binder::infix(const std::string& op, const Type& type, BoundPtr left, BoundPtr right) {
  auto bound = std::make_unique<BoundExpression>();
  bound->kind = BoundExpression::Kind::infix;
  bound->text = op;
  bound->type = type;
  bound->aggregate = left->aggregate || right->aggregate;
  bound->operands.push_back(std::move(left));
  bound->operands.push_back(std::move(right));
  return bound;
}

BoundPtr Binder::constant(const std::string& text) {
  auto bound = std::make_unique<BoundExpression>();
  bound->kind = BoundExpression::Kind::constant;
  bound->type = {Base::integer, -1};
  bound->text = text;
  return bound;
}

BoundPtr Binder::rowid(const std::string& alias) {
  auto bound = std::make_unique<BoundExpression>();
  bound->kind = BoundExpression::Kind::rowid;
  bound->type = {Base::bigint, -1};
  bound->source = alias;
  return bound;
}

}  // namespace QVSa::embedded
