#include "QVSa/classification/AclRule.h"

#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<AclRule>& rule) {
  rule.property<Long>("Id", &AclRule::Id, &AclRule::Id)
      .property<Integer>("RWType", &AclRule::RWType, &AclRule::RWType)
      .property<Integer>("RWDeptSet", &AclRule::RWDeptSet, &AclRule::RWDeptSet)
      .property<Integer>("RWRoleSet", &AclRule::RWRoleSet, &AclRule::RWRoleSet)
      .property<Integer>("DesignType", &AclRule::DesignType, &AclRule::DesignType)
      .property<Integer>("DesignDeptSet", &AclRule::DesignDeptSet, &AclRule::DesignDeptSet)
      .property<Integer>("DesignRoleSet", &AclRule::DesignRoleSet, &AclRule::DesignRoleSet)
      .property<Integer>("ExcludeAdmin", &AclRule::ExcludeAdmin, &AclRule::ExcludeAdmin)
      .readOnly("errNumber", &AclRule::errNumber)
      .readOnly("errDescription", &AclRule::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &AclRule::connect, failsWith(false))
      .operation("GetOne", {}, &AclRule::GetOne, failsWith(false))
      .operation("Save", {}, &AclRule::Save, failsWith(false));
}

}  // namespace QVSa::binding
