#include "QVSa/organisation/Users.h"

#include "QVSa/identity/User.h"
#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<Users>& users) {
  users.readOnly("errNumber", &Users::errNumber)
      .readOnly("errDescription", &Users::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &Users::connect, failsWith(false))
      .operation("Remove", {"Index"}, &Users::Remove)
      .operation("Add",
                 {"Name", "Login", optional("Id", 0), optional("Pwd", ""), optional("MobilePhone", ""),
                  optional("Email", ""), optional("deptId", ""), optional("deptName", ""), optional("deptFullName", ""),
                  optional("sendSms", false), optional("keyLogin", false), optional("PwdNoChange", false)},
                 &Users::Add)
      .operation("Clear", {}, &Users::Clear)
      .operation("GetAll",
                 {optional("deptId", ""), optional("roleId", 0), optional("noBuiltIn", false), optional("grpId", -1),
                  optional("uType", -1)},
                 &Users::GetAll, failsWith(false))
      .operation("GetAllReg", {optional("regState", -1), optional("deptId", 0)}, &Users::GetAllReg, failsWith(false))
      .operation("GetAllOfTheDept", {"deptId"}, &Users::GetAllOfTheDept, failsWith(false))
      .operation("GetAllOfTheDeptAndRole", {optional("deptId", 0), optional("roleName", "")},
                 &Users::GetAllOfTheDeptAndRole, failsWith(false))
      .operation("getAllForSelUser", {optional("Jobs", ""), optional("userId", 0), optional("isSameOrg", 0)},
                 &Users::getAllForSelUser, failsWith(false))
      .operation("GetList", {"deptId"}, &Users::GetList, failsWith(-1))
      .operation("DataMembers", {}, &Users::DataMembers)
      .operation("GetDataMember", {"DataMember"}, &Users::GetDataMember)
      .operation("Count", {}, &Users::Count)
      .operation("Item", {"Index"}, &Users::Item)
      .items<User>();
}

}  // namespace QVSa::binding
