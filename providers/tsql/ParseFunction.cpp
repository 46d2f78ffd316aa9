#include <algorithm>

#include "providers/tsql/ParserState.h"
#include "providers/tsql/SqlFailure.h"
#include "providers/tsql/Words.h"

namespace QVSa::tsql {
namespace {

using Kind = Expression::Kind;

struct DatePart {
  std::string_view name;
  std::string_view shorter[2];
};

constexpr DatePart kDateParts[] = {
    {"year", {"yyyy", "yy"}}, {"quarter", {"qq", "q"}}, {"month", {"mm", "m"}},   {"dayofyear", {"dy", "y"}},
    {"day", {"dd", "d"}},     {"week", {"wk", "ww"}},   {"weekday", {"dw", "w"}}, {"hour", {"hh"}},
    {"minute", {"mi", "n"}},  {"second", {"ss", "s"}},  {"millisecond", {"ms"}},
};

}  // namespace

// Some functions have reserved words as names, so that the parenthesis decides.
bool Parser::isCall() const {
  if (now().kind != TokenKind::word || !isSymbol("(", 1)) return false;
  return !now().reserved || functionNamed(now().text) != nullptr;
}

ExpressionPtr Parser::function() {
  if (isWord("convert")) return convert();
  if (isWord("cast")) return cast();
  if (functionNamed(now().text) == nullptr)
    throw sqlFailure(195, "'" + now().text + "' is not a recognized built-in function name.");
  return knownFunction();
}

ExpressionPtr Parser::convert() {
  auto whole = std::make_unique<Expression>(Kind::convert, take().position);
  whole->name = "convert";
  expectSymbol("(");
  whole->type = typeName();
  expectSymbol(",");
  whole->operands.push_back(value());
  if (takeSymbol(",")) whole->operands.push_back(value());
  expectSymbol(")");
  return whole;
}

ExpressionPtr Parser::cast() {
  auto whole = std::make_unique<Expression>(Kind::convert, take().position);
  whole->name = "cast";
  expectSymbol("(");
  whole->operands.push_back(value());
  expectWord("as");
  whole->type = typeName();
  expectSymbol(")");
  return whole;
}

ExpressionPtr Parser::knownFunction() {
  const Token& word = take();
  const Operation& row = *functionNamed(word.text);
  auto call = std::make_unique<Expression>(Kind::function, word.position);
  call->name = row.name;
  expectSymbol("(");
  const bool isDate = row.most > 0 && row.operand(0) == Takes::datePart && !isSymbol(")");
  if (isDate) call->datePart = datePart(row.name);
  if (!isDate || takeSymbol(",")) arguments(*call, row.form == Form::aggregate);
  expectSymbol(")");
  checkCount(row, call->operands.size() + (isDate ? 1 : 0));
  return call;
}

String Parser::datePart(std::string_view function) {
  if (isLiteral(now().kind)) throw sqlFailure(1023, "Invalid parameter 1 specified for " + String(function) + ".");
  if (now().kind != TokenKind::word) refuse();
  const String& word = take().text;
  for (const DatePart& part : kDateParts) {
    if (sameWord(part.name, word)) return String(part.name);
    for (std::string_view shorter : part.shorter)
      if (sameWord(shorter, word)) return String(part.name);
  }
  throw sqlFailure(155, "'" + word + "' is not a recognized " + String(function) + " option.");
}

void Parser::arguments(Expression& call, bool aggregate) {
  if (isSymbol(")")) return;
  if (call.name == "count" && isSymbol("*")) {
    call.operands.push_back(star());
    return;
  }
  if (aggregate) call.distinct = takeWord("distinct");
  if (aggregate && !call.distinct) takeWord("all");
  do call.operands.push_back(value());
  while (takeSymbol(","));
}

}  // namespace QVSa::tsql
