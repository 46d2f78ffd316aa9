#include "QVSa/identity/internal/IpRules.h"

#include <algorithm>
#include <charconv>
#include <optional>

#include "QVSa/values/Text.h"

namespace QVSa {
namespace {

std::optional<Long> number(const String& digits) {
  Long value = 0;
  const char* end = digits.data() + digits.size();
  const auto [stop, error] = std::from_chars(digits.data(), end, value);
  if (error != std::errc() || stop != end) return std::nullopt;
  return value;
}

Boolean inRange(const String& part, const String& range) {
  const std::size_t dash = range.find('-');
  if (dash == String::npos) return false;
  const auto low = number(range.substr(0, dash));
  const auto high = number(range.substr(dash + 1));
  const auto value = number(part);
  return low && high && value && *low <= *value && *value <= *high;
}

}  // namespace

Boolean ipMatches(const String& address, const String& ipList) {
  if (ipList.empty()) return false;
  const std::vector<String> patterns = split(ipList, '|');
  return std::any_of(patterns.begin(), patterns.end(),
                     [&](const String& pattern) { return ipMatchesOne(address, pattern); });
}

Boolean ipMatchesOne(const String& address, const String& pattern) {
  const String given = replaceAll(address, " ", "");
  const String rule = replaceAll(pattern, " ", "");
  if (given == rule) return true;

  const std::size_t givenDot = given.rfind('.');
  const std::size_t ruleDot = rule.rfind('.');
  if (givenDot == String::npos || ruleDot == String::npos) return false;
  if (given.substr(0, givenDot) != rule.substr(0, ruleDot)) return false;

  const String last = rule.substr(ruleDot + 1);
  return last == "*" || inRange(given.substr(givenDot + 1), last);
}

}  // namespace QVSa
