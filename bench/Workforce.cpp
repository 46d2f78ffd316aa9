#include "bench/Workforce.h"

#include <map>
#include <memory>

namespace QVSa::bench {

namespace {

constexpr std::int64_t firstDepartment = 3;
constexpr std::int64_t firstJob = 5;
constexpr int departmentsBelow = 8;
constexpr int holders = 5'000;

// The numbers from `first` on.
std::string numbersFrom(std::int64_t first, int count) {
  std::string result;
  for (int i = 0; i < count; ++i) result += (i == 0 ? "" : ",") + std::to_string(first + i);
  return result;
}

}  // namespace

Workforce::Workforce(int size) {
  Storage storage(folder());
  storage.execute("begin");
  storage.execute(
      "insert into QVSys.roles(roleId,roleName,builtIn) values(7,'Clerk',0);"
      "insert into QVSys.roles(roleId,roleName,builtIn) values(8,'Nobody',0)");
  addDepartments(storage, size);
  addPeople(storage, size);
  storage.execute("commit");
}

std::string Workforce::departmentIds(int count) const { return numbersFrom(firstDepartment, count); }

std::string Workforce::jobIds(int count) const { return numbersFrom(firstJob, count); }

void Workforce::addDepartments(Storage& storage, int count) {
  struct Place {
    std::string path;
    std::string fullName;
  };
  std::vector<Place> places;
  Query insert(storage,
               "insert into QVSys.departments(deptId,deptNo,deptName,superDept,fullName,path,isOrg,isOuter) "
               "values(?,?,?,?,?,?,0,0)");
  for (int i = 0; i < count; ++i) {
    const int superior = (i - 1) / departmentsBelow;
    const std::int64_t superId = i == 0 ? 1 : firstDepartment + superior;
    const Place above = i == 0 ? Place{".1.", ""} : places[static_cast<std::size_t>(superior)];
    const std::string name = "Department " + std::to_string(i);
    const std::string id = std::to_string(firstDepartment + i);
    Place place{above.path + id + ".", above.fullName.empty() ? name : above.fullName + "-" + name};
    insert.start(firstDepartment + i, "D" + id, name, superId, place.fullName, place.path).run();
    places.push_back(std::move(place));
  }
}

void Workforce::addPeople(Storage& storage, int count) {
  Query addUser(storage,
                "insert into QVSys.users(userId,userName,userLogin,userPwd,isAbstract,isRole,deptId,useSms,useKey,"
                "accstate,pwdDate,lgts,uType,isOuter,synLogin) values(?,?,?,'',0,0,?,0,0,0,?,0,0,0,0)");
  Query addJob(storage, "insert into QVSys.jobs(jobId,roleId,deptId) values(?,7,?)");
  Query hold(storage, "insert into QVSys.userJob(userId,jobId) values(?,?)");
  for (std::int64_t i = 0; i < count; ++i) {
    const std::string number = std::to_string(i);
    addUser.start(i + 2, "User " + number, "user-" + number, firstDepartment + i, nowTicks()).run();
    addJob.start(firstJob + i, firstDepartment + i).run();
    if (i < holders) hold.start(i + 2, firstJob + i).run();
  }
}

const Workforce& workforce(int size) {
  static std::map<int, std::unique_ptr<Workforce>> made;
  std::unique_ptr<Workforce>& entry = made[size];
  if (!entry) entry = std::make_unique<Workforce>(size);
  return *entry;
}

}  // namespace QVSa::bench
