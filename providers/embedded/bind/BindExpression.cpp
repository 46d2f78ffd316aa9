#include <algorithm>
#include <iterator>
#include <string_view>
#include <utility>

#include "providers/embedded/bind/Binder.h"
#include "providers/embedded/bind/Literal.h"
#include "providers/embedded/bind/TypeRules.h"
#include "providers/embedded/storage/ColumnType.h"
#include "providers/tsql/Dialect.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

using Kind = tsql::Expression::Kind;

constexpr std::size_t mostNodes = 200'000;

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

// A view that reads another one twice, and so on, is a short statement with a tree without end.
void Binder::countNode() {
  deadline_.check();
  if (++nodes_ > mostNodes) refuseSize();
}

BoundPtr Binder::bind(const tsql::Expression& expression, const Scope& scope) {
  countNode();
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
      return bindSign(expression, scope);
    case Kind::binary:
      return bindChain(expression, scope);
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
      exists->select = bindInner(*expression.select, &scope);
      return exists;
    }
    case Kind::subquery:
      return bindSubquery(*expression.select, scope);
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
  literal.type = literalType(expression.token);
  return parameter(literal);
}

Binder::Found Binder::findColumn(const tsql::Expression& expression, const Scope& scope) const {
  for (const Scope* level = &scope; level; level = level->outer) {
    std::optional<Found> found;
    for (const auto& source : level->sources) {
      if (!expression.qualifier.empty() && !isNamed(source, expression.qualifier)) continue;
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

BoundPtr Binder::bindComparison(const tsql::Expression& expression, const Scope& scope) {
  BoundPtr left = bind(*expression.operands[0], scope);
  BoundPtr right = bind(*expression.operands[1], scope);
  alignForComparison(left, right);
  const tsql::Operation& row = *tsql::operatorNamed(expression.op, tsql::Form::comparison);
  return infix(std::string(row.emitted), {Base::bit, -1}, std::move(left), std::move(right));
}

BoundPtr Binder::bindLogical(const tsql::Expression& expression, const Scope& scope) {
  BoundPtr chain = make(BoundExpression::Kind::infix);
  chain->text = tsql::operatorNamed(expression.op, tsql::Form::logical)->emitted;
  for (const auto& operand : expression.operands) addOperand(*chain, bind(*operand, scope));
  return chain;
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
  const tsql::Operation& row = *tsql::operatorNamed("like", tsql::Form::predicate);
  const tsql::Expression& pattern = *expression.operands[1];
  std::vector<BoundPtr> operands;
  bool isVarchar = true;
  for (std::size_t i = 0; i < expression.operands.size(); ++i) {
    operands.push_back(taken(row, i, bind(*expression.operands[i], scope)));
    isVarchar = isVarchar && operands.back()->type.base == Base::varchar;
  }
  const bool ranged = operands[0]->collated && operands[0]->kind == BoundExpression::Kind::column &&
                      pattern.kind == Kind::literal && operands.size() == 2 && !expression.negated;
  if (ranged && !ownLiterals_) patterns_.push_back(pattern.token.literal);
  const bool indexable = ranged && !likePrefix(pattern.token.text).empty();
  BoundPtr whole = make(BoundExpression::Kind::infix);
  whole->text = "and";
  if (indexable) {
    // SQLite makes no range of a like under a collation of ours, so the statement does.
    const auto addBound = [&](Parameter::Source source, const std::string& op) {
      Parameter limit = literalParameter(pattern.token, source);
      limit.type = text;
      BoundPtr column = bind(*expression.operands[0], scope);
      addOperand(*whole, infix(op, {Base::bit, -1}, std::move(column), parameter(limit)));
    };
    addBound(Parameter::Source::prefixLow, ">=");
    addBound(Parameter::Source::prefixHigh, "<=");
  }
  const std::string function = std::string(row.emitted) + (isVarchar ? "_varchar" : "");
  addOperand(*whole, call(function, {Base::bit, -1}, std::move(operands)));
  if (!expression.negated) return whole;
  BoundPtr negation = make(BoundExpression::Kind::prefix);
  negation->text = "not";
  addOperand(*negation, std::move(whole));
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
  const Type type = commonType(value->type, literalType(list.token));
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
  in->select = bindInner(*expression.select, &scope);
  requireOneColumn(*in->select);
  for (auto& part : in->select->parts) {
    BoundPtr& item = part.core.items.front().expression;
    const Type type = commonType(value->type, item->type);
    value = coerce(std::move(value), type, Purpose::compute);
    item = coerce(std::move(item), type, Purpose::compute);
  }
  addOperand(*in, collate(std::move(value)));
  return in;
}

// A case in the else of another has a type of its own, which its results take before that of the one around it.
BoundPtr Binder::bindCase(const tsql::Expression& expression, const Scope& scope) {
  std::vector<BoundPtr> whens, thens;
  std::vector<std::size_t> levels;  // of the results
  std::vector<Type> types(1);       // by level
  const auto addResult = [&](const tsql::Expression& result) {
    thens.push_back(bind(result, scope));
    levels.push_back(types.size() - 1);
    types.back() = commonType(types.back(), thens.back()->type);
  };
  const tsql::Expression* operand = expression.operands.empty() ? nullptr : expression.operands.front().get();
  for (const auto& branch : expression.branches) {
    if (branch.inElse) {
      operand = branch.operand.get();
      types.emplace_back();
    }
    BoundPtr when = bind(*branch.when, scope);
    if (operand) {
      BoundPtr value = bind(*operand, scope);
      alignForComparison(value, when);
      when = infix("=", {Base::bit, -1}, std::move(value), std::move(when));
    }
    whens.push_back(std::move(when));
    addResult(*branch.then);
  }
  if (expression.otherwise) addResult(*expression.otherwise);
  for (std::size_t i = types.size() - 1; i > 0; --i) types[i - 1] = commonType(types[i - 1], types[i]);
  std::vector<std::size_t> next(types.size());  // the next level outwards of another type; itself where there is none
  for (std::size_t i = 1; i < types.size(); ++i)
    next[i] = !(types[i] == types[i - 1]) ? i - 1 : next[i - 1] == i - 1 ? i : next[i - 1];

  BoundPtr result = make(BoundExpression::Kind::caseOf);
  result->type = types.front();
  for (std::size_t i = 0; i < thens.size(); ++i) {
    std::size_t level = levels[i];
    BoundPtr then = coerce(std::move(thens[i]), types[level], Purpose::compute);
    for (; next[level] != level; level = next[level])
      then = coerce(std::move(then), types[next[level]], Purpose::compute);
    if (i < whens.size()) addOperand(*result, std::move(whens[i]));
    addOperand(*result, std::move(then));
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
