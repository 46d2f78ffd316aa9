#include <memory>

#include "QVSa/QVSa.h"
#include "bench/Operations.h"
#include "bench/Pairs.h"
#include "bench/Workforce.h"

namespace QVSa::bench {

namespace {

constexpr int middle = 10'000;

template <class Object>
std::shared_ptr<Object> connected(int size) {
  auto object = std::make_shared<Object>();
  object->connect(workforce(size).server(), "QVSys");
  return object;
}

// Reads all rows of one query into memory.
class Reading {
 public:
  Reading(int size, const std::string& text) : storage_(workforce(size).folder()), query_(storage_, text) {}

  template <class... Values>
  std::vector<Row> rows(const Values&... values) {
    std::vector<Row> result;
    query_.start(values...);
    while (query_.step()) result.push_back(query_.row());
    return result;
  }
  const Storage& storage() const { return storage_; }

 private:
  Storage storage_;
  Query query_;
};

Call readingOf(int size, const std::string& text) {
  return {[reading = std::make_shared<Reading>(size, text)] { reading->rows(); }};
}

Call tree(int size) {
  return {[list = connected<Departments>(size)] { require(list->GetAll(), *list); }};
}

Call treeFloor(int size) {
  return readingOf(size,
                   "select d.*,s.deptNo from QVSys.departments d left join QVSys.departments s on d.superDept=s.deptId "
                   "order by d.isOuter,d.path");
}

Call levels(int size) {
  return {[list = connected<Departments>(size)] { require(list->GetAllWithLevel(), *list); }};
}

Call levelsFloor(int size) {
  return readingOf(
      size,
      "with recursive tree(deptId,l) as (select deptId,1 from QVSys.departments where superDept=0 union all "
      "select d.deptId,t.l+1 from tree t join QVSys.departments d on d.superDept=t.deptId) "
      "select d.*,s.deptNo,t.l from tree t join QVSys.departments d on d.deptId=t.deptId "
      "left join QVSys.departments s on s.deptId=d.superDept order by d.isOuter,t.l,d.deptNo");
}

Call people(int size) {
  return {[list = connected<Users>(size)] { require(list->GetAll(), *list); }};
}

Call peopleFloor(int size) {
  auto users = std::make_shared<Reading>(
      size,
      "select u.userId,u.userName,u.userLogin,u.userPwd,u.mobilePhone,u.email,u.isAbstract,u.deptId,d.deptName,"
      "d.fullName,u.useSms,u.useKey,u.accstate,u.lockDate,u.uType,u.domain,j1.jobId,j2.jobId,j3.jobId,j4.jobId,"
      "u.company,u.address,u.zipcode,u.telephone,u.isouter,u.ldDn,u.PwdNoChange,u.useOTPAuth,u.OTPTokenId "
      "from QVSys.users u join QVSys.departments d on d.deptId=u.deptId "
      "left join QVSys.userJob j1 on j1.userId=u.userId and j1.jobId=1 "
      "left join QVSys.userJob j2 on j2.userId=u.userId and j2.jobId=2 "
      "left join QVSys.userJob j3 on j3.userId=u.userId and j3.jobId=3 "
      "left join QVSys.userJob j4 on j4.userId=u.userId and j4.jobId=4 "
      "where u.accstate in (0,1) order by u.userName");
  auto groups = std::make_shared<Query>(
      users->storage(), "select g.gName from QVSys.GrpUser x join QVSys.ItemGroups g on g.gId=x.gId where x.userId=?");
  return {[users, groups] {
    for (const Row& user : users->rows()) {
      groups->start(user.numbers[0]);
      while (groups->step()) groups->row();
    }
  }};
}

Call setJobs() {
  auto role = connected<Role>(middle);
  role->Id(static_cast<Long>(workforce(middle).idleRole()));
  const std::string ids = workforce(middle).departmentIds(middle);
  return {[role, ids] { require(role->setJobs(ids), *role); }, [role, ids] { require(role->setJobs("", ids), *role); }};
}

Call setJobsFloor() {
  auto storage = std::make_shared<Storage>(workforce(middle).folder());
  auto insert = std::make_shared<Query>(
      *storage,
      "insert into QVSys.jobs(roleId,deptId) select 8,deptId from QVSys.departments where deptId in (select value from "
      "json_each(?)) and deptId not in (select deptId from QVSys.jobs where roleId=8)");
  const std::string ids = "[" + workforce(middle).departmentIds(middle) + "]";
  return {[storage, insert, ids] {
            storage->execute("begin");
            insert->start(ids).run();
            storage->execute("commit");
          },
          [storage] { storage->execute("delete from QVSys.jobs where roleId=8"); }};
}

Call waysUp() {
  return {[list = connected<Departments>(middle), ids = workforce(middle).jobIds(100)] {
    require(list->getAllSuper(ids) && list->Count() > 100, *list);
  }};
}

Call waysUpFloor() {
  return readingOf(middle,
                   "with recursive chain(id) as (select deptId from QVSys.jobs where jobId in (" +
                       workforce(middle).jobIds(100) +
                       ") union select d.superDept from chain c join QVSys.departments d on d.deptId=c.id where "
                       "d.superDept<>0) select d.deptId,d.deptName,d.superDept,d.fullName,d.path,d.deptNo from chain c "
                       "join QVSys.departments d on d.deptId=c.id order by d.path");
}

Call holders() {
  auto role = connected<Role>(middle);
  role->Id(static_cast<Long>(workforce(middle).role()));
  return {[role] {
    String xml;
    require(role->GetUsers2(xml), *role);
  }};
}

Call holdersFloor() {
  auto reading = std::make_shared<Reading>(
      middle,
      "select u.userId,u.userName,u.deptId,d.deptName,d.deptNo,uj.jobId from QVSys.jobs j join QVSys.userJob uj on "
      "uj.jobId=j.jobId join QVSys.users u on u.userId=uj.userId join QVSys.departments d on d.deptId=u.deptId "
      "where j.roleId=7");
  return {[reading] {
    std::string xml = "<users>";
    for (const Row& row : reading->rows())
      xml += "<user id=\"" + std::to_string(row.numbers[0]) + "\" name=\"" + row.texts[0] + "\" deptid=\"" +
             std::to_string(row.numbers[1]) + "\" deptname=\"" + row.texts[1] + "\" jobid=\"" +
             std::to_string(row.numbers[2]) + "\" deptno=\"" + row.texts[2] + "\"/>";
    xml += "</users>";
  }};
}

void addPoints(const std::string& name, Call (*operation)(int), Call (*floor)(int)) {
  for (const auto& [size, told] : {std::pair{1'000, "1,000"}, {10'000, "10,000"}, {30'000, "30,000"}})
    addPair(
        name + ", " + told, [operation, size = size] { return operation(size); },
        [floor, size = size] { return floor(size); });
}

}  // namespace

void addOrganisationPairs() {
  addPoints("Departments.GetAll", tree, treeFloor);
  addPoints("Departments.GetAllWithLevel", levels, levelsFloor);
  addPoints("Users.GetAll", people, peopleFloor);
  addPair("Role.setJobs, 10,000 departments", setJobs, setJobsFloor);
  addPair("Departments.getAllSuper, 100 jobs of 10,000", waysUp, waysUpFloor);
  addPair("Role.GetUsers2, 5,000 holders", holders, holdersFloor);
}

}  // namespace QVSa::bench
