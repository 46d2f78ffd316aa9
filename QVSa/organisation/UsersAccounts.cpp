#include "QVSa/organisation/Users.h"

namespace QVSa {

Boolean Users::GetAllReg(Integer regState, Long deptId) {
  return operation(plain(), [&] {
    String statement =
        "select u.userId,u.userName,u.userLogin,u.userPwd,u.mobilePhone,u.email,u.isAbstract,"
        "     u.deptId , d.deptName, d.fullName, u.useSms, u.useKey, accstate, lockDate"
        "     , u.uType,u.domain,"
        "     j1=j1.jobId,j2=j2.jobId,j3=j3.jobId,j4=j4.jobId"
        "     , u.company,u.address,u.zipcode,u.telephone,u.isouter"
        "     , isnull(uReg.userDesc,'') as userDesc"
        "     , u.PwdNoChange "
        "     , u.useOTPAuth "
        "     , u.OTPTokenId "
        " from users u , departments d , userJob j1 , userJob j2 , userJob j3 , userJob j4 "
        "     , QVUserRegInfo uReg "
        " where u.isRole=0 and u.deptId*=d.deptId"
        "     and j1.jobId=1 and u.userId*=j1.userId"
        "     and j2.jobId=2 and u.userId*=j2.userId"
        "     and j3.jobId=3 and u.userId*=j3.userId"
        "     and j4.jobId=4 and u.userId*=j4.userId"
        "     and u.uType=2"
        "     and u.userId*=uReg.userId ";
    if (regState != -1) statement += " and u.accstate=<accstate>";
    // Nothing fills the token of this clause, and so the database refuses the statement.
    if (deptId > 0) {
      statement +=
          " and ( u.deptid = <deptID> Or charindex( '."
          "<deptID>"
          ".' , d.path ) > 0 ) ";
    }
    Clear();
    Connection connection = open();
    connection.Execute("set nocount on");
    Recordset row = connection.Execute(sql(statement).number("accstate", regState));
    for (; !row.EOF_(); row.MoveNext()) {
      auto user = listedUser(row);
      user->RegUserDesc(row["userDesc"].asText());
      user->readGroups(connection, "ItemGroups");
      connectAlike(*user);
      add(user, user->Name());
    }
    return true;
  });
}

Boolean Users::GetAll(const String& deptId, Long roleId, Boolean noBuiltIn, Long grpId, Integer uType) {
  return operation(prefixedBlank(message::usersNotListed), [&] {
    Clear();
    Connection connection = open();
    connection.Execute("set nocount on");
    String statement =
        "select      u.userId , u.userName , u.userLogin , u.userPwd , u.mobilePhone ,   u.email , u.isAbstract , "
        "     u.deptId , d.deptName , d.fullName  ,   u.useSms , u.useKey , accstate , lockDate "
        "     , u.uType   ,   u.domain , "
        "     j1 = j1.jobId , j2 = j2.jobId , j3 = j3.jobId , j4 = j4.jobId "
        "     , u.company , u.address , u.zipcode , u.telephone , u.isouter , u.ldDn "
        "     , u.PwdNoChange "
        "     , u.useOTPAuth "
        "     , u.OTPTokenId "
        " from users u , departments d , userJob j1 , userJob j2 , userJob j3 , userJob j4 "
        " where u.deptId=d.deptId"
        "     and j1.jobId=1 and u.userId*=j1.userId"
        "     and j2.jobId=2 and u.userId*=j2.userId"
        "     and j3.jobId=3 and u.userId*=j3.userId"
        "     and j4.jobId=4 and u.userId*=j4.userId";
    if (!deptId.empty()) statement += " and d.deptNo=<deptNo>";
    if (roleId != 0) {
      statement +=
          " and ("
          "    u.userId in (select userId from userJob where jobId in (select jobId from jobs where roleId=<roleId>))"
          " or u.userId in (select gu.userid from grpUser gu ,grpRole gr where gr.roleid=<roleId> and gr.gid=gu.gid))";
    }
    if (noBuiltIn) statement += " and u.isAbstract=0";
    if (grpId == 0) statement += " and u.userId not in (select userId from grpUser)";
    if (grpId != 0 && grpId != -1) {
      statement += " and u.userId in (select userId from grpUser where gId=" + text(grpId) + ")";
    }
    if (uType != -1) statement += " and u.uType=" + text(uType);
    statement +=
        " and(u.accstate=0 or u.accstate=1)"
        " order by username ";
    Recordset row = connection.Execute(sql(statement).number("roleId", roleId).text("deptNo", deptId));
    // All rows first, then the groups of each on the same connection.
    for (row.ActiveConnection(nullptr); !row.EOF_(); row.MoveNext()) {
      auto user = listedUser(row);
      user->dn(row["ldDn"].asText());
      user->readGroups(connection, "ItemGroups");
      connectAlike(*user);
      add(user, user->Name());
    }
    return true;
  });
}

std::shared_ptr<User> Users::listedUser(Recordset& row) const {
  auto user = std::make_shared<User>();
  user->Id(row["userId"].asLong());
  user->readAccount(row);
  user->builtIn_ = row["isAbstract"].asBoolean();
  // Lists tell a lock, no other state.
  user->regState(row["accstate"].isOne() ? accountLocked : accountNormal);
  user->deptId(row["deptId"].asText());
  user->isUser_ = true;
  user->isAdministrator_ = !row["j1"].isNull();
  user->isDesigner_ = !row["j2"].isNull();
  user->isOwner_ = !row["j3"].isNull();
  user->isDeptadmin_ = !row["j4"].isNull();
  return user;
}

}  // namespace QVSa
