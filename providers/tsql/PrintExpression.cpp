#include <algorithm>

#include "providers/tsql/PrintState.h"
#include "providers/tsql/Printer.h"
#include "providers/tsql/Words.h"

namespace QVSa::tsql {
namespace {

using Kind = Expression::Kind;

int strengthOf(const Expression& expression) {
  switch (expression.kind) {
    case Kind::logical:
      return expression.op == "or" ? strength::disjunction : strength::conjunction;
    case Kind::negation:
      return strength::negation;
    case Kind::comparison:
    case Kind::isNull:
    case Kind::between:
    case Kind::like:
    case Kind::in:
      return strength::predicate;
    case Kind::binary:
      return String("*/%").find(expression.op[0]) != String::npos ? strength::product : strength::sum;
    case Kind::unary:
      return expression.op == "~" ? strength::primary : strength::sign;
    default:
      return strength::primary;
  }
}

bool isPlainName(const String& name) {
  const auto isLetter = [](char c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_' || c == '#' || static_cast<signed char>(c) < 0;
  };
  const auto isInner = [&](char c) { return isLetter(c) || (c >= '0' && c <= '9') || c == '@' || c == '$'; };
  return !name.empty() && isLetter(name[0]) && std::all_of(name.begin(), name.end(), isInner);
}

// Literals alone between the parentheses would be read as one list.
bool looksLikeList(const Expression& expression) {
  const auto isLiteralOperand = [](const ExpressionPtr& operand) {
    const Expression& inner = operand->kind == Kind::unary && operand->op != "~" ? *operand->operands[0] : *operand;
    return inner.kind == Kind::literal;
  };
  return std::all_of(expression.operands.begin() + 1, expression.operands.end(), isLiteralOperand);
}

}  // namespace

String printName(const String& name) {
  if (isPlainName(name) && !isReserved(name)) return name;
  String quoted = "[";
  for (char c : name) quoted.append(c == ']' ? 2 : 1, c);
  return quoted + "]";
}

String print(const Expression& expression) {
  Writer writer;
  writer.write(expression);
  return writer.take();
}

String print(const TypeName& type) {
  Writer writer;
  writer.write(type);
  return writer.take();
}

void Writer::write(const TypeName& type) {
  add(printName(type.name));
  if (!type.size) return;
  add("(");
  add(*type.size < 0 ? "max" : std::to_string(*type.size));
  if (type.scale) add(", " + std::to_string(*type.scale));
  add(")");
}

void Writer::write(const Expression& expression, int least) {
  const bool isOpen = strengthOf(expression) < least;
  if (isOpen) add("(");
  writeInner(expression);
  if (isOpen) add(")");
}

void Writer::writeInner(const Expression& expression) {
  switch (expression.kind) {
    case Kind::null:
      return add("null");
    case Kind::literal:
    case Kind::list:
      return writeToken(expression.token);
    case Kind::column:
      writeQualified(expression.qualifier);
      return add(printName(expression.name));
    case Kind::star:
      writeQualified(expression.qualifier);
      return add("*");
    case Kind::unary:
    case Kind::negation:
      return writeSigned(expression);
    case Kind::binary:
    case Kind::logical:
      return writeBinary(expression, strengthOf(expression));
    case Kind::comparison:
    case Kind::isNull:
    case Kind::between:
    case Kind::like:
      return writePredicate(expression);
    case Kind::in:
      return writeIn(expression);
    case Kind::exists:
      add("exists ");
      return writeSubquery(*expression.select);
    case Kind::subquery:
      return writeSubquery(*expression.select);
    case Kind::function:
      return writeFunction(expression);
    case Kind::convert:
      return writeConvert(expression);
    case Kind::caseOf:
      return writeCase(expression);
  }
}

void Writer::writeText(const String& text) {
  add("N'");
  for (char c : text) text_.append(c == '\'' ? 2 : 1, c);
  add("'");
}

void Writer::writeToken(const Token& token) {
  if (token.kind == TokenKind::string) return writeText(token.text);
  if (token.kind == TokenKind::binary) add("0x");
  if (token.kind != TokenKind::list) return add(token.text);
  list(token.items, [&](const Token& item) { writeToken(item); });
}

void Writer::writeQualified(const std::vector<String>& qualifier) {
  for (const String& part : qualifier) {
    if (!part.empty()) add(printName(part));
    add(".");
  }
}

// Operators of one strength stand together from left to right, so that only the right one needs parentheses.
void Writer::writeBinary(const Expression& expression, int own) {
  write(*expression.operands[0], own);
  for (std::size_t i = 1; i < expression.operands.size(); ++i) {
    add(" ");
    add(expression.kind == Kind::logical ? std::string_view(expression.op)
                                         : std::string_view(expression.op).substr(i - 1, 1));
    add(" ");
    write(*expression.operands[i], own + 1);
  }
}

void Writer::writeSigned(const Expression& expression) {
  const bool isNegation = expression.kind == Kind::negation;
  add(isNegation ? "not " : expression.op);
  const int least = isNegation ? strength::negation : expression.op == "~" ? strength::primary : strength::product;
  write(*expression.operands[0], least);
}

void Writer::writePredicate(const Expression& expression) {
  const auto operand = [&](std::size_t i) { write(*expression.operands[i], strength::sum); };
  const char* negated = expression.negated ? " not" : "";
  operand(0);
  switch (expression.kind) {
    case Kind::isNull:
      return add(expression.negated ? " is not null" : " is null");
    case Kind::between:
      add(negated);
      add(" between ");
      operand(1);
      add(" and ");
      return operand(2);
    case Kind::like:
      add(negated);
      add(" like ");
      operand(1);
      if (expression.operands.size() < 3) return;
      add(" escape ");
      return operand(2);
    default:
      add(" " + expression.op + " ");
      return operand(1);
  }
}

void Writer::writeIn(const Expression& expression) {
  write(*expression.operands[0], strength::sum);
  add(expression.negated ? " not in " : " in ");
  if (expression.select) return writeSubquery(*expression.select);
  add("(");
  const bool isApart = expression.operands[1]->kind != Kind::list && looksLikeList(expression);
  for (std::size_t i = 1; i < expression.operands.size(); ++i) {
    if (i > 1) add(", ");
    if (isApart && i == 1) add("(");
    write(*expression.operands[i]);
    if (isApart && i == 1) add(")");
  }
  add(")");
}

void Writer::writeFunction(const Expression& expression) {
  add(expression.name);
  add("(");
  if (expression.distinct) add("distinct ");
  if (!expression.datePart.empty()) add(expression.datePart + ", ");
  list(expression.operands, [&](const ExpressionPtr& operand) { write(*operand); });
  add(")");
}

void Writer::writeConvert(const Expression& expression) {
  const bool isCast = expression.name == "cast";
  add(expression.name);
  add("(");
  if (isCast) {
    write(*expression.operands[0]);
    add(" as ");
    write(expression.type);
  } else {
    write(expression.type);
    add(", ");
    list(expression.operands, [&](const ExpressionPtr& operand) { write(*operand); });
  }
  add(")");
}

void Writer::writeCase(const Expression& expression) {
  std::size_t open = 1;
  add("case");
  for (const ExpressionPtr& operand : expression.operands) {
    add(" ");
    write(*operand);
  }
  for (const WhenBranch& branch : expression.branches) {
    if (branch.inElse) {
      ++open;
      add(" else case");
    }
    if (branch.operand) {
      add(" ");
      write(*branch.operand);
    }
    add(" when ");
    write(*branch.when);
    add(" then ");
    write(*branch.then);
  }
  if (expression.otherwise) {
    add(" else ");
    write(*expression.otherwise);
  }
  while (open-- > 0) add(" end");
}

void Writer::writeSubquery(const Select& select) {
  add("(");
  write(select);
  add(")");
}

}  // namespace QVSa::tsql
