#include "tests/faults/OrganisationOperations.h"

#include "QVSa/QVSa.h"
#include "tests/faults/Shapes.h"
#include "tests/support/PlainSession.h"

namespace QVSa::test {

namespace {

// Of the ground: departments 3 to 5 (S, E below it, O), users 2 and 3, the role Clerk with jobs 6 and 7 in E and O.
constexpr Long roleClerk = 7;
constexpr Long jobInE = 6;

void loadClerk(Role& role) { require(role.GetOne(1, roleClerk)); }
void loadBoth(userGroup& group) { require(group.GetOne(2, "both")); }
void loadE(Department& department) { require(department.GetOne(1, "E")); }
void loadAnn(User& user) { require(user.GetOne(3, "ann")); }

template <class List>
Operation listing(const char* name, std::function<bool(List&)> run, std::vector<Report> reports) {
  return operation<List>(
      name, nothing<List>, [run](List& list, const String&) { return run(list); }, std::move(reports));
}

std::vector<Operation> departmentLists() {
  const std::vector<Report> listing1117 = told(1117, " ");
  return {
      listing<Departments>("Departments.GetAll", [](Departments& list) { return list.GetAll(); }, {}),
      listing<Departments>("Departments.GetAll of a subtree", [](Departments& list) { return list.GetAll(-1, "3"); },
                           {}),
      listing<Departments>("Departments.GetAllWithLevel", [](Departments& list) { return list.GetAllWithLevel(); }, {}),
      listing<Departments>(
          "Departments.getAllSuper", [](Departments& list) { return list.getAllSuper("6"); }, listing1117),
      listing<Departments>(
          "Departments.getAllSuperWithLevel",
          [](Departments& list) { return list.getAllSuperWithLevel("6,7", 1, "_root", 1); }, listing1117),
      operation<Department>("Department.GetAllSub", loadE,
                            [](Department& department, const String&) { return department.GetAllSub() != nullptr; }),
      operation<Department>("Department.GetSub", loadE,
                            [](Department& department, const String&) { return department.GetSub() != nullptr; }),
      operation<Department>(
          "Department.GetUsers", loadE,
          [](Department& department, const String&) { return department.GetUsers() != nullptr; }, listing1117),
  };
}

std::vector<Operation> roleOperations() {
  std::vector<Report> setting = told(1208);
  setting[0].number = messageNumber(1208);
  const auto save = [](Role& role, const String&) { return role.Save(); };
  return {
      operation<Role>("Role.GetOne", nothing<Role>, [](Role& role, const String&) { return role.GetOne(2, "Clerk"); }),
      operation<Role>(
          "Role.Save of a new role", [](Role& role) { role.Name("New"); }, save, {}, true),
      operation<Role>(
          "Role.Save",
          [](Role& role) {
            loadClerk(role);
            role.Name("Scribe");
          },
          save, told(1204, " "), true),
      operation<Role>(
          "Role.Delete", loadClerk, [](Role& role, const String&) { return role.Delete(); }, told(1205, " "), true),
      operation<Role>(
          "Role.GetUsers", loadClerk, [](Role& role, const String&) { return role.GetUsers() != nullptr; },
          told(1117, " ")),
      operation<Role>(
          "Role.GetUsersOfRole", loadClerk,
          [](Role& role, const String&) { return role.GetUsersOfRole("3", "Clerk") != nullptr; }, told(1117, " ")),
      operation<Role>(
          "Role.setJobs", loadClerk, [](Role& role, const String&) { return role.setJobs("3", "4"); }, setting, true),
      operation<Role>("Role.getAcl", loadClerk, [](Role& role, const String&) { return !role.getAcl().empty(); }),
      operation<Role>("Role.GetJobIdOfTheDept", loadClerk,
                      [](Role& role, const String&) { return role.GetJobIdOfTheDept("4") == jobInE; }),
      operation<Role>("Role.GetUsers2", loadClerk,
                      [](Role& role, const String&) {
                        String xml;
                        return role.GetUsers2(xml) && !xml.empty();
                      }),
      operation<Role>("Role.UpdateUsers", loadClerk,
                      [](Role& role, const String&) { return role.UpdateUsers("3,6|3,7", "2,6"); }),
      listing<Roles>(
          "Roles.GetAll", [](Roles& roles) { return roles.GetAll(); }, told(1207, " ")),
  };
}

std::vector<Operation> jobAndUserLists() {
  const std::vector<Report> ofJobs = told(3101, " "), ofUsers = told(1117, " ");
  return {
      listing<Jobs>(
          "Jobs.GetAll", [](Jobs& jobs) { return jobs.GetAll("E", "Clerk", 2); }, ofJobs),
      listing<Jobs>(
          "Jobs.GetAllOfDept", [](Jobs& jobs) { return jobs.GetAllOfDept(3); }, ofJobs),
      listing<Jobs>(
          "Jobs.GetAllSameRole", [](Jobs& jobs) { return jobs.GetAllSameRole(2); }, ofJobs),
      listing<Users>(
          "Users.GetAll", [](Users& users) { return users.GetAll(); }, ofUsers),
      listing<Users>("Users.GetAllReg", [](Users& users) { return users.GetAllReg(); }, {}),
      listing<Users>(
          "Users.GetAllOfTheDept", [](Users& users) { return users.GetAllOfTheDept(3); }, ofUsers),
      listing<Users>(
          "Users.GetAllOfTheDeptAndRole", [](Users& users) { return users.GetAllOfTheDeptAndRole(3, "Clerk"); },
          ofUsers),
      listing<Users>(
          "Users.getAllForSelUser", [](Users& users) { return users.getAllForSelUser("6", 2, 1); }, ofUsers),
      listing<Users>(
          "Users.GetList", [](Users& users) { return users.GetList(0) > 0; }, ofUsers),
  };
}

std::vector<Operation> groupAndSupervisorOperations() {
  const auto save = [](userGroup& group, const String&) { return group.Save(); };
  return {
      operation<userGroup>("userGroup.GetOne", nothing<userGroup>,
                           [](userGroup& group, const String&) { return group.GetOne(2, "both"); }),
      operation<userGroup>("userGroup.GetUsers", loadBoth,
                           [](userGroup& group, const String&) { return !group.GetUsers().empty(); }),
      operation<userGroup>(
          "userGroup.SetUsers", loadBoth, [](userGroup& group, const String&) { return group.SetUsers("3"); },
          told(1808, " "), true),
      operation<userGroup>(
          "userGroup.GetRoles", loadBoth,
          [](userGroup& group, const String&) {
            String roles;
            return group.GetRoles(roles) && !roles.empty();
          },
          told(1807, " ")),
      operation<userGroup>(
          "userGroup.SetRoles", loadBoth,
          [](userGroup& group, const String&) { return group.SetRoles("Report Owners"); }, told(1806, " "), true),
      operation<userGroup>(
          "userGroup.Save of a new group", [](userGroup& group) { group.Name("new"); }, save, {}, true),
      operation<userGroup>(
          "userGroup.Save",
          [](userGroup& group) {
            loadBoth(group);
            group.Name("all");
          },
          save, {{"update ItemGroups", LoadResString(1803) + " "}}, true),
      operation<userGroup>(
          "userGroup.Delete", loadBoth, [](userGroup& group, const String&) { return group.Delete(); }, told(1804, " "),
          true),
      listing<userGroups>(
          "userGroups.GetAll", [](userGroups& groups) { return groups.GetAll(); }, told(1809, " ")),
      operation<User>(
          "User.setManager", loadAnn, [](User& user, const String&) { return user.setManager(1, jobInE); }, told(1114),
          true),
      operation<User>(
          "User.getManager", loadAnn,
          [](User& user, const String&) {
            Integer flag = 0;
            Long job = 0, person = 0;
            return user.getManager(flag, job, person) && person == 3;
          },
          told(1115)),
      operation<User>(
          "User.getSubUsers", loadAnn, [](User& user, const String&) { return user.getSubUsers() != nullptr; },
          told(1116)),
  };
}

}  // namespace

std::vector<Operation> organisationOperations() {
  std::vector<Operation> result;
  for (auto part : {departmentLists(), roleOperations(), jobAndUserLists(), groupAndSupervisorOperations()})
    result.insert(result.end(), part.begin(), part.end());
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
