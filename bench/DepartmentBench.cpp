#include <memory>

#include "QVSa/QVSa.h"
#include "bench/Office.h"
#include "bench/Operations.h"
#include "bench/Pairs.h"

namespace QVSa::bench {

namespace {

// Two names in turns: each rename is one.
class Names {
 public:
  const std::string& next() { return names_[turn_++ % 2]; }

 private:
  std::string names_[2] = {"Head office", "Main office"};
  std::size_t turn_ = 1;
};

class DepartmentFloor {
 public:
  void rename(const std::string& number, const std::string& name) {
    const Row stored = read_.start(number).one();
    const std::int64_t id = stored.numbers[0];
    const std::string& path = stored.texts[0];
    begin_.start().run();
    update_.start(number, name, name, path, stored.numbers[1], id).run();
    const std::string last = path + "\xF4\x8F\xBF\xBF";
    below_.start(path, path, stored.texts[1], name, path, last, id).run();
    commit_.start().run();
  }

 private:
  Storage storage_{largeOffice().folder()};
  Query read_{storage_,
              "select d.deptId,d.superDept,d.path,d.fullName,s.deptNo,s.fullName,d.deptName from QVSys.departments d "
              "left join QVSys.departments s on d.superDept=s.deptId where d.deptNo=?"};
  Query update_{
      storage_,
      "update QVSys.departments set deptNo=?,deptName=?,fullName=?,path=?,superDept=?,isOrg=0 where deptId=?"};
  Query below_{storage_,
               "update QVSys.departments set path=replace(path,?,?),fullName=replace(fullName,?,?) "
               "where path>=? and path<? and deptId<>?"};
  Query begin_{storage_, "begin"};
  Query commit_{storage_, "commit"};
};

Call rename() {
  auto top = std::make_shared<Department>();
  top->connect(largeOffice().server(), "QVSys");
  require(top->GetOne(1, Office::top), *top);
  return {[top, names = Names()]() mutable {
    top->Name(names.next());
    require(top->Save(), *top);
  }};
}

Call renameFloor() {
  return {[floor = std::make_shared<DepartmentFloor>(), names = Names()]() mutable {
    floor->rename(Office::top, names.next());
  }};
}

}  // namespace

void addDepartmentPairs() { addPair("Department.Save, top of 100,000 renamed", rename, renameFloor); }

}  // namespace QVSa::bench
