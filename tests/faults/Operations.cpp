#include "tests/faults/Operations.h"

#include "QVSa/QVSa.h"
#include "platform/SecretMessage.h"
#include "tests/faults/LogAndClassOperations.h"
#include "tests/faults/MaintenanceOperations.h"
#include "tests/faults/OrganisationOperations.h"
#include "tests/faults/SettingsOperations.h"
#include "tests/faults/Shapes.h"
#include "tests/support/PlainSession.h"

namespace QVSa::test {

namespace {

void loadAnn(User& user) { require(user.GetOne(3, "ann")); }

void changeAnn(User& user) {
  loadAnn(user);
  user.Name("Anna");
  user.Pwd("new");
  user.setJobs("3,4");
  user.grpName("one");
}

std::vector<Operation> userOperations() {
  const std::vector<Report> signOn{{"select preFix", LoadResString(1503)},
                                   {"select maxId", LoadResString(1503)},
                                   {"insert into idRec", LoadResString(1503)},
                                   {"insert into seslog", LoadResString(1602)}};
  return {
      operation<User>("User.GetOne", nothing<User>, [](User& user, const String&) { return user.GetOne(3, "ann"); }),
      operation<User>(
          "User.Save of a new user",
          [](User& user) {
            user.Name("Cleo");
            user.Login("cleo");
            user.Pwd("right");
            user.setJobs("3,4");
            user.grpName("one");
          },
          [](User& user, const String&) { return user.Save(); }, {}, true),
      operation<User>(
          "User.Save", changeAnn, [](User& user, const String&) { return user.Save(); }, {}, true),
      operation<User>(
          "User.Delete", loadAnn, [](User& user, const String&) { return user.Delete(); }, told(1109, " "), true),
      operation<User>(
          "User.loginAuth", nothing<User>,
          [](User& user, const String&) {
            String id;
            return user.loginAuth("ann", "right", &id, false, "", "pc1") && !id.empty();
          },
          signOn),
      operation<SignOn>(
          "SignOn.signOn", [](SignOn& entrance) { entrance.refusalTime(1); },
          [](SignOn& entrance, const String&) { return entrance.signOn("ann", "right"); }, signOn),
      operation<User>("User.loginAuth with a wrong password", nothing<User>,
                      [](User& user, const String&) {
                        user.loginAuth("ann", "wrong");
                        // Where the policy can't be read, the lock is not seen.
                        return user.errNumber() == messageNumber(1118) || user.errNumber() == messageNumber(1106);
                      }),
      operation<User>("User.loginAuth_1", nothing<User>,
                      [](User& user, const String&) { return user.loginAuth_1("ann", platform::md5Hex("right")); }),
      operation<User>("User.chgPwd", loadAnn, [](User& user, const String&) { return user.chgPwd("right", "other"); }),
  };
}

std::vector<Operation> policyAndSessionOperations() {
  return {
      operation<safeRule>("safeRule.GetOne", nothing<safeRule>,
                          [](safeRule& rule, const String&) { return rule.GetOne(); }),
      operation<safeRule>(
          "safeRule.Save", [](safeRule& rule) { rule.minLen(9); },
          [](safeRule& rule, const String&) { return rule.Save(); }, {}, true),
      operation<safeRule>("safeRule.checkPwd", nothing<safeRule>,
                          [](safeRule& rule, const String&) { return rule.checkPwd("right"); }),
      operation<Sessions>(
          "Sessions.connect", nothing<Sessions>,
          [](Sessions& sessions, const String& server) { return sessions.connect(server, "QVApp"); }, told(1601)),
      operation<Sessions>(
          "Sessions.GetAll", nothing<Sessions>,
          [](Sessions& sessions, const String&) { return sessions.GetAll().toBoolean(); }, told(1601)),
      operation<Sessions>(
          "Sessions.Terminate", nothing<Sessions>,
          [](Sessions& sessions, const String&) { return sessions.Terminate("s1"); }, told(1603)),
      operation<Sessions>("Sessions.newAction", nothing<Sessions>,
                          [](Sessions& sessions, const String& server) {
                            Long uid = 0;
                            return sessions.newAction("s1", server, uid, "", 0);
                          }),
  };
}

std::vector<Operation> departmentOperations() {
  return {
      operation<Department>("Department.GetOne", nothing<Department>,
                            [](Department& department, const String&) { return department.GetOne(1, "E"); }),
      operation<Department>(
          "Department.Save of a new department",
          [](Department& department) {
            department.Id("N");
            department.Name("New");
            department.Super("E");
          },
          [](Department& department, const String&) { return department.Save(); }),
      operation<Department>(
          "Department.Save",
          [](Department& department) {
            require(department.GetOne(1, "S"));
            department.Name("Selling");
            department.Super("O");
          },
          [](Department& department, const String&) { return department.Save(); }, {}, true),
      operation<Department>("Department.Delete", nothing<Department>,
                            [](Department& department, const String&) { return department.Delete("E"); }),
  };
}

Operation issuing(const char* name, std::function<bool(IdMgr&)> run, bool atomic = true) {
  return operation<IdMgr>(
      name, [](IdMgr& rule) { require(rule.GetOne("inv")); }, [run](IdMgr& rule, const String&) { return run(rule); },
      told(1503), atomic);
}

std::vector<Operation> numberingOperations() {
  const auto save = [](IdMgr& rule, const String&) { return rule.Save(); };
  return {
      operation<IdMgr>("IdMgr.GetOne", nothing<IdMgr>, [](IdMgr& rule, const String&) { return rule.GetOne("inv"); }),
      operation<IdMgr>(
          "IdMgr.Save of a new rule", [](IdMgr& rule) { rule.idName("new"); }, save, told(1505), true),
      operation<IdMgr>(
          "IdMgr.Save that widens",
          [](IdMgr& rule) {
            require(rule.GetOne("inv"));
            rule.numPlace(5);
          },
          save, told(1505), true),
      operation<IdMgr>(
          "IdMgr.Save that narrows",
          [](IdMgr& rule) {
            require(rule.GetOne("unused"));
            rule.numPlace(1);
          },
          save, told(1505), true),
      operation<IdMgr>(
          "IdMgr.Delete", nothing<IdMgr>, [](IdMgr& rule, const String&) { return rule.Delete("inv"); }, told(1504)),
      operation<IdMgr>(
          "IdMgr.Rename", nothing<IdMgr>, [](IdMgr& rule, const String&) { return rule.Rename("inv", "invoice"); },
          {{"select * from idRule", ""}, {"", LoadResString(1505)}}, true),
      issuing("IdMgr.newId", [](IdMgr& rule) { return !rule.newId("inv").empty(); }),
      issuing("IdMgr.newId of a first number", [](IdMgr& rule) { return !rule.newId("unused").empty(); }),
      issuing("IdMgr.newId for a record", [](IdMgr& rule) { return !rule.newId("unused", "", -1, "r", "s").empty(); }),
      issuing(
          "IdMgr.newId of a released number", [](IdMgr& rule) { return rule.newId("inv", "", -1, "r", "s") == "I001"; },
          false),
      issuing("IdMgr.setStartNo", [](IdMgr& rule) { return rule.setStartNo(50); }),
      operation<IdMgr>("IdMgr.InvalidNumbers", nothing<IdMgr>,
                       [](IdMgr& rule, const String&) { return rule.InvalidNumbers("inv") != "fail"; },
                       {{"", "", true}}),
      operation<IdMgrs>("IdMgrs.GetAll", nothing<IdMgrs>, [](IdMgrs& rules, const String&) { return rules.GetAll(); }),
  };
}

void addDepartment(const String& server, const String& id, const String& super) {
  Department department;
  department.connect(server, "QVApp");
  department.Id(id);
  department.Name("Department " + id);
  department.Super(super);
  require(department.Save());
}

void addUser(const String& server, const String& login) {
  User user;
  user.connect(server, "QVApp");
  user.Name(login);
  user.Login(login);
  user.Pwd("right");
  user.setJobs("1,2");
  user.grpName("two");
  user.deptId("O");
  require(user.Save());
}

void addRule(const String& server, const String& name) {
  IdMgr rule;
  rule.connect(server, "QVApp");
  rule.idName(name);
  rule.preFix("I");
  rule.numPlace(3);
  rule.reuseStyle(anyone);
  require(rule.Save());
}

}  // namespace

void fillGround(const String& server) {
  const PlainSession tables(server);
  tables.run(
      "insert into saferule(id,minLen,cycle,lockErr,errTimes) values(1,1,3,1,1)"
      " insert into ItemGroups(gName) values('one') insert into ItemGroups(gName) values('two')"
      " insert into seslog(sesId,userLogin,computer,dbname) values('s1','ben','pc','QVApp')");
  addDepartment(server, "S", "_root");
  addDepartment(server, "E", "S");
  addDepartment(server, "O", "_root");
  tables.run("insert into jobs(roleId,deptId) values(1,4)");
  addUser(server, "ann");
  addUser(server, "ben");
  tables.run("update users set accstate=1 where userLogin='ben' insert into agentuser(agentuserid) values(2)");
  addRule(server, "inv");
  addRule(server, "unused");
  IdMgr inv;
  inv.connect(server, "QVApp");
  for (const char* record : {"r1", "r2"}) require(!inv.newId("inv", "", -1, record, "s1").empty());
  tables.run("update idDel set rcId=null where theId='I001'");
  fillLogAndClasses(server);
  fillSettings(server);
  fillOrganisation(server);
  fillMaintenance(server);
}

const std::vector<Operation>& operations() {
  static const std::vector<Operation> all = [] {
    std::vector<Operation> result;
    for (auto part : {userOperations(), policyAndSessionOperations(), departmentOperations(), numberingOperations(),
                      logAndClassOperations(), settingsOperations(), organisationOperations(), maintenanceOperations()})
      result.insert(result.end(), part.begin(), part.end());
    return result;
  }();
  return all;
}

const std::vector<LetPass>& letPass() {
  static const std::vector<LetPass> points = [] {
    std::vector<LetPass> result{
        {"User.loginAuth", "select * from saferule", false, "without the policy neither lock nor expiry is tested"},
        {"User.loginAuth", "select * from sesLog", false, "without the list no session stands elsewhere"},
        {"SignOn.signOn", "select * from saferule", false, "without the policy neither lock nor expiry is tested"},
        {"SignOn.signOn", "select * from sesLog", false, "the list plays no part without a computer's name"},
        {"User.loginAuth with a wrong password", "select * from saferule", false, "the password is wrong all the same"},
        {"safeRule.checkPwd", "select * from saferule", true, "without the policy every text passes"},
        {"Sessions.connect", "select * from sesLog", true, "the names are kept, and the list can be read later"},
        {"User.Reg", "select * from homeinfo", true, "without the settings no mail is queued"},
        {"User.Reg", "select count(*) from reptmps", true, "without the settings no mail is queued"},
        {"User.regAudit", "select * from homeinfo", true, "without the settings no mail is queued"},
        {"User.regAudit", "select count(*) from reptmps", true, "without the settings no mail is queued"},
    };
    for (const std::vector<LetPass>& more : {organisationLetPass(), maintenanceLetPass()})
      result.insert(result.end(), more.begin(), more.end());
    return result;
  }();
  return points;
}

}  // namespace QVSa::test
