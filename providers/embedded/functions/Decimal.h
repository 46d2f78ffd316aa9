#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "QVSa/values/Failure.h"
#include "QVSa/values/Variant.h"

// Exact numbers of up to 38 digits, as decimal(p,s) holds them: a whole number, and the scale that the type says.
// Everything here is exact or says that it rounds; what needs more digits throws 8115.
namespace QVSa::embedded {

__extension__ typedef __int128 Decimal;

inline constexpr int mostDecimalDigits = 38;

// As it lies in a file and goes through SQLite: 16 bytes that compare as the numbers do.
Bytes storedDecimal(Decimal value);
inline constexpr std::size_t decimalBytes = 16;
Decimal decimalFrom(const void* stored);

// Throws 8115 for a value of more digits than the precision allows.
Decimal requireDigits(Decimal value, int precision);

// From one scale to another; rounds halves away from zero where digits are lost.
Decimal rescaled(Decimal value, int from, int to);
// The product without its last `drop` digits, rounded.
Decimal multiplied(Decimal a, Decimal b, int drop);
// a times 10^raise, divided by b and cut. `b` is not 0.
Decimal divided(Decimal a, Decimal b, int raise);
// `digits` behind the point stay (before it, where negative), the others become 0: rounded, or cut.
Decimal roundedTo(Decimal value, int scale, std::int64_t digits, bool cut);
Decimal floorOf(Decimal value, int scale);
Decimal ceilingOf(Decimal value, int scale);

std::string decimalText(Decimal value, int scale);
double doubleOf(Decimal value, int scale);
Decimal decimalFrom(double value, int scale);
// A sign, digits, a point, blanks around; rounded to the scale. Nothing where it is no such number.
std::optional<Decimal> readDecimal(std::string_view text, int scale);

Failure decimalOverflow();

}  // namespace QVSa::embedded
