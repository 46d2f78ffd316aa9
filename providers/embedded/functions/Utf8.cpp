#include "providers/embedded/functions/Utf8.h"

#include <algorithm>

namespace QVSa::embedded {

namespace {

bool isAscii(std::string_view text) {
  return std::none_of(text.begin(), text.end(), [](char c) { return (c & 0x80) != 0; });
}

}  // namespace

std::int64_t unitsOf(std::string_view text) {
  if (isAscii(text)) return static_cast<std::int64_t>(text.size());
  std::int64_t units = 0;
  const char* const end = text.data() + text.size();
  for (const char* at = text.data(); at < end;) units += unitsOfSymbol(nextSymbol(at, end));
  return units;
}

std::string unitsAt(std::string_view text, std::int64_t first, std::int64_t count) {
  if (first < 0 || count <= 0) return {};
  if (isAscii(text)) {
    if (first >= static_cast<std::int64_t>(text.size())) return {};
    return std::string(text.substr(static_cast<std::size_t>(first), static_cast<std::size_t>(count)));
  }
  std::string result;
  std::int64_t unit = 0;
  const char* const end = text.data() + text.size();
  for (const char* at = text.data(); at < end && unit - first < count;) {
    const char* const begin = at;
    const char32_t symbol = nextSymbol(at, end);
    const int width = unitsOfSymbol(symbol);
    const std::int64_t inside =
        std::min(unit + width, first + std::min(count, INT64_MAX - first)) - std::max(unit, first);
    if (inside == width) result.append(begin, at);
    if (inside > 0 && inside < width) appendSymbol(result, replacementSymbol);
    unit += width;
  }
  return result;
}

std::string_view withoutTrailingBlanks(std::string_view text) { return text.substr(0, text.find_last_not_of(' ') + 1); }

}  // namespace QVSa::embedded
