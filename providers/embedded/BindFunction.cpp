#include <algorithm>
#include <array>
#include <map>
#include <string_view>

#include "providers/embedded/Binder.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

constexpr Type text{Base::nvarchar, -1};
constexpr Type whole{Base::integer, -1};
constexpr Type number{Base::real, -1};
constexpr Type moment{Base::datetime, -1};

// A function that takes and gives values of fixed types. `keep` means that the argument stays as it is.
struct Signature {
  std::string function;
  Type result;
  std::vector<Type> arguments;
};

constexpr Type keep{};

// Never destroyed: a host may call with its last statics.
const std::map<std::string, Signature>& signatures() {
  static const auto& table = *new std::map<std::string, Signature>{
      {"len", {"t_len", whole, {text}}},
      {"charindex", {"t_charindex", whole, {text, text, whole}}},
      {"replace", {"t_replace", text, {text, text, text}}},
      {"substring", {"t_substring", text, {text, whole, whole}}},
      {"left", {"t_left", text, {text, whole}}},
      {"right", {"t_right", text, {text, whole}}},
      {"ltrim", {"t_ltrim", text, {text}}},
      {"rtrim", {"t_rtrim", text, {text}}},
      {"upper", {"t_upper", text, {text}}},
      {"lower", {"t_lower", text, {text}}},
      {"str", {"t_str", text, {number, whole, whole}}},
      {"replicate", {"t_replicate", text, {text, whole}}},
      {"getdate", {"t_getdate", moment, {}}},
      {"scope_identity", {"t_scope_identity", {Base::decimal, -1}, {}}},
      {"floor", {"t_floor", keep, {keep}}},
      {"ceiling", {"t_ceiling", keep, {keep}}},
      {"abs", {"t_abs", keep, {keep}}},
      {"round", {"t_round", keep, {keep, whole}}},
  };
  return table;
}

bool isAggregate(const std::string& function) {
  constexpr std::array<std::string_view, 5> aggregates = {"count", "min", "max", "sum", "avg"};
  return std::ranges::find(aggregates, function) != aggregates.end();
}

}  // namespace

BoundPtr Binder::bindFunction(const tsql::Expression& expression, const Scope& scope) {
  if (isAggregate(expression.name)) return bindAggregate(expression, scope);
  if (expression.name == "isnull") return bindIsNull(expression, scope);
  if (expression.name == "coalesce") return bindCoalesce(expression, scope);
  if (expression.name == "nullif") {
    BoundPtr left = bind(*expression.operands[0], scope);
    BoundPtr right = bind(*expression.operands[1], scope);
    const Type type = left->type;
    alignForComparison(left, right);
    std::vector<BoundPtr> operands;
    operands.push_back(std::move(left));
    operands.push_back(std::move(right));
    return call("nullif", type, std::move(operands));
  }
  const auto signature = signatures().find(expression.name);
  if (signature == signatures().end()) return bindDateFunction(expression, scope);
  std::vector<BoundPtr> operands;
  for (std::size_t i = 0; i < expression.operands.size(); ++i)
    operands.push_back(coerce(bind(*expression.operands[i], scope), signature->second.arguments[i], Purpose::compute));
  const Type result =
      signature->second.result == keep && !operands.empty() ? operands[0]->type : signature->second.result;
  return call(signature->second.function, result, std::move(operands));
}

BoundPtr Binder::bindDateFunction(const tsql::Expression& expression, const Scope& scope) {
  const bool namesPart = expression.name == "year" || expression.name == "month" || expression.name == "day";
  const std::string& part = namesPart ? expression.name : expression.datePart;
  std::vector<BoundPtr> operands;
  operands.push_back(constant("'" + part + "'"));
  for (const auto& operand : expression.operands) {
    const bool count = expression.name == "dateadd" && operands.size() == 1;
    operands.push_back(coerce(bind(*operand, scope), count ? whole : moment, Purpose::compute));
  }
  if (expression.name == "dateadd") return call("t_dateadd", moment, std::move(operands));
  if (expression.name == "datediff") return call("t_datediff", whole, std::move(operands));
  if (expression.name == "datepart" || namesPart) return call("t_datepart", whole, std::move(operands));
  throw tsql::sqlFailure(195, "'" + expression.name + "' is not a recognized built-in function name.");
}

BoundPtr Binder::bindAggregate(const tsql::Expression& expression, const Scope& scope) {
  const tsql::Expression& argument = *expression.operands[0];
  std::vector<BoundPtr> operands;
  operands.push_back(argument.kind == tsql::Expression::Kind::star ? constant("*") : bind(argument, scope));
  if (operands[0]->aggregate)
    throw tsql::sqlFailure(130,
                           "Cannot perform an aggregate function on an expression containing an aggregate or a "
                           "subquery.");
  const Type type = operands[0]->type;
  if ((expression.name == "sum" || expression.name == "avg") && !type.isNumber())
    throw tsql::sqlFailure(8117, "Operand data type is invalid for " + expression.name + " operator.");
  operands[0] = collate(std::move(operands[0]));
  const Type summed = type.isWhole() && type.base < Base::integer ? whole : type;
  BoundPtr result;
  if (expression.name == "avg" && type.isWhole()) {
    // The average of whole numbers is a whole number, cut.
    std::vector<BoundPtr> again;
    again.push_back(bind(argument, scope));
    BoundPtr sum = call("sum", summed, std::move(operands));
    BoundPtr count = call("count", whole, std::move(again));
    sum->distinct = count->distinct = expression.distinct;
    sum->aggregate = count->aggregate = true;
    result = infix("/", summed, std::move(sum), std::move(count));
  } else {
    const Type given = expression.name == "count" ? whole : expression.name == "sum" ? summed : type;
    result = call(expression.name, given, std::move(operands));
    result->distinct = expression.distinct;
    result->aggregate = true;
    // A sum of whole numbers overflows as the type does.
    if (expression.name == "sum" && summed.base == Base::integer) {
      result->type = {Base::bigint, -1};
      result = coerce(std::move(result), whole, Purpose::compute);
    }
  }
  return result;
}

BoundPtr Binder::bindIsNull(const tsql::Expression& expression, const Scope& scope) {
  BoundPtr value = bind(*expression.operands[0], scope);
  BoundPtr otherwise = bind(*expression.operands[1], scope);
  const Type type = value->type.base == Base::unknown ? otherwise->type : value->type;
  std::vector<BoundPtr> operands;
  operands.push_back(std::move(value));
  operands.push_back(coerce(std::move(otherwise), type, Purpose::cast));
  return call("ifnull", type, std::move(operands));
}

BoundPtr Binder::bindCoalesce(const tsql::Expression& expression, const Scope& scope) {
  std::vector<BoundPtr> operands;
  Type type;
  for (const auto& operand : expression.operands) {
    operands.push_back(bind(*operand, scope));
    type = common(type, operands.back()->type);
  }
  for (auto& operand : operands) operand = coerce(std::move(operand), type, Purpose::compute);
  return call("coalesce", type, std::move(operands));
}

}  // namespace QVSa::embedded
