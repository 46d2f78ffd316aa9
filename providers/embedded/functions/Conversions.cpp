#include "providers/embedded/functions/Conversions.h"

#include <cmath>
#include <limits>

#include "providers/embedded/functions/DateText.h"
#include "providers/embedded/functions/Decimal.h"
#include "providers/embedded/functions/NumberText.h"
#include "providers/embedded/functions/Ticks.h"
#include "providers/embedded/functions/Utf8.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

using tsql::sqlFailure;

struct WholeRange {
  std::int64_t least;
  std::int64_t most;
};

template <class Number>
constexpr WholeRange rangeOf() {
  return {std::numeric_limits<Number>::min(), std::numeric_limits<Number>::max()};
}

WholeRange rangeOf(Base base) {
  switch (base) {
    case Base::tinyint:
      return rangeOf<std::uint8_t>();
    case Base::smallint:
      return rangeOf<std::int16_t>();
    case Base::integer:
      return rangeOf<std::int32_t>();
    default:
      return rangeOf<std::int64_t>();
  }
}

bool isSmall(Base base) { return base == Base::tinyint || base == Base::smallint; }

Failure overflow(const std::string& typeName) {
  return sqlFailure(8115, "Arithmetic overflow error converting expression to data type " + typeName + ".");
}

Failure wholeOverflow(Base base, const std::string& value) {
  if (!isSmall(base)) return overflow(nameOf(base));
  return sqlFailure(
      220, std::string("Arithmetic overflow error for data type ") + nameOf(base) + ", value = " + value + ".");
}

Failure textOverflow(const std::string& text, const Type& from, Base base) {
  if (base == Base::bigint) return overflow(nameOf(base));
  const std::string value =
      std::string("The conversion of the ") + nameOf(from.base) + " value '" + text + "' overflowed an ";
  if (!isSmall(base)) return sqlFailure(248, value + "int column.");
  return sqlFailure(244, value + (base == Base::tinyint ? "INT1" : "INT2") + " column. Use a larger integer column.");
}

// The value as a decimal, if that is what it is.
std::optional<Decimal> asDecimal(const Value& value, const Type& from) {
  const auto* const bytes = std::get_if<Bytes>(&value);
  if (from.base != Base::decimal || bytes == nullptr || bytes->size() != decimalBytes) return std::nullopt;
  return decimalFrom(bytes->data());
}

Failure notAllowed(const Type& from, const Type& to) {
  return sqlFailure(529, std::string("Explicit conversion from data type ") + nameOf(from.base) + " to " +
                             nameOf(to.base) + " is not allowed.");
}

// ---- to a whole number

bool fits(std::int64_t value, Base base) {
  const WholeRange range = rangeOf(base);
  return value >= range.least && value <= range.most;
}

Value wholeOf(std::int64_t value, Base base) {
  if (base == Base::bit) return std::int64_t{value != 0};
  if (!fits(value, base)) throw wholeOverflow(base, std::to_string(value));
  return value;
}

Value wholeOf(double value, Base base) {
  if (base == Base::bit) return std::int64_t{value != 0};
  const double cut = std::trunc(value);
  if (!(cut >= -0x1p63 && cut < 0x1p63)) throw wholeOverflow(base, decimalText(value));
  return wholeOf(static_cast<std::int64_t>(cut), base);
}

std::optional<std::int64_t> bitWord(const std::string& text) {
  std::string word;
  for (const char c : text)
    if (c != ' ') word += static_cast<char>(c | 0x20);
  if (word == "true") return 1;
  if (word == "false") return 0;
  return std::nullopt;
}

Value wholeOf(const std::string& text, const Type& from, Base base) {
  if (base == Base::bit) {
    if (const auto word = bitWord(text)) return *word;
  }
  bool tooLarge = false;
  const auto value = readWhole(text, tooLarge);
  if (tooLarge && base == Base::bit) return std::int64_t{1};
  if (tooLarge) throw textOverflow(text, from, base);
  if (!value)
    throw sqlFailure(245, std::string("Conversion failed when converting the ") + nameOf(from.base) + " value '" +
                              text + "' to data type " + nameOf(base) + ".");
  if (base != Base::bit && !fits(*value, base)) throw textOverflow(text, from, base);
  return wholeOf(*value, base);
}

Value toWhole(const Value& value, const Type& from, Base base) {
  if (const auto* text = std::get_if<std::string>(&value)) return wholeOf(*text, from, base);
  if (const auto* real = std::get_if<double>(&value)) return wholeOf(*real, base);
  if (const auto* whole = std::get_if<std::int64_t>(&value))
    return wholeOf(from.isDate() ? floorDivide(*whole + ticksPerDay / 2, ticksPerDay) : *whole, base);
  if (const auto decimal = asDecimal(value, from)) {
    if (base == Base::bit) return std::int64_t{*decimal != 0};
    const Decimal cut = floorOf(*decimal < 0 ? -*decimal : *decimal, from.scale);
    if (cut > std::numeric_limits<std::int64_t>::max()) throw wholeOverflow(base, decimalText(*decimal, from.scale));
    return wholeOf(static_cast<std::int64_t>(*decimal < 0 ? -cut : cut), base);
  }
  throw notAllowed(from, {base, -1});
}

// ---- to a number with a fraction

Value toReal(const Value& value, const Type& from, Base base) {
  if (const auto* real = std::get_if<double>(&value)) return *real;
  if (const auto* whole = std::get_if<std::int64_t>(&value))
    return static_cast<double>(*whole) / (from.isDate() ? static_cast<double>(ticksPerDay) : 1.0);
  if (const auto decimal = asDecimal(value, from)) return doubleOf(*decimal, from.scale);
  const auto* text = std::get_if<std::string>(&value);
  if (text == nullptr) throw notAllowed(from, {base, -1});
  const auto read = readReal(*text);
  if (!read)
    throw sqlFailure(8114,
                     std::string("Error converting data type ") + nameOf(from.base) + " to " + nameOf(base) + ".");
  return *read;
}

// ---- to a decimal

Decimal decimalOf(const Value& value, const Type& from, const Type& to) {
  if (const auto* real = std::get_if<double>(&value)) return decimalFrom(*real, to.scale);
  if (const auto* whole = std::get_if<std::int64_t>(&value))
    return from.isDate() ? divided(*whole, ticksPerDay, to.scale) : rescaled(*whole, 0, to.scale);
  if (const auto decimal = asDecimal(value, from)) return rescaled(*decimal, from.scale, to.scale);
  const auto* text = std::get_if<std::string>(&value);
  if (text == nullptr) throw notAllowed(from, to);
  const auto read = readDecimal(*text, to.scale);
  if (!read) throw sqlFailure(8114, std::string("Error converting data type ") + nameOf(from.base) + " to numeric.");
  return *read;
}

// ---- to a date

Failure malformedDate(Base base) {
  if (base == Base::smalldatetime)
    return sqlFailure(295, "Conversion failed when converting character string to smalldatetime data type.");
  return sqlFailure(241, "Conversion failed when converting date and/or time from character string.");
}

Failure dateOutOfRange(const Type& from, Base base) {
  const std::string what = std::string("The conversion of a ") + nameOf(from.base) + " data type to a " + nameOf(base) +
                           " data type resulted in an out-of-range value.";
  return sqlFailure(base == Base::smalldatetime ? 296 : 242, what);
}

std::int64_t dateTicks(const Value& value, const Type& from, Base base, int style) {
  if (const auto* whole = std::get_if<std::int64_t>(&value)) {
    if (from.isDate()) return *whole;
    if (*whole < -100'000 || *whole > 3'000'000) throw overflow(nameOf(base));
    return *whole * ticksPerDay;
  }
  if (const auto* real = std::get_if<double>(&value)) {
    if (!(*real > -100'000 && *real < 3'000'000)) throw overflow(nameOf(base));
    return std::llround(*real * static_cast<double>(ticksPerDay));
  }
  if (const auto decimal = asDecimal(value, from))
    return dateTicks(doubleOf(*decimal, from.scale), {Base::real, -1}, base, style);
  const auto* text = std::get_if<std::string>(&value);
  if (text == nullptr) throw notAllowed(from, {base, -1});
  std::int64_t ticks = 0;
  const DateTextResult result = readDate(*text, style, ticks);
  if (result == DateTextResult::malformed) throw malformedDate(base);
  if (result == DateTextResult::outOfRange) throw dateOutOfRange(from, base);
  return ticks;
}

Value toDate(const Value& value, const Type& from, Base base, int style) {
  std::int64_t ticks = dateTicks(value, from, base, style);
  // Up to 29.998 s belong to the minute before: the last tick below is 29.997 s.
  if (base == Base::smalldatetime) ticks = floorDivide(ticks + ticksPerMinute / 2, ticksPerMinute) * ticksPerMinute;
  if (base == Base::smalldatetime ? isSmalldatetime(ticks) : isDatetime(ticks)) return ticks;
  throw from.isText() || from.isDate() ? dateOutOfRange(from, base) : overflow(nameOf(base));
}

// ---- to text

std::string textOf(const Value& value, const Type& from, const Type& to, int style) {
  if (const auto* text = std::get_if<std::string>(&value)) return *text;
  if (const auto* real = std::get_if<double>(&value)) return realText(*real, style);
  if (const auto decimal = asDecimal(value, from)) return decimalText(*decimal, from.scale);
  const auto* whole = std::get_if<std::int64_t>(&value);
  if (whole == nullptr) throw notAllowed(from, to);
  if (!from.isDate()) return std::to_string(*whole);
  auto text = writeDate(*whole, style);
  if (!text)
    throw sqlFailure(281, std::to_string(style) + " is not a valid style number when converting from " +
                              nameOf(from.base) + " to a character string.");
  return std::move(*text);
}

// What becomes of a text that is longer than its type.
std::string cutText(const std::string& text, const Type& from, const Type& to, Purpose purpose) {
  if (from.isNumber()) {
    if (purpose == Purpose::cast && to.base == Base::varchar && from.base <= Base::integer) return "*";
    throw overflow(nameOf(to.base));
  }
  // Blanks that do not fit are no loss.
  if (purpose == Purpose::store && unitsOf(withoutTrailingBlanks(text)) > to.size)
    throw sqlFailure(8152, "String or binary data would be truncated.");
  return unitsAt(text, 0, to.size);
}

Value toText(const Value& value, const Type& from, const Type& to, Purpose purpose, int style) {
  std::string text = textOf(value, from, to, style);
  if (purpose == Purpose::compute || to.size < 0 || unitsOf(text) <= to.size) return text;
  return cutText(text, from, to, purpose);
}

// ---- to bytes

Value toBytes(const Value& value, const Type& from, const Type& to, Purpose purpose) {
  Bytes bytes;
  if (const auto* held = std::get_if<Bytes>(&value); held && from.base != Base::decimal)
    bytes = *held;
  else if (const auto* text = std::get_if<std::string>(&value))
    bytes.assign(text->begin(), text->end());
  else
    throw notAllowed(from, to);
  const bool tooLong = purpose != Purpose::compute && to.size >= 0 && std::ssize(bytes) > to.size;
  if (tooLong && purpose == Purpose::store) throw sqlFailure(8152, "String or binary data would be truncated.");
  if (tooLong) bytes.resize(static_cast<std::size_t>(to.size));
  return bytes;
}

// A value without a known type has the type that its form says.
Type impliedType(const Value& value) {
  if (std::holds_alternative<std::int64_t>(value)) return {Base::bigint, -1};
  if (std::holds_alternative<double>(value)) return {Base::real, -1};
  if (std::holds_alternative<std::string>(value)) return {Base::nvarchar, -1};
  return {Base::image, -1};
}

Variant numberVariant(double value, Base base) {
  const bool whole = value == std::trunc(value);
  if (base == Base::bit) return Variant(value != 0);
  if (isSmall(base) && whole && value >= -0x1p15 && value < 0x1p15) return Variant(static_cast<Integer>(value));
  if (base != Base::real && whole && value >= -0x1p31 && value < 0x1p31) return Variant(static_cast<Long>(value));
  return Variant(value);
}

}  // namespace

const char* nameOf(Base base) {
  static constexpr const char* names[] = {"sql_variant", "bit",      "tinyint", "smallint",      "int",
                                          "bigint",      "numeric",  "float",   "smalldatetime", "datetime",
                                          "varchar",     "nvarchar", "ntext",   "image"};
  return names[static_cast<std::size_t>(base)];
}

Value convert(const Value& value, const Type& from, const Type& to, Purpose purpose, int style) {
  if (std::holds_alternative<std::monostate>(value) || to.base == Base::unknown) return value;
  if (from.base == Base::unknown) return convert(value, impliedType(value), to, purpose, style);
  if (to.isWhole()) return toWhole(value, from, to.base);
  if (to.base == Base::decimal) return storedDecimal(requireDigits(decimalOf(value, from, to), to.size));
  if (to.isNumber()) return toReal(value, from, to.base);
  if (to.isDate()) return toDate(value, from, to.base, style);
  if (to.isText()) return toText(value, from, to, purpose, style);
  return toBytes(value, from, to, purpose);
}

std::int64_t ticksOf(Date date) {
  // The fraction of a date before its day 0 counts forward from the whole part.
  const double day = std::trunc(date.days());
  const double time = std::abs(date.days() - day);
  return (static_cast<std::int64_t>(day) - 2) * ticksPerDay + std::llround(time * static_cast<double>(ticksPerDay));
}

Date dateOf(std::int64_t ticks) {
  const std::int64_t day = floorDivide(ticks, ticksPerDay);
  const double time = static_cast<double>(ticks - day * ticksPerDay) / static_cast<double>(ticksPerDay);
  const double whole = static_cast<double>(day + 2);
  return Date(whole < 0 ? whole - time : whole + time);
}

Variant variantOf(Value value, const Type& type) {
  if (auto* text = std::get_if<std::string>(&value)) return Variant(std::move(*text));
  if (const auto decimal = asDecimal(value, type)) return numberVariant(doubleOf(*decimal, type.scale), type.base);
  if (auto* bytes = std::get_if<Bytes>(&value)) return Variant(std::move(*bytes));
  if (const auto* real = std::get_if<double>(&value)) return numberVariant(*real, type.base);
  const auto* whole = std::get_if<std::int64_t>(&value);
  if (whole == nullptr) return Variant::null();
  if (type.isDate()) return Variant(dateOf(*whole));
  if (type.isText()) return Variant(std::to_string(*whole));
  return numberVariant(static_cast<double>(*whole), type.base);
}

Value valueOf(const Variant& variant, const Type& type) {
  if (variant.isNull() || variant.isEmpty()) return {};
  if (variant.isText()) return convert(variant.toText(), {Base::nvarchar, -1}, type, Purpose::store);
  if (variant.isBytes()) return convert(variant.toBytes(), {Base::image, -1}, type, Purpose::store);
  if (variant.isDate()) return convert(ticksOf(variant.toDate()), {Base::datetime, -1}, type, Purpose::store);
  const double value = variant.toDouble();
  if (value == std::trunc(value) && std::abs(value) < 0x1p53)
    return convert(static_cast<std::int64_t>(value), {Base::bigint, -1}, type, Purpose::store);
  return convert(value, {Base::real, -1}, type, Purpose::store);
}

}  // namespace QVSa::embedded
