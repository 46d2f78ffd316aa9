#include <algorithm>

#include "providers/embedded/bind/Binder.h"
#include "providers/embedded/bind/Literal.h"
#include "providers/embedded/bind/TypeRules.h"
#include "providers/embedded/functions/Decimal.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

using tsql::Form;
using tsql::Operation;
using tsql::Takes;

constexpr const char* calculation = "t_calculate";

bool isTextOrNull(const Type& type) { return type.isText() || type.base == Base::unknown; }

Form formOf(char op) { return op == '*' || op == '/' || op == '%' ? Form::product : Form::sum; }

std::string nameOfOperator(char op) {
  switch (op) {
    case '+':
      return "add";
    case '-':
      return "subtract";
    case '*':
      return "multiply";
    case '/':
      return "divide";
    case '%':
      return "modulo";
    default:
      return "'" + std::string(1, op) + "'";
  }
}

Failure incompatible(char op, const Type& left, const Type& right) {
  return tsql::sqlFailure(402, std::string("The data types ") + nameOf(left.base) + " and " + nameOf(right.base) +
                                   " are incompatible in the " + nameOfOperator(op) + " operator.");
}

// What an operator's two operands are together, as the table of the dialect tells its rows apart.
Takes kindOf(const Type& left, const Type& right) {
  if (left.isDate() || right.isDate()) return Takes::moment;
  return isTextOrNull(left) && isTextOrNull(right) ? Takes::text : Takes::number;
}

const Operation* rowFor(char op, Takes kind) {
  const auto rows = tsql::dialect();
  const auto row = std::ranges::find_if(rows, [&](const Operation& candidate) {
    const Takes takes = candidate.operand(0);
    const bool isNumber = takes == Takes::number || takes == Takes::exact || takes == Takes::integral;
    return candidate.form == formOf(op) && candidate.name[0] == op &&
           (isNumber ? kind == Takes::number : takes == kind);
  });
  return row == rows.end() ? nullptr : &*row;
}

bool fits(const Type& type, Takes takes) {
  if (takes == Takes::integral) return type.isWhole();
  return takes == Takes::exact ? type.isExact() : type.isNumber();
}

// How t_calculate knows a kind of number.
char letterOf(const Type& type) {
  switch (type.base) {
    case Base::bigint:
      return 'b';
    case Base::decimal:
      return 'd';
    case Base::real:
      return 'r';
    default:
      return 'i';
  }
}

}  // namespace

BoundPtr Binder::bindSign(const tsql::Expression& expression, const Scope& scope) {
  const tsql::Expression& operand = *expression.operands[0];
  const Operation& row = *tsql::operatorNamed(expression.op, Form::sign);
  if (expression.op == "-" && operand.kind == tsql::Expression::Kind::literal && literalType(operand.token).isNumber())
    return bindLiteral(operand, true);
  BoundPtr value = taken(row, 0, bind(operand, scope));
  if (expression.op == "+") return value;
  const Type type = row.gives == tsql::Gives::arithmetic ? arithmeticType('-', value->type, value->type) : value->type;
  // Two signs are none more digits.
  const Type result = type.base == Base::decimal ? value->type : type;
  std::vector<BoundPtr> operands;
  operands.push_back(std::move(value));
  operands.push_back(constant(std::to_string(codeOf(result))));
  return call(std::string(row.emitted), result, std::move(operands));
}

// From left to right, so that a sum of numbers overflows where the dialect's does.
BoundPtr Binder::bindChain(const tsql::Expression& expression, const Scope& scope) {
  BoundPtr whole = bind(*expression.operands[0], scope);
  for (std::size_t i = 1; i < expression.operands.size(); ++i)
    whole = combine(expression.op[i - 1], std::move(whole), bind(*expression.operands[i], scope));
  return whole;
}

BoundPtr Binder::combine(char op, BoundPtr left, BoundPtr right) {
  const Takes kind = kindOf(left->type, right->type);
  const bool isNull = left->type.base == Base::unknown && right->type.base == Base::unknown;
  const Operation* row = rowFor(op, kind);
  if (!row && isNull) row = rowFor(op, Takes::number);
  if (!row) {
    const Type& type = kind == Takes::moment && !left->type.isDate() ? right->type : left->type;
    throw tsql::sqlFailure(8117, std::string("Operand data type ") + nameOf(type.base) + " is invalid for " +
                                     nameOfOperator(op) + " operator.");
  }
  if (row->operand(0) == Takes::text) return join(std::move(left), std::move(right));
  if (row->operand(0) == Takes::moment) return moveDate(op, std::move(left), std::move(right));
  return calculate(*row, std::move(left), std::move(right));
}

BoundPtr Binder::join(BoundPtr left, BoundPtr right) {
  const bool isWide = left->type.base > Base::varchar || right->type.base > Base::varchar;
  Type type{isWide ? Base::nvarchar : Base::varchar, -1};
  if (!left->type.isLong() && !right->type.isLong()) type.size = left->type.size + right->type.size;
  if (left->kind != BoundExpression::Kind::infix || left->text != "||")
    return infix("||", type, std::move(left), std::move(right));
  left->type = type;
  left->aggregate = left->aggregate || right->aggregate;
  left->operands.push_back(std::move(right));
  return left;
}

BoundPtr Binder::moveDate(char op, BoundPtr left, BoundPtr right) {
  const Type type = !right->type.isDate()  ? left->type
                    : !left->type.isDate() ? right->type
                                           : commonType(left->type, right->type);
  const Type moment{Base::datetime, -1};
  std::vector<BoundPtr> operands;
  operands.push_back(coerce(std::move(left), moment, Purpose::compute));
  operands.push_back(coerce(std::move(right), moment, Purpose::compute));
  operands.push_back(constant(std::string("'") + op + "'"));
  operands.push_back(constant(std::to_string(codeOf(type))));
  return call("t_move", type, std::move(operands));
}

// A whole number that is written out has the digits that it is written with.
Type Binder::digitsOf(const BoundExpression& operand) {
  if (operand.kind == BoundExpression::Kind::parameter) {
    Parameter& literal = parameters_[operand.parameter];
    if (!literal.converted && literal.type.base == Base::integer) {
      literal.structural = true;
      const std::size_t zeros = std::min(literal.text.find_first_not_of('0'), literal.text.size());
      return {Base::decimal, std::max(static_cast<int>(literal.text.size() - zeros), 1)};
    }
  }
  return operand.type.isExact() ? asDecimalType(operand.type) : operand.type;
}

BoundPtr Binder::calculate(const Operation& row, BoundPtr left, BoundPtr right) {
  const char op = row.name[0];
  const Type met = commonType(left->type, right->type);
  const bool isDecimal = met.base == Base::decimal;
  const auto ownType = [&](const BoundExpression& side) {
    return !side.type.isNumber() ? met : isDecimal ? digitsOf(side) : side.type;
  };
  const Type type = arithmeticType(op, ownType(*left), ownType(*right));
  const bool isNull = met.base == Base::unknown;
  if (!isNull && !fits(met, row.operand(0))) throw incompatible(op, left->type, right->type);
  if (isDecimal && (op == '*' || op == '/')) return scaleDecimals(op, type, std::move(left), std::move(right));
  const Type common = isNull ? Type{Base::integer, -1} : type;
  left = coerce(std::move(left), common, Purpose::compute);
  right = coerce(std::move(right), common, Purpose::compute);

  const char letter = letterOf(common);
  const bool isOpen = left->kind == BoundExpression::Kind::call && left->text == calculation &&
                      left->operands.back()->text[1] == letter;
  if (!isOpen) {
    std::vector<BoundPtr> operands;
    operands.push_back(std::move(left));
    operands.push_back(std::move(right));
    operands.push_back(constant(std::string("'") + letter + op + "'"));
    return call(calculation, common, std::move(operands));
  }
  left->type = common;
  left->aggregate = left->aggregate || right->aggregate;
  BoundPtr form = std::move(left->operands.back());
  form->text.insert(form->text.size() - 1, 1, op);
  left->operands.back() = std::move(right);
  left->operands.push_back(std::move(form));
  return left;
}

// The digits behind the point of a product or quotient are those of both, cut to what the result's type has.
BoundPtr Binder::scaleDecimals(char op, const Type& type, BoundPtr left, BoundPtr right) {
  const auto exact = [&](BoundPtr side, const BoundExpression& other) {
    const Type own = side->type.isNumber() ? digitsOf(*side) : asDecimalType(other.type);
    return coerce(std::move(side), own, Purpose::compute);
  };
  const bool isProduct = op == '*';
  left = exact(std::move(left), *right);
  right = exact(std::move(right), *left);
  const int shift =
      isProduct ? left->type.scale + right->type.scale - type.scale : type.scale - left->type.scale + right->type.scale;
  std::vector<BoundPtr> operands;
  operands.push_back(std::move(left));
  operands.push_back(std::move(right));
  operands.push_back(constant(std::to_string(shift)));
  return call(isProduct ? "t_multiply" : "t_divide", type, std::move(operands));
}

}  // namespace QVSa::embedded
