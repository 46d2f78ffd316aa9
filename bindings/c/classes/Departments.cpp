#include "QVSa/organisation/Departments.h"

#include "QVSa/organisation/Department.h"
#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<Departments>& departments) {
  departments.readOnly("errNumber", &Departments::errNumber)
      .readOnly("errDescription", &Departments::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &Departments::connect, failsWith(false))
      .operation("Remove", {"Index"}, &Departments::Remove)
      .operation("Add",
                 {"Id", "Name", optional("Super", ""), optional("isOrg", false), input("InnerId"), input("fullName")},
                 &Departments::Add)
      .operation("GetAll", {optional("outer", -1), optional("deptIds", "")}, &Departments::GetAll, failsWith(false))
      .operation("GetAllWithLevel", {optional("outer", -1)}, &Departments::GetAllWithLevel, failsWith(false))
      .operation("GetRoot", {}, &Departments::GetRoot, failsWith(false))
      .operation("getAllSuper", {"jobIds", optional("isSameOrg", 0), optional("orgNo", ""), optional("x", -1)},
                 &Departments::getAllSuper, failsWith(false))
      .operation("getAllSuperWithLevel", {"jobIds", optional("isSameOrg", 0), optional("orgNo", ""), optional("x", -1)},
                 &Departments::getAllSuperWithLevel, failsWith(false))
      .operation("Count", {}, &Departments::Count)
      .operation("Item", {"Index"}, &Departments::Item)
      .items<Department>();
}

}  // namespace QVSa::binding
