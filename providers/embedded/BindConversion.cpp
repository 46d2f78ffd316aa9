#include <algorithm>

#include "providers/embedded/Binder.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

bool fits(const Type& from, const Type& to) { return to.size < 0 || (from.size >= 0 && from.size <= to.size); }

// Whether a value of `from` already lies as a value of `to` does.
bool sameForm(const Type& from, const Type& to, Purpose purpose) {
  if (from.isText() && to.isText()) return purpose == Purpose::compute || fits(from, to);
  if (from.base == Base::image && to.base == Base::image) return purpose == Purpose::compute || fits(from, to);
  if (from.isWhole() && to.isWhole()) return from.base <= to.base;
  if (from.base == Base::smalldatetime && to.base == Base::datetime) return true;
  if (from.base == Base::decimal && to.base == Base::real) return true;
  return from.base == to.base;
}

}  // namespace

BoundPtr Binder::parameter(const Parameter& value) {
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
  const auto number = [](auto n) { return constant(std::to_string(static_cast<int>(n))); };
  std::vector<BoundPtr> operands;
  const Base from = value->type.base;
  operands.push_back(std::move(value));
  operands.push_back(number(from));
  operands.push_back(number(to.base));
  operands.push_back(number(to.size));
  operands.push_back(number(purpose));
  operands.push_back(number(style));
  return call("t_convert", to, std::move(operands));
}

Type Binder::common(const Type& a, const Type& b) {
  static constexpr Base precedence[] = {Base::unknown, Base::image,   Base::varchar,       Base::nvarchar, Base::ntext,
                                        Base::bit,     Base::tinyint, Base::smallint,      Base::integer,  Base::bigint,
                                        Base::decimal, Base::real,    Base::smalldatetime, Base::datetime};
  const auto rank = [](const Type& type) {
    return std::find(std::begin(precedence), std::end(precedence), type.base) - std::begin(precedence);
  };
  Type result = rank(a) >= rank(b) ? a : b;
  if (a.isText() && b.isText()) result.size = a.size < 0 || b.size < 0 ? -1 : std::max(a.size, b.size);
  return result;
}

void Binder::alignForComparison(BoundPtr& left, BoundPtr& right) {
  const Type type = common(left->type, right->type);
  // Numbers of two kinds compare as they lie.
  if (!(left->type.isNumber() && right->type.isNumber())) {
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
