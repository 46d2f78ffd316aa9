#include "providers/embedded/functions/Decimal.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>

#include "QVSa/values/Text.h"
#include "providers/embedded/functions/NumberText.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

__extension__ typedef unsigned __int128 Unsigned;

constexpr auto powers = [] {
  std::array<Decimal, mostDecimalDigits + 1> result{};
  result[0] = 1;
  for (std::size_t i = 1; i < result.size(); ++i) result[i] = result[i - 1] * 10;
  return result;
}();

Decimal power(int digits) { return powers.at(static_cast<std::size_t>(digits)); }

Unsigned magnitude(Decimal value) { return static_cast<Unsigned>(value < 0 ? -value : value); }

Decimal withSign(Unsigned value, bool negative) {
  if (value >= magnitude(power(mostDecimalDigits))) throw decimalOverflow();
  return negative ? -static_cast<Decimal>(value) : static_cast<Decimal>(value);
}

// One more digit behind those of a value that is not negative.
Decimal appended(Decimal value, int digit) {
  if (value >= power(mostDecimalDigits - 1)) throw decimalOverflow();
  return value * 10 + digit;
}

// A product of two magnitudes, in limbs of 64 bits, the lowest first.
class Product {
 public:
  Product(Unsigned a, Unsigned b) {
    const std::array<Unsigned, 2> left = {static_cast<std::uint64_t>(a), a >> 64};
    const std::array<Unsigned, 2> right = {static_cast<std::uint64_t>(b), b >> 64};
    for (std::size_t i = 0; i < 2; ++i) {
      Unsigned carry = 0;
      for (std::size_t j = 0; j < 2; ++j) {
        carry += left[i] * right[j] + limbs_[i + j];
        limbs_[i + j] = static_cast<std::uint64_t>(carry);
        carry >>= 64;
      }
      limbs_[i + 2] = static_cast<std::uint64_t>(carry);
    }
  }

  // Divides and gives the last digit that went.
  unsigned dropDigit() {
    Unsigned rest = 0;
    for (std::size_t i = limbs_.size(); i-- > 0;) {
      rest = rest << 64 | limbs_[i];
      limbs_[i] = static_cast<std::uint64_t>(rest / 10);
      rest %= 10;
    }
    return static_cast<unsigned>(rest);
  }

  Unsigned value() const {
    if (limbs_[2] != 0 || limbs_[3] != 0) throw decimalOverflow();
    return Unsigned{limbs_[1]} << 64 | limbs_[0];
  }

 private:
  std::array<std::uint64_t, 4> limbs_{};
};

}  // namespace

Failure decimalOverflow() {
  return tsql::sqlFailure(8115, "Arithmetic overflow error converting numeric to data type numeric.");
}

Bytes storedDecimal(Decimal value) {
  Bytes bytes(decimalBytes);
  auto bits = static_cast<Unsigned>(value);
  for (std::size_t i = bytes.size(); i-- > 0; bits >>= 8) bytes[i] = static_cast<std::uint8_t>(bits);
  bytes[0] ^= 0x80;
  return bytes;
}

Decimal decimalFrom(const void* stored) {
  const auto* const first = static_cast<const std::uint8_t*>(stored);
  Unsigned bits = first[0] ^ 0x80U;
  for (std::size_t i = 1; i < decimalBytes; ++i) bits = bits << 8 | first[i];
  return static_cast<Decimal>(bits);
}

Decimal requireDigits(Decimal value, int precision) {
  if (magnitude(value) >= magnitude(power(precision))) throw decimalOverflow();
  return value;
}

Decimal rescaled(Decimal value, int from, int to) {
  return to >= from ? multiplied(value, power(to - from), 0) : multiplied(value, 1, from - to);
}

Decimal multiplied(Decimal a, Decimal b, int drop) {
  Product product(magnitude(a), magnitude(b));
  unsigned last = 0;
  for (int i = 0; i < drop; ++i) last = product.dropDigit();
  return withSign(product.value() + (last >= 5 ? 1 : 0), (a < 0) != (b < 0));
}

// Digit by digit, as on paper. A remainder times 10 may need more than 128 bits, and so is added up.
Decimal divided(Decimal a, Decimal b, int raise) {
  const Unsigned divisor = magnitude(b);
  Unsigned rest = magnitude(a) % divisor;
  auto result = static_cast<Decimal>(magnitude(a) / divisor);
  for (int i = 0; i < raise; ++i) {
    Unsigned sum = 0;
    int digit = 0;
    for (int times = 0; times < 10; ++times) {
      sum += rest;
      if (sum < divisor) continue;
      sum -= divisor;
      ++digit;
    }
    rest = sum;
    result = appended(result, digit);
  }
  return (a < 0) != (b < 0) ? -result : result;
}

Decimal roundedTo(Decimal value, int scale, std::int64_t digits, bool cut) {
  if (digits >= scale) return value;
  const std::int64_t lost = scale - digits;
  if (lost > mostDecimalDigits) return 0;
  const Decimal unit = power(static_cast<int>(lost));
  const Decimal whole = cut ? value / unit : multiplied(value, 1, static_cast<int>(lost));
  return multiplied(whole, unit, 0);
}

Decimal floorOf(Decimal value, int scale) {
  const Decimal unit = power(scale);
  return value / unit - (value % unit < 0 ? 1 : 0);
}

Decimal ceilingOf(Decimal value, int scale) { return -floorOf(-value, scale); }

std::string decimalText(Decimal value, int scale) {
  std::string digits;
  for (Unsigned rest = magnitude(value); rest != 0; rest /= 10) digits += static_cast<char>('0' + rest % 10);
  const auto least = static_cast<std::size_t>(scale) + 1;
  if (digits.size() < least) digits.resize(least, '0');
  if (scale > 0) digits.insert(static_cast<std::size_t>(scale), 1, '.');
  if (value < 0) digits += '-';
  std::reverse(digits.begin(), digits.end());
  return digits;
}

double doubleOf(Decimal value, int scale) {
  const std::string text = decimalText(value, scale);
  double result = 0;
  std::from_chars(text.data(), text.data() + text.size(), result);
  return result;
}

// A double tells 17 digits of a number apart; those behind them are no part of it.
Decimal decimalFrom(double value, int scale) {
  constexpr int digitsBehindFirst = 16;
  if (!std::isfinite(value) || std::abs(value) >= 1e38) throw decimalOverflow();
  std::array<char, 32> buffer;
  const auto end = std::to_chars(buffer.data(), buffer.data() + buffer.size(), value, std::chars_format::scientific,
                                 digitsBehindFirst);
  const std::string_view text(buffer.data(), end.ptr);
  const std::size_t mark = text.find('e');
  int exponent = 0;
  const std::size_t digits = mark + (text[mark + 1] == '+' ? 2 : 1);
  std::from_chars(text.data() + digits, text.data() + text.size(), exponent);
  const Decimal whole = readDecimal(text.substr(0, mark), digitsBehindFirst).value_or(0);
  const int held = digitsBehindFirst - exponent;  // the scale under which `whole` is the value
  if (held - scale > mostDecimalDigits) return 0;
  return held <= scale ? multiplied(whole, power(std::min(scale - held, mostDecimalDigits)), 0)
                       : multiplied(whole, 1, held - scale);
}

std::optional<Decimal> readDecimal(std::string_view text, int scale) {
  text = trimmed(text);
  const bool negative = text.starts_with('-');
  if (negative || text.starts_with('+')) text.remove_prefix(1);
  const std::size_t point = std::min(text.find('.'), text.size());
  const std::string_view whole = text.substr(0, point);
  const std::string_view fraction = text.substr(std::min(point + 1, text.size()));
  const auto isDigits = [](std::string_view part) {
    return part.find_first_not_of("0123456789") == std::string_view::npos;
  };
  if (whole.size() + fraction.size() == 0 || !isDigits(whole) || !isDigits(fraction)) return std::nullopt;
  Decimal value = 0;
  for (const char digit : whole) value = appended(value, digit - '0');
  const auto kept = static_cast<std::size_t>(scale);
  for (std::size_t i = 0; i < kept; ++i) value = appended(value, i < fraction.size() ? fraction[i] - '0' : 0);
  if (kept < fraction.size() && fraction[kept] >= '5') value = withSign(magnitude(value) + 1, false);
  return negative ? -value : value;
}

}  // namespace QVSa::embedded
