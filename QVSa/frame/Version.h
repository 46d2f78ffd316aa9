#pragma once

#include "QVSa/values/Values.h"

namespace QVSa {

// The version of the library, as "1.2.3".
QVSA_EXPORT const char* version() noexcept;

// Compares dotted version texts, part by part as 16-bit numbers: 0 equal, 1 `a` is lower, 2 `a` is higher, -1 where one
// of them has fewer than two parts. A text that runs out of parts first is the lower one.
// Throws Failure 6 or 13 for a part that is no 16-bit number.
QVSA_EXPORT Integer compareVersion(const String& a, const String& b);

}  // namespace QVSa
