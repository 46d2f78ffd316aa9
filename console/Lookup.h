#pragma once

#include "QVSa/identity/User.h"
#include "QVSa/organisation/Department.h"
#include "QVSa/organisation/Role.h"
#include "QVSa/organisation/userGroup.h"
#include "console/Console.h"

namespace QVSa::console {

// The record that a command names, loaded. Throws Refusal with that name where there is none.
User userWithId(const Console& console, const String& id);
User userOf(const Console& console, const String& login);
Department departmentOf(const Console& console, const String& number);
Role roleOf(const Console& console, const String& name);
userGroup groupOf(const Console& console, const String& name);

// The users in a group, also where two of them have one name, which a list of users can't hold. Throws Refusal.
std::vector<String> memberIds(userGroup& group);

}  // namespace QVSa::console
