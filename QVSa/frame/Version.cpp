#include "QVSa/frame/Version.h"

#include <algorithm>

#include "QVSa/values/Text.h"
#include "QVSa/values/Variant.h"

namespace QVSa {

namespace {

constexpr Integer notComparable = -1;
constexpr Integer equal = 0;
constexpr Integer lower = 1;
constexpr Integer higher = 2;

}  // namespace

const char* version() noexcept { return QVSA_VERSION; }

Integer compareVersion(const String& a, const String& b) {
  const std::vector<String> left = split(a, '.');
  const std::vector<String> right = split(b, '.');
  if (left.size() < 2 || right.size() < 2) return notComparable;
  if (a == b) return equal;
  for (std::size_t i = 0; i < std::min(left.size(), right.size()); ++i) {
    const Integer x = Variant(left[i]).toInteger();
    const Integer y = Variant(right[i]).toInteger();
    if (x != y) return x < y ? lower : higher;
  }
  if (left.size() == right.size()) return equal;
  return left.size() < right.size() ? lower : higher;
}

}  // namespace QVSa
