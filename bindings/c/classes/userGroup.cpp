#include "QVSa/organisation/userGroup.h"

#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<userGroup>& group) {
  group.readOnly("Id", &userGroup::Id)
      .property<String>("Name", &userGroup::Name, &userGroup::Name)
      .property<String>("description", &userGroup::description, &userGroup::description)
      .readOnly("errNumber", &userGroup::errNumber)
      .readOnly("errDescription", &userGroup::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &userGroup::connect, failsWith(false))
      .operation("GetUsers", {optional("Id", 0)}, &userGroup::GetUsers)
      .operation("SetUsers", {"userList"}, &userGroup::SetUsers, failsWith(false))
      .operation("GetRoles", {"roleList"}, &userGroup::GetRoles, failsWith(false))
      .operation("SetRoles", {"roleList"}, &userGroup::SetRoles, failsWith(false))
      .operation("GetOne", {"keyName", "keyValue"}, &userGroup::GetOne, failsWith(false))
      .operation("Delete", {optional("Id", 0)}, &userGroup::Delete, failsWith(false))
      .operation("Save", {}, &userGroup::Save, failsWith(false))
      .enumeration("userGroupKey", {{"byId", userGroup::byId}, {"byName", userGroup::byName}});
}

}  // namespace QVSa::binding
