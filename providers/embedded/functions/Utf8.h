#pragma once

#include <cstdint>
#include <string>
#include <string_view>

#include "QVSa/values/Utf8.h"

namespace QVSa::embedded {

// Length in UTF-16 units; a stray byte counts as one.
std::int64_t unitsOf(std::string_view text);

// The units from `first` (counted from 0) on, at most `count` of them. Half of a pair becomes U+FFFD.
std::string unitsAt(std::string_view text, std::int64_t first, std::int64_t count);

// Without its trailing blanks (U+0020).
std::string_view withoutTrailingBlanks(std::string_view text);

}  // namespace QVSa::embedded
