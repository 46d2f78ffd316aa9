#pragma once

#include "QVSa/values/Values.h"

namespace QVSa::platform {

// A fast digest of a secret under a random key that this process made for itself: it tells whether two secrets are the
// same, says nothing about them outside the process, and is another one in the next.
Bytes fingerprint(const String& secret);

}  // namespace QVSa::platform
