#pragma once

#include "QVSa/identity/User.h"
#include "console/Console.h"

namespace QVSa::console {

// What a save of this loaded user would lose for good, as the end of a sentence that begins with his login; empty for
// nothing: a stored password that can't be read here is written back empty.
String lossOfSave(const Console& console, const User& user);

// Saves a loaded user with the password that he has, and keeps his jobs and groups: a plain save takes the jobs that it
// is given, and the name of one group. Throws Refusal; his groups may be lost then, which the text tells.
void saveKept(const Console& console, User& user);

}  // namespace QVSa::console
