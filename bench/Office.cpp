#include "bench/Office.h"

#include <stdexcept>

#include "QVSa/QVSa.h"

namespace QVSa::bench {

namespace {

constexpr std::int64_t topId = 3;
constexpr int departmentsBelow = 8;

void require(bool good, const std::string& description) {
  if (!good) throw std::runtime_error(description);
}

}  // namespace

Office::Office(int departments, int sessions) {
  {
    Storage storage(folder());
    storage.execute("begin");
    addDepartments(storage, departments);
    addUsers(storage, departments / 2);
    addSessions(storage, sessions);
    addGroupAndRule(storage);
    storage.execute("commit");
  }
  addAnn();
  issueFirstNumbers();
}

// A full tree below the top: the superior of the n-th department is the one at n / departmentsBelow.
void Office::addDepartments(Storage& storage, int count) {
  struct Place {
    std::string path;
    std::string fullName;
  };
  std::vector<Place> places{{".1." + std::to_string(topId) + ".", "Head office"}};
  Query insert(storage,
               "insert into QVSys.departments(deptId,deptNo,deptName,superDept,fullName,path,isOrg,isOuter) "
               "values(?,?,?,?,?,?,0,0)");
  insert.start(topId, top, places[0].fullName, std::int64_t{1}, places[0].fullName, places[0].path).run();
  for (int i = 1; i < count; ++i) {
    const int superior = (i - 1) / departmentsBelow;
    const Place& above = places[static_cast<std::size_t>(superior)];
    const std::string name = "Department " + std::to_string(i);
    Place place{above.path + std::to_string(topId + i) + ".", above.fullName + "-" + name};
    insert.start(topId + i, "D" + std::to_string(i), name, topId + superior, place.fullName, place.path).run();
    places.push_back(std::move(place));
  }
}

void Office::addUsers(Storage& storage, int count) {
  Query insert(
      storage,
      "insert into QVSys.users(userName,userLogin,userPwd,isAbstract,isRole,deptId,useSms,useKey,accstate,pwdDate,"
      "lgts,uType,isOuter,synLogin) values(?,?,'',0,0,?,0,0,0,?,0,0,0,0)");
  for (int i = 0; i < count; ++i) {
    const std::string number = std::to_string(i);
    insert.start("User " + number, "user-" + number, topId + i, nowTicks()).run();
  }
}

void Office::addSessions(Storage& storage, int count) {
  Query insert(storage,
               "insert into QVSys.seslog(sesId,userLogin,computer,dbname,ip,begintime,lastActTime) "
               "values(?,?,?,'QVApp',?,?,?)");
  for (int i = 0; i < count; ++i) {
    const std::string number = std::to_string(i);
    insert
        .start("A" + number, "user-" + number, "workstation-" + number, "10.1." + std::to_string(i % 250) + ".17",
               nowTicks(), nowTicks())
        .run();
  }
}

void Office::addGroupAndRule(Storage& storage) {
  storage.execute("insert into QVSys.ItemGroups(gName) values('Writers')");
  Query(storage,
        "insert into QVApp.idRule(idName,preFix,ymdStyle,noStyle,reuseStyle,nws,predefined) values(?,?,3,8,0,0,0)")
      .start(rule, "INV")
      .run();
}

void Office::addAnn() {
  safeRule policy;
  policy.connect(server(), "QVApp");
  policy.minLen(8);
  policy.maxDay(90);
  policy.lockErr(true);
  policy.errTimes(3);
  require(policy.Save(), policy.errDescription());

  User ann;
  ann.connect(server(), "QVApp");
  ann.Name("Ann Miller");
  ann.Login(login);
  ann.Pwd(password);
  ann.Email("ann.miller@office.example");
  ann.deptId("D100");
  ann.setJobs("2,4");
  ann.grpName("Writers");
  require(ann.Save(), ann.errDescription());
}

void Office::issueFirstNumbers() {
  IdMgr application, system;
  application.connect(server(), "QVApp");
  require(!application.newId(rule).empty(), application.errDescription());
  system.connect(server(), "QVSys");
  require(!system.newId("_ses").empty(), system.errDescription());
}

const Office& office() {
  static const Office theOffice(800, 1'000);
  return theOffice;
}

const Office& largeOffice() {
  static const Office theOffice(100'000, 0);
  return theOffice;
}

}  // namespace QVSa::bench
