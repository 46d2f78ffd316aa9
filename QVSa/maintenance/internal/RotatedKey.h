#pragma once

#include "QVSa/values/Values.h"

namespace QVSa {

// The ten characters of the rotated key, read from position `start` (0 to 9; anything else is taken as the nearer of
// the two) to their end and then from their beginning.
String rotatedKey(Integer start);

}  // namespace QVSa
