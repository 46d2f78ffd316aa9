#include "providers/embedded/functions/CaseFolding.h"

#include <algorithm>
#include <cstdint>
#include <iterator>
#include <span>

namespace QVSa::embedded {

namespace {

// The code points first, first + step, ... last are mapped by adding delta.
struct CaseRange {
  char32_t first;
  char32_t last;
  char32_t step;
  std::int32_t delta;
};

#include "providers/embedded/functions/CaseFolding.inc"

char32_t mapped(std::span<const CaseRange> ranges, char32_t point) {
  const auto range =
      std::lower_bound(ranges.begin(), ranges.end(), point, [](const CaseRange& a, char32_t b) { return a.last < b; });
  if (range == ranges.end() || point < range->first || (point - range->first) % range->step != 0) return point;
  return static_cast<char32_t>(static_cast<std::int32_t>(point) + range->delta);
}

}  // namespace

char32_t foldWideCase(char32_t point) { return mapped(foldRanges, point); }

char32_t upperCase(char32_t point) {
  if (point < 0x80) return point >= U'a' && point <= U'z' ? point - 32 : point;
  return mapped(upperRanges, point);
}

char32_t lowerCase(char32_t point) {
  if (point < 0x80) return point >= U'A' && point <= U'Z' ? point + 32 : point;
  return mapped(lowerRanges, point);
}

}  // namespace QVSa::embedded
