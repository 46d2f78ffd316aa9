#include "QVSa/QVSa.h"
#include "tests/faults/Shapes.h"
#include "tests/support/PlainSession.h"

namespace QVSa::test {

namespace {

// Of the ground: departments 3 to 5 (S, E below it, O), users 2 and 3, the role Clerk with jobs 6 and 7 in E and O.
constexpr Long roleClerk = 7;
constexpr Long jobInE = 6;

void loadClerk(Role& role) { require(role.GetOne(1, roleClerk)); }
void renameClerk(Role& role) {
  loadClerk(role);
  role.Name("Scribe");
}
void loadBoth(userGroup& group) { require(group.GetOne(2, "both")); }
void renameBoth(userGroup& group) {
  loadBoth(group);
  group.Name("all");
}
void loadE(Department& department) { require(department.GetOne(1, "E")); }
void loadAnn(User& user) { require(user.GetOne(3, "ann")); }

std::vector<Operation> departmentLists() {
  const Conduct listing = told(1117, " ");
  return {
      on<Departments>("Departments.GetAll", [](auto& list) { return list.GetAll(); }),
      on<Departments>("Departments.GetAll of a subtree", [](auto& list) { return list.GetAll(-1, "3"); }),
      on<Departments>("Departments.GetAllWithLevel", [](auto& list) { return list.GetAllWithLevel(); }),
      on<Departments>("Departments.getAllSuper", listing, [](auto& list) { return list.getAllSuper("6"); }),
      on<Departments>("Departments.getAllSuperWithLevel", listing,
                      [](auto& list) { return list.getAllSuperWithLevel("6,7", 1, "_root", 1); }),
      on<Department>("Department.GetAllSub", {}, loadE, [](auto& e) { return e.GetAllSub() != nullptr; }),
      on<Department>("Department.GetSub", {}, loadE, [](auto& e) { return e.GetSub() != nullptr; }),
      on<Department>("Department.GetUsers", listing, loadE, [](auto& e) { return e.GetUsers() != nullptr; }),
  };
}

bool tellHolders(Role& role) {
  String xml;
  return role.GetUsers2(xml) && !xml.empty();
}

std::vector<Operation> roleOperations() {
  Conduct setting = atomic(told(1208));
  setting.reports[0].number = messageNumber(1208);
  const auto save = [](Role& role) { return role.Save(); };
  const Conduct listing = told(1117, " ");
  return {
      on<Role>("Role.GetOne", [](auto& role) { return role.GetOne(2, "Clerk"); }),
      on<Role>(
          "Role.Save of a new role", atomic(), [](auto& role) { role.Name("New"); }, save),
      on<Role>("Role.Save", atomic(told(1204, " ")), renameClerk, save),
      on<Role>("Role.Delete", atomic(told(1205, " ")), loadClerk, [](auto& role) { return role.Delete(); }),
      on<Role>("Role.GetUsers", listing, loadClerk, [](auto& role) { return role.GetUsers() != nullptr; }),
      on<Role>("Role.GetUsersOfRole", listing, loadClerk,
               [](auto& role) { return role.GetUsersOfRole("3", "Clerk") != nullptr; }),
      on<Role>("Role.setJobs", setting, loadClerk, [](auto& role) { return role.setJobs("3", "4"); }),
      on<Role>("Role.getAcl", {}, loadClerk, [](auto& role) { return !role.getAcl().empty(); }),
      on<Role>("Role.GetJobIdOfTheDept", {}, loadClerk,
               [](auto& role) { return role.GetJobIdOfTheDept("4") == jobInE; }),
      on<Role>("Role.GetUsers2", {}, loadClerk, tellHolders),
      on<Role>("Role.UpdateUsers", {}, loadClerk, [](auto& role) { return role.UpdateUsers("3,6|3,7", "2,6"); }),
      on<Roles>("Roles.GetAll", told(1207, " "), [](auto& roles) { return roles.GetAll(); }),
  };
}

std::vector<Operation> jobAndUserLists() {
  const Conduct ofJobs = told(3101, " "), ofUsers = told(1117, " ");
  return {
      on<Jobs>("Jobs.GetAll", ofJobs, [](auto& jobs) { return jobs.GetAll("E", "Clerk", 2); }),
      on<Jobs>("Jobs.GetAllOfDept", ofJobs, [](auto& jobs) { return jobs.GetAllOfDept(3); }),
      on<Jobs>("Jobs.GetAllSameRole", ofJobs, [](auto& jobs) { return jobs.GetAllSameRole(2); }),
      on<Users>("Users.GetAll", ofUsers, [](auto& users) { return users.GetAll(); }),
      on<Users>("Users.GetAllReg", [](auto& users) { return users.GetAllReg(); }),
      on<Users>("Users.GetAllOfTheDept", ofUsers, [](auto& users) { return users.GetAllOfTheDept(3); }),
      on<Users>("Users.GetAllOfTheDeptAndRole", ofUsers,
                [](auto& users) { return users.GetAllOfTheDeptAndRole(3, "Clerk"); }),
      on<Users>("Users.getAllForSelUser", ofUsers, [](auto& users) { return users.getAllForSelUser("6", 2, 1); }),
      on<Users>("Users.GetList", ofUsers, [](auto& users) { return users.GetList(0) > 0; }),
  };
}

bool tellRoles(userGroup& group) {
  String roles;
  return group.GetRoles(roles) && !roles.empty();
}

bool tellManager(User& user) {
  Integer flag = 0;
  Long job = 0, person = 0;
  return user.getManager(flag, job, person) && person == 3;
}

std::vector<Operation> groupAndSupervisorOperations() {
  const auto save = [](userGroup& group) { return group.Save(); };
  const Conduct renaming = atomic({{{"update ItemGroups", LoadResString(1803) + " "}}});
  return {
      on<userGroup>("userGroup.GetOne", [](auto& group) { return group.GetOne(2, "both"); }),
      on<userGroup>("userGroup.GetUsers", {}, loadBoth, [](auto& group) { return !group.GetUsers().empty(); }),
      on<userGroup>("userGroup.SetUsers", atomic(told(1808, " ")), loadBoth,
                    [](auto& group) { return group.SetUsers("3"); }),
      on<userGroup>("userGroup.GetRoles", told(1807, " "), loadBoth, tellRoles),
      on<userGroup>("userGroup.SetRoles", atomic(told(1806, " ")), loadBoth,
                    [](auto& group) { return group.SetRoles("Report Owners"); }),
      on<userGroup>(
          "userGroup.Save of a new group", atomic(), [](auto& group) { group.Name("new"); }, save),
      on<userGroup>("userGroup.Save", renaming, renameBoth, save),
      on<userGroup>("userGroup.Delete", atomic(told(1804, " ")), loadBoth, [](auto& group) { return group.Delete(); }),
      on<userGroups>("userGroups.GetAll", told(1809, " "), [](auto& groups) { return groups.GetAll(); }),
      on<User>("User.setManager", atomic(told(1114)), loadAnn, [](auto& user) { return user.setManager(1, jobInE); }),
      on<User>("User.getManager", told(1115), loadAnn, tellManager),
      on<User>("User.getSubUsers", told(1116), loadAnn, [](auto& user) { return user.getSubUsers() != nullptr; }),
  };
}

}  // namespace

std::vector<Operation> organisationOperations() {
  std::vector<Operation> result = departmentLists();
  for (const auto part : {roleOperations, jobAndUserLists, groupAndSupervisorOperations}) append(result, part());
  return result;
}

std::vector<LetPass> organisationLetPass() {
  const char* const goesOn = "a role goes even where what hangs on its jobs stays";
  std::vector<LetPass> result{
      {"userGroups.GetAll", "select gId,gName,gDesc", false, "a group that can't be read stands in the list"}};
  for (const char* statement : {"select jobId", "delete from fldAcl", "delete from cftJob", "delete from userJob",
                                "delete from repAcl", "delete from userMgr", "delete from jobs where jobId"})
    result.push_back({"Role.Delete", statement, false, goesOn, true});
  return result;
}

void fillOrganisation(const String& server) {
  Role clerk;
  clerk.connect(server, "QVApp");
  clerk.Name("Clerk");
  require(clerk.Save() && clerk.Id() == roleClerk && clerk.setJobs("4,5"));
  require(clerk.GetJobIdOfTheDept("4") == jobInE && clerk.UpdateUsers("2,6|2,7", ""));
  userGroup both;
  both.connect(server, "QVApp");
  both.Name("both");
  require(both.Save() && both.SetUsers("2,3") && both.SetRoles("Clerk"));
  PlainSession(server).run(
      "insert into reports(repId,repName) values(1,'r') insert into repAcl(repId,jobId,authType) values(1,6,1)"
      " insert into fldAcl(fldId,jobId) values(1,6) insert into cftJob(tId,jobId) values(1,6)"
      " insert into userMgr(UserId,flag,mgrId,jobId) values(2,2,3,0)"
      " insert into userMgr(UserId,flag,mgrId,jobId) values(3,1,0,6)"
      " insert into users(userName,userLogin,uType,accstate) values('reg','reg',2,2)");
}

}  // namespace QVSa::test
