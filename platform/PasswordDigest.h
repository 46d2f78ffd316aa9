#pragma once

#include "QVSa/values/Values.h"

namespace QVSa::platform {

// A salted, slow digest of a log-in's password as one text: "pbkdf2-sha256$iterations$salt$digest".
String makePasswordDigest(const String& password);
// False for a wrong password and for a text that is no digest. Compares in constant time.
bool passwordMatches(const String& password, const String& digest);

// A random password of 20 letters and digits, without those that look alike.
String makePassword();

}  // namespace QVSa::platform
