#include "QVSa/organisation/Department.h"

#include "QVSa/organisation/Departments.h"
#include "QVSa/organisation/Users.h"
#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<Department>& department) {
  department.property<Boolean>("isOuter", &Department::isOuter, &Department::isOuter)
      .property<String>("Id", &Department::Id, &Department::Id)
      .readOnly("InnerId", &Department::InnerId)
      .property<String>("Name", &Department::Name, &Department::Name)
      .property<String>("Super", &Department::Super, &Department::Super)
      .readOnly("superInnerId", &Department::superInnerId)
      .property<String>("fullName", &Department::fullName, &Department::fullName)
      .property<Boolean>("isOrg", &Department::isOrg, &Department::isOrg)
      .readOnly("Org", &Department::Org)
      .property<String>("fullId", &Department::fullId, &Department::fullId)
      .readOnly("errNumber", &Department::errNumber)
      .readOnly("errDescription", &Department::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &Department::connect, failsWith(false))
      .operation("GetOne", {"keyName", "keyValue"}, &Department::GetOne, failsWith(false))
      .operation("Save", {}, &Department::Save, failsWith(false))
      .operation("Delete", {optional("Id", "")}, &Department::Delete, failsWith(false))
      .operation("GetAllSub", {}, &Department::GetAllSub, failsWithNothing())
      .operation("GetSub", {}, &Department::GetSub, failsWithNothing())
      .operation("GetUsers", {}, &Department::GetUsers, failsWithNothing())
      .enumeration(
          "DepartmentKey",
          {{"byInnerId", Department::byInnerId}, {"byNumber", Department::byNumber}, {"byName", Department::byName}});
}

}  // namespace QVSa::binding
