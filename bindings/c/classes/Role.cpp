#include "QVSa/organisation/Role.h"

#include "QVSa/organisation/Users.h"
#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<Role>& role) {
  role.property<Long>("Id", &Role::Id, &Role::Id)
      .property<String>("Name", &Role::Name, &Role::Name)
      .property<String>("description", &Role::description, &Role::description)
      .readOnly("builtIn", &Role::builtIn)
      .property<Long>("creUserId", &Role::creUserId, &Role::creUserId)
      .property<String>("creUserName", &Role::creUserName, &Role::creUserName)
      .property<Date>("createTime", &Role::createTime, &Role::createTime)
      .property<Long>("updUserId", &Role::updUserId, &Role::updUserId)
      .property<String>("upduserName", &Role::upduserName, &Role::upduserName)
      .property<Date>("updTime", &Role::updTime, &Role::updTime)
      .property<Boolean>("otherCanDesign", &Role::otherCanDesign, &Role::otherCanDesign)
      .readOnly("errNumber", &Role::errNumber)
      .readOnly("errDescription", &Role::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &Role::connect, failsWith(false))
      .operation("GetOne", {"keyName", "keyValue"}, &Role::GetOne, failsWith(false))
      .operation("Save", {}, &Role::Save, failsWith(false))
      .operation("Delete", {optional("Id", 0)}, &Role::Delete, failsWith(false))
      .operation("GetUsers", {optional("haveAuth", true), optional("noBuiltIn", true), optional("deptId", "")},
                 &Role::GetUsers, failsWithNothing())
      .operation("GetUsersOfRole", {optional("deptId", ""), optional("roleName", "")}, &Role::GetUsersOfRole,
                 failsWithNothing())
      .operation("GetUsers2", {"UsersXml"}, &Role::GetUsers2, failsWith(false))
      .operation("UpdateUsers", {"newUserJobIds", "delUserJobIds"}, &Role::UpdateUsers, failsWith(false))
      .operation("setJobs", {"depts", optional("DeptIdsDeleted", "")}, &Role::setJobs, failsWith(false))
      .operation("GetJobIdOfTheDept", {"deptId"}, &Role::GetJobIdOfTheDept, failsWith(0, -1))
      .operation("getAcl", {optional("Id", 0)}, &Role::getAcl)
      .enumeration("RoleKey", {{"byId", Role::byId}, {"byName", Role::byName}});
}

}  // namespace QVSa::binding
