#include "providers/tsql/Dialect.h"

#include <algorithm>

#include "providers/tsql/SqlFailure.h"
#include "providers/tsql/Words.h"

namespace QVSa::tsql {
namespace {

constexpr std::size_t kOpen = Operation::open;

constexpr std::array<Takes, 3> all(Takes takes) { return {takes, takes, takes}; }

constexpr Operation kDialect[] = {
    // Texts
    {"charindex", Form::function, 2, 3, {Takes::text, Takes::text, Takes::whole}, Gives::whole, "t_charindex"},
    {"left", Form::function, 2, 2, {Takes::text, Takes::whole}, Gives::first, "t_left"},
    {"len", Form::function, 1, 1, {Takes::text}, Gives::whole, "t_len"},
    {"lower", Form::function, 1, 1, {Takes::text}, Gives::first, "t_lower"},
    {"ltrim", Form::function, 1, 1, {Takes::text}, Gives::first, "t_ltrim"},
    {"replace", Form::function, 3, 3, all(Takes::text), Gives::cutText, "t_replace", Behind::limit},
    {"replicate", Form::function, 2, 2, {Takes::text, Takes::whole}, Gives::cutText, "t_replicate", Behind::limit},
    {"right", Form::function, 2, 2, {Takes::text, Takes::whole}, Gives::first, "t_right"},
    {"rtrim", Form::function, 1, 1, {Takes::text}, Gives::first, "t_rtrim"},
    {"str", Form::function, 1, 3, {Takes::real, Takes::whole, Takes::whole}, Gives::shortText, "t_str"},
    {"substring", Form::function, 3, 3, {Takes::text, Takes::whole, Takes::whole}, Gives::first, "t_substring"},
    {"upper", Form::function, 1, 1, {Takes::text}, Gives::first, "t_upper"},
    // Dates
    {"dateadd", Form::function, 3, 3, {Takes::datePart, Takes::whole, Takes::moment}, Gives::moment, "t_dateadd"},
    {"datediff", Form::function, 3, 3, {Takes::datePart, Takes::moment, Takes::moment}, Gives::whole, "t_datediff"},
    {"datepart", Form::function, 2, 2, {Takes::datePart, Takes::moment}, Gives::whole, "t_datepart"},
    {"day", Form::function, 1, 1, {Takes::moment}, Gives::whole, "t_day"},
    {"getdate", Form::function, 0, 0, {}, Gives::moment, "t_getdate"},
    {"month", Form::function, 1, 1, {Takes::moment}, Gives::whole, "t_month"},
    {"year", Form::function, 1, 1, {Takes::moment}, Gives::whole, "t_year"},
    // Numbers
    {"abs", Form::function, 1, 1, {Takes::number}, Gives::first, "t_abs", Behind::type},
    {"ceiling", Form::function, 1, 1, {Takes::number}, Gives::floor, "t_ceiling", Behind::type},
    {"floor", Form::function, 1, 1, {Takes::number}, Gives::floor, "t_floor", Behind::type},
    {"round", Form::function, 2, 3, {Takes::number, Takes::whole, Takes::whole}, Gives::first, "t_round", Behind::type},
    // Values of any type
    {"coalesce", Form::function, 2, kOpen, all(Takes::common), Gives::common, "coalesce"},
    {"isnull", Form::function, 2, 2, {Takes::anything, Takes::first}, Gives::first, "ifnull"},
    {"nullif", Form::function, 2, 2, all(Takes::common), Gives::first, "case"},
    {"scope_identity", Form::function, 0, 0, {}, Gives::identity, "t_scope_identity"},
    {"cast", Form::conversion, 2, 2, {Takes::anything, Takes::type}, Gives::named, "t_convert"},
    {"convert", Form::conversion, 2, 3, {Takes::type, Takes::anything, Takes::style}, Gives::named, "t_convert"},
    // Aggregates
    {"avg", Form::aggregate, 1, 1, {Takes::summable}, Gives::average, "t_avg"},
    {"count", Form::aggregate, 1, 1, {Takes::anything}, Gives::whole, "count"},
    {"max", Form::aggregate, 1, 1, {Takes::comparable}, Gives::first, "max"},
    {"min", Form::aggregate, 1, 1, {Takes::comparable}, Gives::first, "min"},
    {"sum", Form::aggregate, 1, 1, {Takes::summable}, Gives::total, "t_sum"},
    // Operators
    {"-", Form::sign, 1, 1, {Takes::number}, Gives::arithmetic, "t_negate", Behind::type},
    {"+", Form::sign, 1, 1, {Takes::number}, Gives::first, "+"},
    {"~", Form::sign, 1, 1, {Takes::integral}, Gives::first, "t_complement", Behind::type},
    {"*", Form::product, 2, kOpen, all(Takes::number), Gives::arithmetic, "t_calculate"},
    {"/", Form::product, 2, kOpen, all(Takes::number), Gives::arithmetic, "t_calculate"},
    {"%", Form::product, 2, kOpen, all(Takes::exact), Gives::arithmetic, "t_calculate"},
    {"+", Form::sum, 2, kOpen, all(Takes::text), Gives::joinedText, "||"},
    {"+", Form::sum, 2, kOpen, all(Takes::moment), Gives::common, "t_move"},
    {"+", Form::sum, 2, kOpen, all(Takes::number), Gives::arithmetic, "t_calculate"},
    {"-", Form::sum, 2, kOpen, all(Takes::moment), Gives::common, "t_move"},
    {"-", Form::sum, 2, kOpen, all(Takes::number), Gives::arithmetic, "t_calculate"},
    {"&", Form::sum, 2, kOpen, all(Takes::integral), Gives::arithmetic, "t_calculate"},
    {"|", Form::sum, 2, kOpen, all(Takes::integral), Gives::arithmetic, "t_calculate"},
    {"^", Form::sum, 2, kOpen, all(Takes::integral), Gives::arithmetic, "t_calculate"},
    {"=", Form::comparison, 2, 2, all(Takes::common), Gives::condition, "="},
    {"<>", Form::comparison, 2, 2, all(Takes::common), Gives::condition, "<>"},
    {"<", Form::comparison, 2, 2, all(Takes::common), Gives::condition, "<"},
    {"<=", Form::comparison, 2, 2, all(Takes::common), Gives::condition, "<="},
    {">", Form::comparison, 2, 2, all(Takes::common), Gives::condition, ">"},
    {">=", Form::comparison, 2, 2, all(Takes::common), Gives::condition, ">="},
    {"*=", Form::comparison, 2, 2, all(Takes::common), Gives::condition, "="},
    {"=*", Form::comparison, 2, 2, all(Takes::common), Gives::condition, "="},
    {"is null", Form::predicate, 1, 1, {Takes::anything}, Gives::condition, "is null"},
    {"between", Form::predicate, 3, 3, all(Takes::common), Gives::condition, "between"},
    {"like", Form::predicate, 2, 3, all(Takes::text), Gives::condition, "t_like"},
    {"in", Form::predicate, 2, 2, {Takes::common, Takes::list}, Gives::condition, "in"},
    {"exists", Form::predicate, 1, 1, {Takes::list}, Gives::condition, "exists"},
    {"not", Form::logical, 1, 1, {Takes::condition}, Gives::condition, "not"},
    {"and", Form::logical, 2, kOpen, all(Takes::condition), Gives::condition, "and"},
    {"or", Form::logical, 2, kOpen, all(Takes::condition), Gives::condition, "or"},
};

}  // namespace

Takes Operation::operand(std::size_t place) const { return takes[std::min(place, takes.size() - 1)]; }

std::span<const Operation> dialect() { return kDialect; }

const Operation* functionNamed(std::string_view name) {
  const auto found = std::find_if(std::begin(kDialect), std::end(kDialect), [&](const Operation& row) {
    return row.form <= Form::conversion && sameWord(row.name, name);
  });
  return found == std::end(kDialect) ? nullptr : found;
}

const Operation* operatorNamed(std::string_view symbol, Form form) {
  const auto found = std::find_if(std::begin(kDialect), std::end(kDialect),
                                  [&](const Operation& row) { return row.form == form && row.name == symbol; });
  return found == std::end(kDialect) ? nullptr : found;
}

void checkCount(const Operation& function, std::size_t count) {
  if (count >= function.least && count <= function.most) return;
  const String begin = "The " + String(function.name) + " function requires ";
  if (function.most == Operation::open)
    throw sqlFailure(174, begin + "at least " + std::to_string(function.least) + " argument(s).");
  if (function.least == function.most) throw sqlFailure(174, begin + std::to_string(function.least) + " argument(s).");
  throw sqlFailure(189,
                   begin + std::to_string(function.least) + " to " + std::to_string(function.most) + " arguments.");
}

}  // namespace QVSa::tsql
