#pragma once

#include "QVSa/values/Values.h"

namespace QVSa {

// Whether `address` matches one pattern of `ipList`, patterns being separated by "|". An empty list permits nothing.
Boolean ipMatches(const String& address, const String& ipList);

// A pattern is a full address, or one whose last part is "*" or a range "low-high", both ends included. Blanks do not
// count. A part that is no number lies in no range.
Boolean ipMatchesOne(const String& address, const String& pattern);

}  // namespace QVSa
