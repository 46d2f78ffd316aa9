#include "QVSa/values/Variant.h"

#include <array>
#include <charconv>
#include <cmath>
#include <limits>
#include <optional>
#include <string_view>
#include <utility>

#include "QVSa/values/Failure.h"
#include "QVSa/values/Text.h"

namespace QVSa {

namespace {

bool isDigit(char c) { return c >= '0' && c <= '9'; }

std::size_t skipDigits(std::string_view text, std::size_t at) {
  while (at < text.size() && isDigit(text[at])) ++at;
  return at;
}

// Sign, digits, point, exponent: what a statement may hold raw.
bool readsAsNumber(std::string_view text) {
  std::size_t at = !text.empty() && (text[0] == '+' || text[0] == '-') ? 1 : 0;
  const std::size_t whole = at;
  at = skipDigits(text, at);
  std::size_t digits = at - whole;
  if (at < text.size() && text[at] == '.') {
    const std::size_t fraction = ++at;
    at = skipDigits(text, at);
    digits += at - fraction;
  }
  if (digits == 0) return false;
  if (at < text.size() && (text[at] == 'e' || text[at] == 'E')) {
    ++at;
    if (at < text.size() && (text[at] == '+' || text[at] == '-')) ++at;
    const std::size_t exponent = at;
    at = skipDigits(text, at);
    if (at == exponent) return false;
  }
  return at == text.size();
}

double numberOf(const String& text) {
  std::string_view digits = trimmed(text);
  if (!readsAsNumber(digits)) throw runtimeFailure(number::type);
  if (digits[0] == '+') digits.remove_prefix(1);
  double value = 0;
  const auto result = std::from_chars(digits.data(), digits.data() + digits.size(), value);
  // A number too small to hold is reported like one too large.
  if (result.ec != std::errc()) throw runtimeFailure(number::overflow);
  return value;
}

template <class Whole>
Whole wholeOf(double value) {
  const double rounded = std::nearbyint(value);
  if (!(rounded >= std::numeric_limits<Whole>::min() && rounded <= std::numeric_limits<Whole>::max()))
    throw runtimeFailure(number::overflow);
  return static_cast<Whole>(rounded);
}

// At most 15 digits; plain where these reach neither beyond 15 places before nor behind the point.
String textOf(double value) {
  std::array<char, 32> buffer;
  const auto end =
      std::to_chars(buffer.data(), buffer.data() + buffer.size(), value, std::chars_format::scientific, 14);
  std::string_view form(buffer.data(), static_cast<std::size_t>(end.ptr - buffer.data()));
  if (!std::isfinite(value)) return String(form);

  const String sign = form[0] == '-' && value != 0 ? "-" : "";
  if (form[0] == '-') form.remove_prefix(1);
  const std::size_t mark = form.find('e');
  int exponent = 0;
  const char* const exponentText = form.data() + mark + (form[mark + 1] == '+' ? 2 : 1);
  std::from_chars(exponentText, end.ptr, exponent);
  String digits = String(1, form[0]) + String(form.substr(2, mark - 2));
  digits.erase(std::max<std::size_t>(digits.find_last_not_of('0') + 1, 1));

  const int decimals = static_cast<int>(digits.size()) - 1 - exponent;
  if (exponent > 14 || decimals > 15) {
    const String fraction = digits.size() > 1 ? "." + digits.substr(1) : "";
    const String power = std::to_string(std::abs(exponent));
    return sign + digits[0] + fraction + (exponent < 0 ? "E-" : "E+") + (power.size() < 2 ? "0" : "") + power;
  }
  if (decimals <= 0) return sign + digits + String(static_cast<std::size_t>(-decimals), '0');
  if (exponent < 0) return sign + "0." + String(static_cast<std::size_t>(-exponent - 1), '0') + digits;
  return sign + digits.insert(static_cast<std::size_t>(exponent) + 1, 1, '.');
}

bool sameWord(const String& text, std::string_view lowerWord) {
  if (text.size() != lowerWord.size()) return false;
  for (std::size_t i = 0; i < text.size(); ++i) {
    if ((text[i] | 0x20) != lowerWord[i]) return false;
  }
  return true;
}

}  // namespace

bool Variant::isNumeric() const {
  if (isText()) return readsAsNumber(trimmed(std::get<String>(value_)));
  if (const double* value = std::get_if<double>(&value_)) return std::isfinite(*value);
  return isBoolean() || std::holds_alternative<Integer>(value_) || std::holds_alternative<Long>(value_);
}

double Variant::toDouble() const {
  struct Reader {
    double operator()(std::monostate) const { return 0; }
    double operator()(NullValue) const { throw runtimeFailure(number::nullUse); }
    double operator()(bool value) const { return value ? -1 : 0; }
    double operator()(Integer value) const { return value; }
    double operator()(Long value) const { return value; }
    double operator()(double value) const { return value; }
    double operator()(Date value) const { return value.days(); }
    double operator()(const String& value) const { return numberOf(value); }
    double operator()(const Bytes&) const { throw runtimeFailure(number::type); }
  };
  return std::visit(Reader(), value_);
}

Long Variant::toLong() const {
  if (const Long* value = std::get_if<Long>(&value_)) return *value;
  return wholeOf<Long>(toDouble());
}

Integer Variant::toInteger() const { return wholeOf<Integer>(toDouble()); }

Boolean Variant::toBoolean() const {
  if (isText()) {
    const String& value = std::get<String>(value_);
    if (sameWord(value, "true")) return true;
    if (sameWord(value, "false")) return false;
  }
  return toDouble() != 0;
}

Date Variant::toDate() const {
  if (!isText()) return isDate() ? std::get<Date>(value_) : Date(toDouble());
  const std::optional<Date> date = Date::parse(std::get<String>(value_));
  if (!date) throw runtimeFailure(number::type);
  return *date;
}

String Variant::toText() && { return isText() ? std::get<String>(std::move(value_)) : std::as_const(*this).toText(); }

String Variant::toText() const& {
  struct Writer {
    String operator()(std::monostate) const { return {}; }
    String operator()(NullValue) const { throw runtimeFailure(number::nullUse); }
    String operator()(bool value) const { return value ? "-1" : "0"; }
    String operator()(Integer value) const { return std::to_string(value); }
    String operator()(Long value) const { return std::to_string(value); }
    String operator()(double value) const { return textOf(value); }
    String operator()(Date value) const { return value.text(); }
    String operator()(const String& value) const { return value; }
    String operator()(const Bytes&) const { throw runtimeFailure(number::type); }
  };
  return std::visit(Writer(), value_);
}

Bytes Variant::toBytes() const {
  if (isBytes()) return std::get<Bytes>(value_);
  if (isNull()) throw runtimeFailure(number::nullUse);
  if (!isText()) throw runtimeFailure(number::type);
  const String& value = std::get<String>(value_);
  return Bytes(value.begin(), value.end());
}

}  // namespace QVSa
