#pragma once

#include "QVSa/identity/User.h"
#include "console/Console.h"

namespace QVSa::console {

// What a save of this loaded user would lose, as the end of a sentence that begins with his login; empty for nothing.
// A save rewrites the password as it was read, takes the name of one group, and removes the jobs of all but built-in
// users.
String lossOfSave(const Console& console, const User& user);

}  // namespace QVSa::console
