#include "QVSa/classification/AclRule.h"

namespace QVSa {

Boolean AclRule::GetOne() {
  return operation(plain(), [&] {
    Connection connection = open();
    Recordset row = connection.Execute("select * from AclRule where [id]=1");
    if (row.EOF_()) return true;
    Id_ = row["id"].asLong();
    RWType_ = row["RWType"].asInteger();
    RWDeptSet_ = row["RWDeptSet"].asInteger();
    RWRoleSet_ = row["RWRoleSet"].asInteger();
    DesignType_ = row["DesignType"].asInteger();
    DesignDeptSet_ = row["DesignDeptSet"].asInteger();
    DesignRoleSet_ = row["DesignRoleSet"].asInteger();
    ExcludeAdmin_ = row["excludeAdmin"].asInteger();
    return true;
  });
}

Boolean AclRule::Save() {
  return operation(plain(), [&] {
    Connection connection = open();
    if (Id_ != 0) {
      connection.Execute("update AclRule set RWType=" + text(RWType_) + ",RWDeptSet=" + text(RWDeptSet_) +
                         ",RWRoleSet=" + text(RWRoleSet_) + ",DesignType=" + text(DesignType_) +
                         ",DesignDeptSet=" + text(DesignDeptSet_) + ",DesignRoleSet=" + text(DesignRoleSet_) +
                         ",excludeAdmin=" + text(ExcludeAdmin_) + " where [Id]=1 ");
    } else {
      connection.Execute(
          "insert into AclRule("
          " id,RWType,RWDeptSet,RWRoleSet,DesignType,DesignDeptSet,DesignRoleSet,excludeAdmin)"
          " values(1," +
          text(RWType_) + "," + text(RWDeptSet_) + "," + text(RWRoleSet_) + "," + text(DesignType_) + "," +
          text(DesignDeptSet_) + "," + text(DesignRoleSet_) + "," + text(ExcludeAdmin_) + " )");
      Id_ = 1;
    }
    return true;
  });
}

}  // namespace QVSa
