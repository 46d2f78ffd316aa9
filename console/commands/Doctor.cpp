#include "QVSa/hosting/Installation.h"
#include "QVSa/hosting/ServerAccess.h"
#include "QVSa/hosting/ServerInstallation.h"
#include "QVSa/identity/Sessions.h"
#include "QVSa/identity/User.h"
#include "QVSa/identity/safeRule.h"
#include "QVSa/numbering/IdMgr.h"
#include "QVSa/organisation/Department.h"
#include "console/Commands.h"
#include "console/Table.h"

namespace QVSa::console {

namespace {

// What was looked at, one line each. A warning is no failure: the exit code stays 0.
class Findings {
 public:
  void good(const String& point, const String& detail = "") { add(point, "good", detail); }
  void warn(const String& point, const String& detail) { add(point, "warning", detail); }
  void bad(const String& point, const String& detail) {
    add(point, "BAD", detail);
    ++bad_;
  }
  template <class Object>
  void failed(const String& point, const Object& object) {
    bad(point, object.errDescription() + " (" + numberText(object.errNumber()) + ")");
  }

  Answer answer() const {
    const String verdict = bad_ == 0 ? "All is well.\n" : counted(bad_, "point") + " to mend.\n";
    return {table_.text() + "\n" + verdict, {{"healthy", bad_ == 0}, {"points", table_.document()}}, bad_ == 0 ? 0 : 1};
  }

 private:
  void add(const String& point, const char* state, const String& detail) { table_.row({point, state, detail}); }

  Table table_{{{"Point", "point"}, {"State", "state"}, {"", "detail"}}};
  std::size_t bad_ = 0;
};

// A sign-on passes over the lock where the policy can't be read.
void checkPolicy(const Console& console, Findings& findings) {
  const String point = "Policy can be read";
  safeRule rule;
  console.connect(rule);
  if (!rule.GetOne())
    findings.failed(point, rule);
  else if (!rule.lockErr())
    findings.warn(point, "failed sign-ons lock no account");
  else
    findings.good(point);
}

// A sign-on passes over sessions on other computers where the list can't be read. Ending a session that does not exist
// goes through all the tables that an end needs and changes nothing.
void checkSessions(const Console& console, Findings& findings) {
  Sessions sessions;
  console.connect(sessions);
  if (sessions.errNumber() != 0) return findings.failed("Session list can be read", sessions);
  findings.good("Session list can be read", counted(static_cast<std::size_t>(sessions.Count()), "session"));
  const String point = "Ending a session frees its numbers";
  if (sessions.Terminate("doctor: no such session"))
    findings.good(point);
  else
    findings.failed(point, sessions);
}

void checkDepartment(const Console& console, Findings& findings, const String& number) {
  const String point = "Department " + number;
  Department department;
  console.connect(department);
  if (!department.GetOne(Department::byNumber, number)) return findings.failed(point, department);
  const String path = "." + std::to_string(department.InnerId()) + ".";
  if (!department.Super().empty() || department.fullId() != path)
    findings.bad(point, "is no top of a tree with the path " + path);
  else if (number == "_root" && !department.isOrg())
    findings.bad(point, "is no organisation");
  else if (number == "_out" && !department.isOuter())
    findings.bad(point, "is not for outside users");
  else
    findings.good(point, department.Name());
}

// Sessions and log entries of one name in two periods would collide without a date part.
void checkRule(const String& server, const String& database, Findings& findings, const String& name) {
  const String point = "Rule " + name + " of " + database;
  IdMgr rule;
  require(rule.connect(server, database), rule);
  if (!rule.GetOne(name))
    findings.failed(point, rule);
  else if (rule.numPlace() < 1 || rule.DateFormat() == noDate)
    findings.bad(point, "has no date part or no digits");
  else
    findings.good(point, rule.GetSample());
}

void checkAdministrator(const Console& console, Findings& findings) {
  const String point = "Administrator Admin";
  User user;
  console.connect(user);
  if (!user.GetOne(User::byLogin, "Admin"))
    findings.failed(point, user);
  else if (!user.isAdministrator())
    findings.bad(point, "does not hold the role Administrators");
  else if (user.regState() != accountNormal)
    findings.warn(point, "the account is locked");
  else
    findings.good(point);
}

// How this machine reaches the server, and what is weaker than it need be.
void checkAccess(Findings& findings) {
  for (const ServerSetting& setting : serverAccess()) {
    const String point = "Setting " + setting.name;
    const String detail = setting.value + " (" + setting.source + ")";
    const bool isClear = setting.name == "encryption" && setting.value != "required";
    if (isClear)
      findings.warn(point, detail + ": passwords may travel in clear");
    else
      findings.good(point, detail);
  }
}

// Keys and names are compared by the database.
void checkCase(const String& server, const String& database, Findings& findings) {
  const String point = "Texts of " + database + " without regard to case";
  ServerInstallation installation;
  if (installation.ignoresCase(server, database))
    findings.good(point);
  else if (installation.errNumber() == 0)
    findings.bad(point, "its collation heeds case");
  else
    findings.failed(point, installation);
}

Answer doctor(const Console& console) {
  Findings findings;
  const String& server = console.place().server;
  if (!folderOf(server)) {
    checkAccess(findings);
    for (const char* database : {"QVSys", "QVApp"}) checkCase(server, database, findings);
  }
  checkPolicy(console, findings);
  checkSessions(console, findings);
  for (const char* number : {"_root", "_out"}) checkDepartment(console, findings, number);
  checkRule(server, "QVSys", findings, "_ses");
  for (const char* name : {"_log", "_RC"}) checkRule(server, console.place().database, findings, name);
  checkAdministrator(console, findings);
  if (Installation::hasBuiltInSecrets())
    findings.warn("Deployment secrets", "the built-in ones, which everybody knows");
  else
    findings.good("Deployment secrets");
  return findings.answer();
}

}  // namespace

void addDoctor(Console& console) {
  CLI::App* command = console.app().add_subcommand("doctor", "Look whether everything is in its place");
  console.command(command, [&console] { return doctor(console); });
}

}  // namespace QVSa::console
