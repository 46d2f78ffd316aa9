#include <algorithm>

#include "providers/tsql/ParserState.h"
#include "providers/tsql/SqlFailure.h"
#include "providers/tsql/Words.h"

namespace QVSa::tsql {
namespace {

using Kind = Expression::Kind;

struct Rule {
  std::string_view name;
  std::size_t least;
  std::size_t most;
  enum class Form { plain, aggregate, date, open } form = Form::plain;  // open: any number from `least` on
};

constexpr Rule kRules[] = {
    {"abs", 1, 1},
    {"avg", 1, 1, Rule::Form::aggregate},
    {"ceiling", 1, 1},
    {"charindex", 2, 3},
    {"coalesce", 2, 0, Rule::Form::open},
    {"count", 1, 1, Rule::Form::aggregate},
    {"dateadd", 3, 3, Rule::Form::date},
    {"datediff", 3, 3, Rule::Form::date},
    {"datepart", 2, 2, Rule::Form::date},
    {"day", 1, 1},
    {"floor", 1, 1},
    {"getdate", 0, 0},
    {"isnull", 2, 2},
    {"left", 2, 2},
    {"len", 1, 1},
    {"lower", 1, 1},
    {"ltrim", 1, 1},
    {"max", 1, 1, Rule::Form::aggregate},
    {"min", 1, 1, Rule::Form::aggregate},
    {"month", 1, 1},
    {"nullif", 2, 2},
    {"replace", 3, 3},
    {"replicate", 2, 2},
    {"right", 2, 2},
    {"round", 2, 3},
    {"rtrim", 1, 1},
    {"scope_identity", 0, 0},
    {"str", 1, 3},
    {"substring", 3, 3},
    {"sum", 1, 1, Rule::Form::aggregate},
    {"upper", 1, 1},
    {"year", 1, 1},
};

const Rule* ruleOf(std::string_view name) {
  const auto rule = std::find_if(std::begin(kRules), std::end(kRules),
                                 [&](const Rule& candidate) { return sameWord(candidate.name, name); });
  return rule == std::end(kRules) ? nullptr : rule;
}

struct DatePart {
  std::string_view name;
  std::string_view shorter[2];
};

constexpr DatePart kDateParts[] = {
    {"year", {"yyyy", "yy"}}, {"quarter", {"qq", "q"}}, {"month", {"mm", "m"}},   {"dayofyear", {"dy", "y"}},
    {"day", {"dd", "d"}},     {"week", {"wk", "ww"}},   {"weekday", {"dw", "w"}}, {"hour", {"hh"}},
    {"minute", {"mi", "n"}},  {"second", {"ss", "s"}},  {"millisecond", {"ms"}},
};

void checkCount(const Rule& rule, std::size_t count) {
  const bool isOpen = rule.form == Rule::Form::open;
  if (count >= rule.least && (isOpen || count <= rule.most)) return;
  const String begin = "The " + String(rule.name) + " function requires ";
  if (isOpen) throw sqlFailure(174, begin + "at least " + std::to_string(rule.least) + " argument(s).");
  if (rule.least == rule.most) throw sqlFailure(174, begin + std::to_string(rule.least) + " argument(s).");
  throw sqlFailure(189, begin + std::to_string(rule.least) + " to " + std::to_string(rule.most) + " arguments.");
}

}  // namespace

// Some functions have reserved words as names, so that the parenthesis decides.
bool Parser::isCall() const {
  if (now().kind != TokenKind::word || !isSymbol("(", 1)) return false;
  return !now().reserved || isWord("convert") || ruleOf(now().text) != nullptr;
}

ExpressionPtr Parser::function() {
  if (isWord("convert")) return convert();
  if (isWord("cast")) return cast();
  if (ruleOf(now().text) == nullptr)
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
  const Rule& rule = *ruleOf(word.text);
  auto call = std::make_unique<Expression>(Kind::function, word.position);
  call->name = rule.name;
  expectSymbol("(");
  const bool isDate = rule.form == Rule::Form::date && !isSymbol(")");
  if (isDate) call->datePart = datePart(rule.name);
  if (!isDate || takeSymbol(",")) arguments(*call, rule.form == Rule::Form::aggregate);
  expectSymbol(")");
  checkCount(rule, call->operands.size() + (isDate ? 1 : 0));
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
