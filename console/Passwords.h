#pragma once

#include "QVSa/values/Values.h"

namespace QVSa::console {

// A password asked for on the terminal without echo or, where the standard input is none, its next line.
// Throws Misuse where the input has ended.
String askPassword(const String& prompt);

// A password to be set. On the terminal it is asked for twice; Misuse where the two differ.
String askNewPassword(const String& prompt);

// The same, empty where the person or the ended input leaves it to the console to make one up.
String askNewPasswordOrNone(const String& prompt);

// A password of at least 16 characters that passes every policy: capital and small letters, digits, other characters.
String makePassword(Integer minLen = 0);

}  // namespace QVSa::console
