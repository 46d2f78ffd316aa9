#include "providers/embedded/storage/ColumnType.h"

#include <algorithm>
#include <iterator>
#include <string_view>
#include <utility>

#include "providers/embedded/functions/Decimal.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

Type decimalType(const tsql::TypeName& name) {
  const std::int64_t precision = name.size.value_or(18);
  const std::int64_t scale = name.scale.value_or(0);
  if (precision < 1) throw tsql::sqlFailure(1001, "Length or precision specification 0 is invalid.");
  if (precision > mostDecimalDigits)
    throw tsql::sqlFailure(2750, "Specified column precision " + std::to_string(precision) +
                                     " is greater than the maximum precision of 38.");
  if (scale > precision) throw tsql::sqlFailure(192, "The scale must be less than or equal to the precision.");
  return {Base::decimal, static_cast<int>(precision), static_cast<int>(scale)};
}

}  // namespace

Type typeOf(const tsql::TypeName& name) {
  static constexpr std::pair<std::string_view, Base> known[] = {
      {"bit", Base::bit},         {"tinyint", Base::tinyint},   {"smallint", Base::smallint},
      {"int", Base::integer},     {"integer", Base::integer},   {"bigint", Base::bigint},
      {"decimal", Base::decimal}, {"numeric", Base::decimal},   {"float", Base::real},
      {"real", Base::real},       {"datetime", Base::datetime}, {"smalldatetime", Base::smalldatetime},
      {"varchar", Base::varchar}, {"char", Base::varchar},      {"nvarchar", Base::nvarchar},
      {"nchar", Base::nvarchar},  {"text", Base::ntext},        {"ntext", Base::ntext},
      {"image", Base::image},     {"binary", Base::image},      {"varbinary", Base::image}};
  const auto* const base = std::ranges::find(known, name.name, [](const auto& entry) { return entry.first; });
  if (base == std::end(known)) throw tsql::sqlFailure(2715, "Cannot find data type " + name.name + ".");
  if (base->second == Base::decimal) return decimalType(name);
  const bool sized = base->second == Base::varchar || base->second == Base::nvarchar ||
                     (base->second == Base::image && name.name != "image");
  if (!sized) return {base->second, -1};
  return {base->second, static_cast<int>(name.size.value_or(1))};
}

}  // namespace QVSa::embedded
