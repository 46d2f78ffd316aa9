#include "console/Commands.h"

int main(int argc, char** argv) {
  QVSa::console::Console console;
  QVSa::console::addInit(console);
  QVSa::console::addImport(console);
  QVSa::console::addSignOn(console);
  QVSa::console::addSessions(console);
  QVSa::console::addDepartments(console);
  QVSa::console::addDepartmentLists(console);
  QVSa::console::addUsers(console);
  QVSa::console::addUserLists(console);
  QVSa::console::addRoles(console);
  QVSa::console::addJobs(console);
  QVSa::console::addGroups(console);
  QVSa::console::addNumbers(console);
  QVSa::console::addPolicy(console);
  QVSa::console::addLog(console);
  QVSa::console::addClasses(console);
  QVSa::console::addProtection(console);
  QVSa::console::addSettings(console);
  QVSa::console::addRegistration(console);
  QVSa::console::addDirectory(console);
  QVSa::console::addBackups(console);
  QVSa::console::addPlans(console);
  QVSa::console::addAgent(console);
  QVSa::console::addLogins(console);
  QVSa::console::addSecrets(console);
  QVSa::console::addDoctor(console);
  return console.main(argc, argv);
}
