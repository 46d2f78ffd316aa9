#pragma once

#include "QVSa/identity/User.h"
#include "QVSa/organisation/Department.h"
#include "QVSa/organisation/Role.h"
#include "QVSa/organisation/userGroup.h"
#include "console/Console.h"

namespace QVSa::console {

// The record that a command names, loaded. Throws Refusal with that name where there is none.
User userOf(const Console& console, const String& login);
Department departmentOf(const Console& console, const String& number);
Role roleOf(const Console& console, const String& name);
userGroup groupOf(const Console& console, const String& name);

}  // namespace QVSa::console
