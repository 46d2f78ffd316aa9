#include "providers/embedded/functions/NumberText.h"

#include <array>
#include <charconv>
#include <cmath>

#include "QVSa/values/Text.h"

namespace QVSa::embedded {

namespace {

// from_chars takes no plus sign, but a sign behind one would pass.
bool skipPlus(std::string_view& text) {
  if (!text.starts_with('+')) return true;
  text.remove_prefix(1);
  return !text.starts_with('-');
}

template <class... Format>
std::string written(double value, Format... format) {
  std::array<char, 400> buffer;  // 309 digits before the point and 17 that count
  const auto end = std::to_chars(buffer.data(), buffer.data() + buffer.size(), value, format...);
  return std::string(buffer.data(), end.ptr);
}

void widenExponent(std::string& text) {
  const std::size_t exponent = text.find('e');
  if (exponent != std::string::npos && text.size() - exponent - 2 < 3) text.insert(exponent + 2, 1, '0');
}

}  // namespace

std::optional<std::int64_t> readWhole(std::string_view text, bool& overflow) {
  overflow = false;
  text = trimmed(text);
  if (text.empty()) return 0;
  if (!skipPlus(text)) return std::nullopt;
  std::int64_t value = 0;
  const auto result = std::from_chars(text.data(), text.data() + text.size(), value);
  if (result.ptr != text.data() + text.size()) return std::nullopt;
  overflow = result.ec == std::errc::result_out_of_range;
  if (result.ec != std::errc()) return std::nullopt;
  return value;
}

std::optional<double> readReal(std::string_view text) {
  text = trimmed(text);
  if (text.empty()) return 0;
  if (!skipPlus(text) || text.find_first_not_of("0123456789+-.eE") != std::string_view::npos) return std::nullopt;
  double value = 0;
  const auto result = std::from_chars(text.data(), text.data() + text.size(), value);
  if (result.ec != std::errc() || result.ptr != text.data() + text.size()) return std::nullopt;
  return value;
}

std::string decimalText(double value) {
  if (value == 0) return "0";  // not "-0"
  return written(value, std::chars_format::fixed);
}

std::string realText(double value, int style) {
  if (value == 0 && style == 0) return "0";
  std::string text = style == 0   ? written(value, std::chars_format::general, 6)
                     : style == 1 ? written(value, std::chars_format::scientific, 7)
                                  : written(value, std::chars_format::scientific, 15);
  widenExponent(text);
  return text;
}

}  // namespace QVSa::embedded
