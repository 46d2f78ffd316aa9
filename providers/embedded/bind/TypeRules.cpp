#include "providers/embedded/bind/TypeRules.h"

#include <algorithm>

#include "providers/embedded/functions/Decimal.h"

namespace QVSa::embedded {

namespace {

constexpr int leastScale = 6;  // that a result of too many digits keeps

std::ptrdiff_t rankOf(const Type& type) {
  static constexpr Base precedence[] = {Base::unknown, Base::image,   Base::varchar,       Base::nvarchar, Base::ntext,
                                        Base::bit,     Base::tinyint, Base::smallint,      Base::integer,  Base::bigint,
                                        Base::decimal, Base::real,    Base::smalldatetime, Base::datetime};
  return std::find(std::begin(precedence), std::end(precedence), type.base) - std::begin(precedence);
}

// Digits before the point and behind it, at most 38 in all: those before it come first. A sum may carry one over, for
// which nothing is given up.
Type decimalType(int whole, int scale, int carry = 0) {
  return {Base::decimal, std::min(whole + scale + carry, mostDecimalDigits),
          std::min(scale, mostDecimalDigits - whole)};
}

// A product or quotient of too many digits keeps six behind the point, and of those before it what is left.
Type scaledType(int whole, int scale) {
  if (whole + scale <= mostDecimalDigits) return {Base::decimal, whole + scale, scale};
  return {Base::decimal, mostDecimalDigits, std::min(scale, std::max(mostDecimalDigits - whole, leastScale))};
}

Type decimalResult(char op, const Type& a, const Type& b) {
  const int wholeA = a.size - a.scale;
  const int wholeB = b.size - b.scale;
  const int scale = std::max(a.scale, b.scale);
  switch (op) {
    case '*':
      return scaledType(wholeA + wholeB + 1, a.scale + b.scale);
    case '/':
      return scaledType(wholeA + b.scale, std::max(leastScale, a.scale + b.size + 1));
    case '%':
      return decimalType(std::min(wholeA, wholeB), scale);
    default:
      return decimalType(std::max(wholeA, wholeB), scale, 1);
  }
}

}  // namespace

Type textType(Base base, bool isLong) {
  constexpr int mostBytes = 8000;
  return {base, isLong ? -1 : base == Base::varchar ? mostBytes : mostBytes / 2};
}

Type asDecimalType(const Type& type) {
  switch (type.base) {
    case Base::decimal:
      return type;
    case Base::bit:
      return {Base::decimal, 1};
    case Base::tinyint:
      return {Base::decimal, 3};
    case Base::smallint:
      return {Base::decimal, 5};
    case Base::bigint:
      return {Base::decimal, 19};
    default:
      return {Base::decimal, 10};
  }
}

Type commonType(const Type& a, const Type& b) {
  if (a.base == Base::unknown) return b;
  if (b.base == Base::unknown) return a;
  Type result = rankOf(a) >= rankOf(b) ? a : b;
  if (a.isText() && b.isText()) result.size = a.isLong() || b.isLong() ? -1 : std::max(a.size, b.size);
  if (result.base == Base::decimal && a.isExact() && b.isExact()) {
    const Type first = asDecimalType(a);
    const Type second = asDecimalType(b);
    result = decimalType(std::max(first.size - first.scale, second.size - second.scale),
                         std::max(first.scale, second.scale));
  }
  return result;
}

Type arithmeticType(char op, const Type& a, const Type& b) {
  const Type type = commonType(a, b);
  if (type.base == Base::decimal) return decimalResult(op, asDecimalType(a), asDecimalType(b));
  return type.isWhole() && type.base < Base::integer ? Type{Base::integer, -1} : type;
}

}  // namespace QVSa::embedded
