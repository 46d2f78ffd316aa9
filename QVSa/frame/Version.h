#pragma once

#include "QVSa/values/Values.h"

namespace QVSa {

// Compares dotted version texts, part by part as 16-bit numbers: 0 equal, 1 `a` is lower, 2 `a` is higher, -1 where one
// of them has fewer than two parts. A text that runs out of parts first is the lower one.
// Throws Failure 6 or 13 for a part that is no 16-bit number.
Integer compareVersion(const String& a, const String& b);

}  // namespace QVSa
