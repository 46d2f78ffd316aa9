#pragma once

#include "QVSa/identity/User.h"
#include "console/Console.h"

namespace QVSa::console {

// Saves a loaded user with the password that he has, and keeps his jobs and groups: a plain save takes the jobs that it
// is given, and the name of one group. Throws Refusal; his groups may be lost then, which the text tells.
void saveKept(const Console& console, User& user);

}  // namespace QVSa::console
