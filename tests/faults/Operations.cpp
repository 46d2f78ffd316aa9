#include "tests/faults/Operations.h"

#include "QVSa/QVSa.h"
#include "platform/SecretMessage.h"
#include "providers/embedded/storage/Pool.h"
#include "tests/faults/Ground.h"
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

void newCleo(User& user) {
  user.Name("Cleo");
  user.Login("cleo");
  user.Pwd("right");
  user.setJobs("3,4");
  user.grpName("one");
}

bool signOn(User& user) {
  String id;
  return user.loginAuth("ann", "right", &id, false, "", "pc1") && !id.empty();
}

// Where the policy can't be read, the lock is not seen.
bool isRefused(User& user) {
  user.loginAuth("ann", "wrong");
  return user.errNumber() == messageNumber(1118) || user.errNumber() == messageNumber(1106);
}

std::vector<Operation> userOperations() {
  const Conduct signingOn{{{"select preFix", LoadResString(1503)},
                           {"select maxId", LoadResString(1503)},
                           {"insert into idRec", LoadResString(1503)},
                           {"insert into seslog", LoadResString(1602)}}};
  const auto save = [](User& user) { return user.Save(); };
  const auto waitShortly = [](SignOn& entrance) { entrance.refusalTime(1); };
  return {
      on<User>("User.GetOne", [](auto& user) { return user.GetOne(3, "ann"); }),
      on<User>("User.Save of a new user", atomic(), newCleo, save),
      on<User>("User.Save", atomic(), changeAnn, save),
      on<User>("User.Delete", atomic(told(1109, " ")), loadAnn, [](auto& user) { return user.Delete(); }),
      on<User>("User.loginAuth", signingOn, signOn),
      on<SignOn>("SignOn.signOn", signingOn, waitShortly, [](auto& one) { return one.signOn("ann", "right"); }),
      on<User>("User.loginAuth with a wrong password", isRefused),
      on<User>("User.loginAuth_1", [](auto& user) { return user.loginAuth_1("ann", platform::md5Hex("right")); }),
      on<User>("User.chgPwd", {}, loadAnn, [](auto& user) { return user.chgPwd("right", "other"); }),
  };
}

bool act(Sessions& sessions, const Place& place) {
  Long uid = 0;
  return sessions.newAction("s1", place.server, uid, "", 0);
}

std::vector<Operation> policyAndSessionOperations() {
  const auto lengthen = [](safeRule& rule) { rule.minLen(9); };
  return {
      on<safeRule>("safeRule.GetOne", [](auto& rule) { return rule.GetOne(); }),
      on<safeRule>("safeRule.Save", atomic(), lengthen, [](auto& rule) { return rule.Save(); }),
      on<safeRule>("safeRule.checkPwd", [](auto& rule) { return rule.checkPwd("right"); }),
      on<Sessions>("Sessions.connect", told(1601),
                   [](auto& sessions, const Place& place) { return sessions.connect(place.server, "QVApp"); }),
      on<Sessions>("Sessions.GetAll", told(1601), [](auto& sessions) { return sessions.GetAll().toBoolean(); }),
      on<Sessions>("Sessions.Terminate", told(1603), [](auto& sessions) { return sessions.Terminate("s1"); }),
      on<Sessions>("Sessions.newAction", act),
  };
}

void newDepartment(Department& department) {
  department.Id("N");
  department.Name("New");
  department.Super("E");
}

void moveS(Department& department) {
  require(department.GetOne(1, "S"));
  department.Name("Selling");
  department.Super("O");
}

std::vector<Operation> departmentOperations() {
  const auto save = [](Department& department) { return department.Save(); };
  return {
      on<Department>("Department.GetOne", [](auto& department) { return department.GetOne(1, "E"); }),
      on<Department>("Department.Save of a new department", {}, newDepartment, save),
      on<Department>("Department.Save", atomic(), moveS, save),
      on<Department>("Department.Delete", [](auto& department) { return department.Delete("E"); }),
  };
}

void loadInv(IdMgr& rule) { require(rule.GetOne("inv")); }

void widenInv(IdMgr& rule) {
  loadInv(rule);
  rule.numPlace(5);
}

void narrowUnused(IdMgr& rule) {
  require(rule.GetOne("unused"));
  rule.numPlace(1);
}

bool issueReleased(IdMgr& rule) { return rule.newId("inv", "", -1, "r", "s") == "I001"; }

std::vector<Operation> numberingOperations() {
  const auto save = [](IdMgr& rule) { return rule.Save(); };
  const Conduct issuing = atomic(told(1503)), saving = atomic(told(1505));
  const Conduct renaming = atomic({{{"select * from idRule", ""}, {"", LoadResString(1505)}}});
  return {
      on<IdMgr>("IdMgr.GetOne", [](auto& rule) { return rule.GetOne("inv"); }),
      on<IdMgr>(
          "IdMgr.Save of a new rule", saving, [](auto& rule) { rule.idName("new"); }, save),
      on<IdMgr>("IdMgr.Save that widens", saving, widenInv, save),
      on<IdMgr>("IdMgr.Save that narrows", saving, narrowUnused, save),
      on<IdMgr>("IdMgr.Delete", told(1504), [](auto& rule) { return rule.Delete("inv"); }),
      on<IdMgr>("IdMgr.Rename", renaming, [](auto& rule) { return rule.Rename("inv", "invoice"); }),
      on<IdMgr>("IdMgr.newId", issuing, loadInv, [](auto& rule) { return !rule.newId("inv").empty(); }),
      on<IdMgr>("IdMgr.newId of a first number", issuing, loadInv,
                [](auto& rule) { return !rule.newId("unused").empty(); }),
      on<IdMgr>("IdMgr.newId for a record", issuing, loadInv,
                [](auto& rule) { return !rule.newId("unused", "", -1, "r", "s").empty(); }),
      on<IdMgr>("IdMgr.newId of a released number", told(1503), loadInv, issueReleased),
      on<IdMgr>("IdMgr.setStartNo", issuing, loadInv, [](auto& rule) { return rule.setStartNo(50); }),
      on<IdMgr>("IdMgr.InvalidNumbers", {{{"", "", true}}},
                [](auto& rule) { return rule.InvalidNumbers("inv") != "fail"; }),
      on<IdMgrs>("IdMgrs.GetAll", [](auto& rules) { return rules.GetAll(); }),
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

void fillGround(const TestInstallation& installation) {
  const String server = installation.server();
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
  // Closes the files, which brings all of the content into them.
  embedded::discardIdleHandle(installation.folder());
}

const std::vector<Operation>& operations() {
  static const std::vector<Operation> all = [] {
    std::vector<Operation> result;
    for (const auto part : {userOperations, policyAndSessionOperations, departmentOperations, numberingOperations,
                            logAndClassOperations, settingsOperations, organisationOperations, maintenanceOperations})
      append(result, part());
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
