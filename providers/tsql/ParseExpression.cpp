#include <algorithm>

#include "providers/tsql/ParserState.h"
#include "providers/tsql/SqlFailure.h"
#include "providers/tsql/Words.h"

namespace QVSa::tsql {
namespace {

using Kind = Expression::Kind;

// More than a statement of use has. What a chain of them costs later grows with its length.
constexpr std::size_t kMostOperators = 10000;

bool isCondition(const Expression& expression) {
  switch (expression.kind) {
    case Kind::comparison:
    case Kind::logical:
    case Kind::negation:
    case Kind::isNull:
    case Kind::between:
    case Kind::like:
    case Kind::in:
    case Kind::exists:
      return true;
    default:
      return false;
  }
}

}  // namespace

void Parser::requireValue(const Expression& expression) const {
  if (isCondition(expression)) refusePosition(expression.position);
}

void Parser::requireCondition(const Expression& expression) const {
  if (isCondition(expression)) return;
  const Token& near = now().kind == TokenKind::end ? tokens_[at_ - 1] : now();
  throw sqlFailure(4145,
                   "An expression of non-boolean type specified in a context where a condition is expected, near '" +
                       near.text + "'.");
}

bool Parser::isOperator(Form form) const {
  return now().kind == TokenKind::symbol && operatorNamed(now().text, form) != nullptr;
}

void Parser::countOperator() {
  if (++operators_ > kMostOperators) refuseDepth();
}

ExpressionPtr Parser::expression() {
  const Nesting nesting(*this);
  return disjunction();
}

ExpressionPtr Parser::value() {
  ExpressionPtr whole = expression();
  requireValue(*whole);
  return whole;
}

ExpressionPtr Parser::condition() {
  ExpressionPtr whole = expression();
  requireCondition(*whole);
  return whole;
}

ExpressionPtr Parser::disjunction() {
  ExpressionPtr left = conjunction();
  while (isWord("or")) left = logical(std::move(left), &Parser::conjunction);
  return left;
}

ExpressionPtr Parser::conjunction() {
  ExpressionPtr left = negation();
  while (isWord("and")) left = logical(std::move(left), &Parser::negation);
  return left;
}

ExpressionPtr Parser::logical(ExpressionPtr left, ExpressionPtr (Parser::*right)()) {
  requireCondition(*left);
  countOperator();
  const char* const op = isWord("or") ? "or" : "and";
  ExpressionPtr whole = std::move(left);
  if (whole->kind != Kind::logical || whole->op != op) {
    auto chain = std::make_unique<Expression>(Kind::logical, now().position);
    chain->op = op;
    chain->operands.push_back(std::move(whole));
    whole = std::move(chain);
  }
  take();
  whole->operands.push_back((this->*right)());
  requireCondition(*whole->operands.back());
  return whole;
}

ExpressionPtr Parser::negation() {
  if (!isWord("not")) return predicate();
  const Nesting nesting(*this);
  auto whole = std::make_unique<Expression>(Kind::negation, take().position);
  whole->operands.push_back(negation());
  requireCondition(*whole->operands[0]);
  return whole;
}

ExpressionPtr Parser::predicate() {
  ExpressionPtr left = sum();
  if (isOperator(Form::comparison)) return comparison(std::move(left));
  if (isWord("is")) return nullTest(std::move(left));
  const bool negated = isWord("not") && (isWord("between", 1) || isWord("like", 1) || isWord("in", 1));
  if (negated) take();
  if (isWord("between")) return between(std::move(left), negated);
  if (isWord("like")) return like(std::move(left), negated);
  if (isWord("in")) return in(std::move(left), negated);
  return left;
}

ExpressionPtr Parser::comparison(ExpressionPtr left) {
  requireValue(*left);
  auto whole = std::make_unique<Expression>(Kind::comparison, now().position);
  whole->op = take().text;
  whole->operands.push_back(std::move(left));
  whole->operands.push_back(operandValue());
  return whole;
}

ExpressionPtr Parser::nullTest(ExpressionPtr left) {
  requireValue(*left);
  auto whole = std::make_unique<Expression>(Kind::isNull, take().position);
  whole->negated = takeWord("not");
  expectWord("null");
  whole->operands.push_back(std::move(left));
  return whole;
}

ExpressionPtr Parser::between(ExpressionPtr left, bool negated) {
  requireValue(*left);
  auto whole = std::make_unique<Expression>(Kind::between, take().position);
  whole->negated = negated;
  whole->operands.push_back(std::move(left));
  whole->operands.push_back(operandValue());
  expectWord("and");
  whole->operands.push_back(operandValue());
  return whole;
}

ExpressionPtr Parser::like(ExpressionPtr left, bool negated) {
  requireValue(*left);
  auto whole = std::make_unique<Expression>(Kind::like, take().position);
  whole->negated = negated;
  whole->operands.push_back(std::move(left));
  whole->operands.push_back(operandValue());
  if (takeWord("escape")) whole->operands.push_back(operandValue());
  return whole;
}

ExpressionPtr Parser::in(ExpressionPtr left, bool negated) {
  requireValue(*left);
  auto whole = std::make_unique<Expression>(Kind::in, take().position);
  whole->negated = negated;
  whole->operands.push_back(std::move(left));
  expectSymbol("(");
  if (now().kind == TokenKind::list) {
    auto list = std::make_unique<Expression>(Kind::list, now().position);
    list->token = take();
    whole->operands.push_back(std::move(list));
  } else if (isWord("select")) {
    whole->select = select();
  } else {
    do whole->operands.push_back(value());
    while (takeSymbol(","));
  }
  expectSymbol(")");
  return whole;
}

ExpressionPtr Parser::operandValue() {
  ExpressionPtr operand = sum();
  requireValue(*operand);
  return operand;
}

ExpressionPtr Parser::sum() {
  ExpressionPtr left = product();
  while (isOperator(Form::sum)) left = binary(std::move(left), Form::sum, &Parser::product);
  return left;
}

ExpressionPtr Parser::product() {
  ExpressionPtr left = sign();
  while (isOperator(Form::product)) left = binary(std::move(left), Form::product, &Parser::sign);
  return left;
}

ExpressionPtr Parser::binary(ExpressionPtr left, Form form, ExpressionPtr (Parser::*right)()) {
  requireValue(*left);
  countOperator();
  ExpressionPtr whole = std::move(left);
  if (whole->kind != Kind::binary || !operatorNamed(std::string_view(whole->op).substr(0, 1), form)) {
    auto chain = std::make_unique<Expression>(Kind::binary, now().position);
    chain->operands.push_back(std::move(whole));
    whole = std::move(chain);
  }
  whole->op += take().text;
  whole->operands.push_back((this->*right)());
  requireValue(*whole->operands.back());
  return whole;
}

// A sign binds weaker than * and / do: -a*b is -(a*b), and -100/-100*10 is -(100/-(100*10)).
ExpressionPtr Parser::sign() {
  if (!isOperator(Form::sign)) return primary();
  const bool isComplement = isSymbol("~");
  const Nesting nesting(*this);
  auto whole = std::make_unique<Expression>(Kind::unary, now().position);
  whole->op = take().text;
  whole->operands.push_back(isComplement ? sign() : product());
  requireValue(*whole->operands[0]);
  return whole;
}

ExpressionPtr Parser::primary() {
  const Token& token = now();
  if (isSymbol("(")) return parenthesised();
  if (isLiteral(token.kind) && token.kind != TokenKind::list) return literal();
  if (token.kind == TokenKind::variable)
    throw sqlFailure(137, "Must declare the scalar variable \"" + token.text + "\".");
  if (isCall()) return function();
  if (isName()) return column();
  if (isWord("null")) return std::make_unique<Expression>(Kind::null, take().position);
  if (isWord("case")) return caseOf();
  if (isWord("exists")) return exists();
  refuse();
}

ExpressionPtr Parser::parenthesised() {
  const std::size_t position = take().position;
  ExpressionPtr inner;
  if (isWord("select")) {
    inner = std::make_unique<Expression>(Kind::subquery, position);
    inner->select = select();
  } else {
    inner = expression();
  }
  expectSymbol(")");
  return inner;
}

ExpressionPtr Parser::exists() {
  auto whole = std::make_unique<Expression>(Kind::exists, take().position);
  expectSymbol("(");
  whole->select = select();
  expectSymbol(")");
  return whole;
}

ExpressionPtr Parser::literal() {
  auto whole = std::make_unique<Expression>(Kind::literal, now().position);
  whole->token = take();
  return whole;
}

ExpressionPtr Parser::column() {
  auto whole = std::make_unique<Expression>(Kind::column, now().position);
  whole->qualifier = nameParts(4);
  whole->name = std::move(whole->qualifier.back());
  whole->qualifier.pop_back();
  return whole;
}

ExpressionPtr Parser::caseOf() {
  auto whole = std::make_unique<Expression>(Kind::caseOf, now().position);
  std::size_t open = 0;
  do {
    branches(*whole);
    ++open;
    countOperator();
    if (!takeWord("else")) break;
    if (!isElseOfCaseOnly()) whole->otherwise = value();
  } while (!whole->otherwise);
  while (open-- > 0) expectWord("end");
  return whole;
}

// case [operand] when .. then .. when ..
void Parser::branches(Expression& whole) {
  take();
  const std::size_t first = whole.branches.size();
  ExpressionPtr operand = isWord("when") ? nullptr : value();
  const bool isSimple = operand != nullptr;
  while (takeWord("when")) {
    WhenBranch branch;
    branch.when = isSimple ? value() : condition();
    expectWord("then");
    branch.then = value();
    whole.branches.push_back(std::move(branch));
  }
  if (whole.branches.size() == first) refuse();
  if (first > 0) {
    whole.branches[first].inElse = true;
    whole.branches[first].operand = std::move(operand);
  } else if (isSimple) {
    whole.operands.push_back(std::move(operand));
  }
}

// Whether a case stands here and nothing more up to the end of the one around it. Its end is looked up, since looking
// ahead at each case of a long chain would read the chain as many times.
bool Parser::isElseOfCaseOnly() {
  if (!isWord("case")) return false;
  if (caseEnds_.empty()) {
    caseEnds_.resize(tokens_.size());
    std::vector<std::size_t> open;
    for (std::size_t i = 0; i < tokens_.size(); ++i) {
      if (tokens_[i].kind != TokenKind::word || !tokens_[i].reserved) continue;
      if (sameWord(tokens_[i].text, "case")) open.push_back(i);
      if (open.empty() || !sameWord(tokens_[i].text, "end")) continue;
      caseEnds_[open.back()] = i;
      open.pop_back();
    }
  }
  const std::size_t end = caseEnds_[at_];
  return end != 0 && isWord("end", end + 1 - at_);
}

}  // namespace QVSa::tsql
