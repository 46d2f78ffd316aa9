#pragma once

#include "console/Console.h"

namespace QVSa::console {

// Each adds a command, or a group of them, to the program.
void addInit(Console& console);
void addSignOn(Console& console);
void addSessions(Console& console);
void addDepartments(Console& console);
void addUsers(Console& console);
void addRoles(Console& console);
void addJobs(Console& console);
void addGroups(Console& console);
// These two add to the groups of addDepartments and addUsers.
void addDepartmentLists(Console& console);
void addUserLists(Console& console);
void addNumbers(Console& console);
void addPolicy(Console& console);
void addImport(Console& console);
void addLog(Console& console);
void addClasses(Console& console);
void addProtection(Console& console);
void addSettings(Console& console);
void addRegistration(Console& console);
void addDirectory(Console& console);
void addBackups(Console& console);
void addPlans(Console& console);
void addAgent(Console& console);
void addLogins(Console& console);
void addSecrets(Console& console);
void addDoctor(Console& console);

}  // namespace QVSa::console
