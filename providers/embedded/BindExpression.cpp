#include <algorithm>
#include <iterator>
#include <string_view>
#include <utility>

#include "providers/embedded/Binder.h"
#include "providers/embedded/Literal.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

using Kind = tsql::Expression::Kind;

std::string qualifiedName(const tsql::Expression& column) {
  std::string name;
  for (const auto& part : column.qualifier) name += part + ".";
  return name + column.name;
}

BoundPtr make(BoundExpression::Kind kind) {
  auto bound = std::make_unique<BoundExpression>();
  bound->kind = kind;
  bound->type = {Base::bit, -1};
  return bound;
}

void addOperand(BoundExpression& to, BoundPtr operand) {
  to.aggregate = to.aggregate || operand->aggregate;
  to.operands.push_back(std::move(operand));
}

}  // namespace

BoundPtr Binder::bind(const tsql::Expression& expression, const Scope& scope) {
  switch (expression.kind) {
    case Kind::null: {
      BoundPtr null = make(BoundExpression::Kind::null);
      null->type = {};
      return null;
    }
    case Kind::literal:
      return bindLiteral(expression, false);
    case Kind::column:
      return bindColumn(expression, scope);
    case Kind::unary:
      return bindUnary(expression, scope);
    case Kind::binary:
      return bindBinary(expression, scope);
    case Kind::comparison:
      return bindComparison(expression, scope);
    case Kind::logical:
      return bindLogical(expression, scope);
    case Kind::negation: {
      BoundPtr negation = make(BoundExpression::Kind::prefix);
      negation->text = "not";
      addOperand(*negation, bind(*expression.operands[0], scope));
      return negation;
    }
    case Kind::isNull: {
      BoundPtr test = make(BoundExpression::Kind::isNull);
      test->negated = expression.negated;
      addOperand(*test, bind(*expression.operands[0], scope));
      return test;
    }
    case Kind::between:
      return bindBetween(expression, scope);
    case Kind::like:
      return bindLike(expression, scope);
    case Kind::in:
      return bindIn(expression, scope);
    case Kind::exists: {
      BoundPtr exists = make(BoundExpression::Kind::exists);
      exists->negated = expression.negated;
      exists->select = bindSelect(*expression.select, &scope);
      return exists;
    }
    case Kind::subquery: {
      BoundPtr subquery = make(BoundExpression::Kind::subquery);
      subquery->select = bindSelect(*expression.select, &scope);
      const auto& items = subquery->select->parts.front().core.items;
      if (items.size() != 1)
        throw tsql::sqlFailure(116,
                               "Only one expression can be specified in the select list when the subquery is not "
                               "introduced with EXISTS.");
      subquery->type = items.front().expression->type;
      return subquery;
    }
    case Kind::function:
      return bindFunction(expression, scope);
    case Kind::convert:
      return bindConvert(expression, scope);
    case Kind::caseOf:
      return bindCase(expression, scope);
    case Kind::star:
    case Kind::list:
      break;
  }
  throw tsql::sqlFailure(102, "Incorrect syntax near '*'.");
}

BoundPtr Binder::bindLiteral(const tsql::Expression& expression, bool negate) {
  Parameter literal = literalParameter(expression.token, Parameter::Source::literal);
  literal.negate = negate;
  literal.type = literalType(expression.token.kind);
  return parameter(literal);
}

Binder::Found Binder::findColumn(const tsql::Expression& expression, const Scope& scope) const {
  for (const Scope* level = &scope; level; level = level->outer) {
    std::optional<Found> found;
    for (const auto& source : level->sources) {
      if (!expression.qualifier.empty() && !sameName(source.name, expression.qualifier.back())) continue;
      const auto column = std::ranges::find_if(
          source.columns, [&](const SourceColumn& candidate) { return sameName(candidate.name, expression.name); });
      if (column == source.columns.end()) {
        if (expression.qualifier.empty()) continue;
        throw tsql::sqlFailure(207, "Invalid column name '" + expression.name + "'.");
      }
      if (found) throw tsql::sqlFailure(209, "Ambiguous column name '" + expression.name + "'.");
      found = Found{&source, &*column};
    }
    if (found) return *found;
  }
  if (!expression.qualifier.empty())
    throw tsql::sqlFailure(4104, "The multi-part identifier \"" + qualifiedName(expression) + "\" could not be bound.");
  throw tsql::sqlFailure(207, "Invalid column name '" + expression.name + "'.");
}

BoundPtr Binder::bindColumn(const tsql::Expression& expression, const Scope& scope) {
  const Found found = findColumn(expression, scope);
  BoundPtr column = make(BoundExpression::Kind::column);
  column->source = found.source->alias;
  column->text = found.column->emitted;
  column->type = found.column->type;
  column->collated = found.column->collated;
  return column;
}

BoundPtr Binder::bindUnary(const tsql::Expression& expression, const Scope& scope) {
  const tsql::Expression& operand = *expression.operands[0];
  if (expression.op == "-" && operand.kind == Kind::literal && literalType(operand.token.kind).isNumber())
    return bindLiteral(operand, true);
  BoundPtr value = bind(operand, scope);
  if (value->type.isText()) value = coerce(std::move(value), {Base::integer, -1}, Purpose::compute);
  if (expression.op == "+") return value;
  const Type type = value->type;
  std::vector<BoundPtr> operands;
  operands.push_back(std::move(value));
  if (expression.op == "-") return call("t_negate", type, std::move(operands));
  BoundPtr complement = make(BoundExpression::Kind::prefix);
  complement->text = expression.op;
  complement->type = type;
  addOperand(*complement, std::move(operands.front()));
  return complement;
}

BoundPtr Binder::bindBinary(const tsql::Expression& expression, const Scope& scope) {
  BoundPtr left = bind(*expression.operands[0], scope);
  BoundPtr right = bind(*expression.operands[1], scope);
  if (expression.op == "+") return bindPlus(std::move(left), std::move(right));
  if (expression.op == "-" && left->type.isDate() && !right->type.isDate())
    return moveDate("-", std::move(left), std::move(right));
  return arithmetic(expression.op, std::move(left), std::move(right));
}

BoundPtr Binder::bindPlus(BoundPtr left, BoundPtr right) {
  const bool leftText = left->type.isText() || left->type.base == Base::unknown;
  const bool rightText = right->type.isText() || right->type.base == Base::unknown;
  if (leftText && rightText) return infix("||", {Base::nvarchar, -1}, std::move(left), std::move(right));
  if (left->type.isDate()) return moveDate("+", std::move(left), std::move(right));
  if (right->type.isDate()) return moveDate("+", std::move(right), std::move(left));
  return arithmetic("+", std::move(left), std::move(right));
}

BoundPtr Binder::arithmetic(const std::string& op, BoundPtr left, BoundPtr right) {
  static constexpr std::pair<std::string_view, const char*> functions[] = {
      {"+", "t_add"}, {"-", "t_subtract"}, {"*", "t_multiply"}, {"/", "t_divide"}, {"%", "t_modulo"}};
  Type type = common(left->type, right->type);
  if (!type.isNumber()) throw tsql::sqlFailure(402, "The data types are incompatible in the operator '" + op + "'.");
  left = coerce(std::move(left), type, Purpose::compute);
  right = coerce(std::move(right), type, Purpose::compute);
  if (type.isWhole() && type.base < Base::integer) type = {Base::integer, -1};
  const auto* const function = std::ranges::find(functions, op, [](const auto& entry) { return entry.first; });
  if (function == std::end(functions)) return infix(op, type, std::move(left), std::move(right));
  // Large and fractional numbers follow the storage library's own arithmetic; a zero divisor is refused in all.
  if (op != "/" && op != "%" && type.base != Base::integer) return infix(op, type, std::move(left), std::move(right));
  std::vector<BoundPtr> operands;
  operands.push_back(std::move(left));
  operands.push_back(std::move(right));
  return call(function->second, type, std::move(operands));
}

BoundPtr Binder::moveDate(const std::string& op, BoundPtr date, BoundPtr days) {
  static constexpr const char* ticksPerDay = "25920000";
  const Type type = date->type;
  if (days->type.isDate()) return infix(op, {Base::datetime, -1}, std::move(date), std::move(days));
  days = coerce(std::move(days), {Base::real, -1}, Purpose::compute);
  std::vector<BoundPtr> ticks;
  ticks.push_back(infix("*", {Base::real, -1}, std::move(days), constant(ticksPerDay)));
  BoundPtr whole = coerce(call("round", {Base::real, -1}, std::move(ticks)), {Base::bigint, -1}, Purpose::compute);
  return infix(op, type, std::move(date), std::move(whole));
}

BoundPtr Binder::bindComparison(const tsql::Expression& expression, const Scope& scope) {
  BoundPtr left = bind(*expression.operands[0], scope);
  BoundPtr right = bind(*expression.operands[1], scope);
  alignForComparison(left, right);
  return infix(expression.op, {Base::bit, -1}, std::move(left), std::move(right));
}

BoundPtr Binder::bindLogical(const tsql::Expression& expression, const Scope& scope) {
  BoundPtr left = bind(*expression.operands[0], scope);
  return infix(expression.op, {Base::bit, -1}, std::move(left), bind(*expression.operands[1], scope));
}

BoundPtr Binder::bindBetween(const tsql::Expression& expression, const Scope& scope) {
  BoundPtr value = bind(*expression.operands[0], scope);
  BoundPtr low = bind(*expression.operands[1], scope);
  BoundPtr high = bind(*expression.operands[2], scope);
  alignForComparison(value, low);
  alignForComparison(value, high);
  BoundPtr between = make(BoundExpression::Kind::between);
  between->negated = expression.negated;
  addOperand(*between, std::move(value));
  addOperand(*between, std::move(low));
  addOperand(*between, std::move(high));
  return between;
}

BoundPtr Binder::bindLike(const tsql::Expression& expression, const Scope& scope) {
  const Type text{Base::nvarchar, -1};
  const tsql::Expression& pattern = *expression.operands[1];
  std::vector<BoundPtr> operands;
  for (const auto& operand : expression.operands)
    operands.push_back(coerce(bind(*operand, scope), text, Purpose::compute));
  const bool ranged = operands[0]->collated && operands[0]->kind == BoundExpression::Kind::column &&
                      pattern.kind == Kind::literal && operands.size() == 2 && !expression.negated;
  if (ranged && !ownLiterals_) patterns_.push_back(pattern.token.literal);
  const bool indexable = ranged && !likePrefix(pattern.token.text).empty();
  BoundPtr low, high;
  if (indexable) {
    // The storage library makes no range of a like under a collation of ours, so the statement does.
    const auto bound = [&](Parameter::Source source, const std::string& op) {
      Parameter limit = literalParameter(pattern.token, source);
      limit.type = text;
      BoundPtr column = bind(*expression.operands[0], scope);
      return infix(op, {Base::bit, -1}, std::move(column), parameter(limit));
    };
    low = bound(Parameter::Source::prefixLow, ">=");
    high = bound(Parameter::Source::prefixHigh, "<=");
  }
  BoundPtr like = call("t_like", {Base::bit, -1}, std::move(operands));
  if (indexable)
    return infix("and", {Base::bit, -1}, infix("and", {Base::bit, -1}, std::move(low), std::move(high)),
                 std::move(like));
  if (!expression.negated) return like;
  BoundPtr negation = make(BoundExpression::Kind::prefix);
  negation->text = "not";
  addOperand(*negation, std::move(like));
  return negation;
}

BoundPtr Binder::bindIn(const tsql::Expression& expression, const Scope& scope) {
  BoundPtr value = bind(*expression.operands[0], scope);
  if (expression.select) return bindInSelect(expression, std::move(value), scope);
  if (expression.operands.size() == 2 && expression.operands[1]->kind == Kind::list) {
    BoundPtr in = bindInList(*expression.operands[1], std::move(value));
    in->negated = expression.negated;
    return in;
  }
  BoundPtr in = make(BoundExpression::Kind::inValues);
  in->negated = expression.negated;
  addOperand(*in, std::move(value));
  for (std::size_t i = 1; i < expression.operands.size(); ++i) {
    BoundPtr item = bind(*expression.operands[i], scope);
    alignForComparison(in->operands[0], item);
    addOperand(*in, std::move(item));
  }
  return in;
}

BoundPtr Binder::bindInList(const tsql::Expression& list, BoundPtr value) {
  Type items;
  for (const auto& item : list.token.items) items = common(items, literalType(item.kind));
  const Type type = common(value->type, items);
  value = collate(coerce(std::move(value), type, Purpose::compute));
  Parameter literal = literalParameter(list.token, Parameter::Source::list);
  literal.type = type;
  BoundPtr in = make(BoundExpression::Kind::inList);
  in->parameter = parameter(literal)->parameter;
  addOperand(*in, std::move(value));
  return in;
}

BoundPtr Binder::bindInSelect(const tsql::Expression& expression, BoundPtr value, const Scope& scope) {
  BoundPtr in = make(BoundExpression::Kind::inSelect);
  in->negated = expression.negated;
  in->select = bindSelect(*expression.select, &scope);
  for (auto& part : in->select->parts) {
    if (part.core.items.size() != 1)
      throw tsql::sqlFailure(116,
                             "Only one expression can be specified in the select list when the subquery is not "
                             "introduced with EXISTS.");
    BoundPtr& item = part.core.items.front().expression;
    const Type type = common(value->type, item->type);
    value = coerce(std::move(value), type, Purpose::compute);
    item = coerce(std::move(item), type, Purpose::compute);
  }
  addOperand(*in, collate(std::move(value)));
  return in;
}

BoundPtr Binder::bindCase(const tsql::Expression& expression, const Scope& scope) {
  std::vector<BoundPtr> whens, thens;
  Type type;
  for (const auto& branch : expression.branches) {
    BoundPtr when = bind(*branch.when, scope);
    if (!expression.operands.empty()) {
      BoundPtr value = bind(*expression.operands[0], scope);
      alignForComparison(value, when);
      when = infix("=", {Base::bit, -1}, std::move(value), std::move(when));
    }
    whens.push_back(std::move(when));
    thens.push_back(bind(*branch.then, scope));
    type = common(type, thens.back()->type);
  }
  if (expression.otherwise) {
    thens.push_back(bind(*expression.otherwise, scope));
    type = common(type, thens.back()->type);
  }
  BoundPtr result = make(BoundExpression::Kind::caseOf);
  result->type = type;
  for (std::size_t i = 0; i < thens.size(); ++i) {
    if (i < whens.size()) addOperand(*result, std::move(whens[i]));
    addOperand(*result, coerce(std::move(thens[i]), type, Purpose::compute));
  }
  return result;
}

BoundPtr Binder::bindConvert(const tsql::Expression& expression, const Scope& scope) {
  static constexpr int defaultLength = 30;
  Type type = typeOf(expression.type);
  if (type.isText() && type.base != Base::ntext && !expression.type.size) type.size = defaultLength;
  int style = 0;
  if (expression.operands.size() > 1) {
    const tsql::Expression& given = *expression.operands[1];
    if (given.kind != Kind::literal || given.token.kind != tsql::TokenKind::integer)
      throw tsql::sqlFailure(8116, "Argument data type is invalid for argument 3 of convert function.");
    style = std::stoi(given.token.text);
  }
  return coerce(bind(*expression.operands[0], scope), type, Purpose::cast, style);
}

}  // namespace QVSa::embedded
