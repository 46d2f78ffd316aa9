#include "QVSa/organisation/Users.h"

#include "QVSa/resources/Messages.h"

namespace QVSa {
namespace {

// One number token fills both places: the department itself, and its id between two dots of a path.
const char* const subtree =
    " and ( u.deptid = <deptID> Or charindex( '."
    "<deptID>"
    ".' , d.path ) > 0 ) ";

}  // namespace

Users::Users()
    : listCaptions_{
          "userid",           LoadResString(1136), LoadResString(1137), LoadResString(1138), LoadResString(1139),
          LoadResString(1140)} {}

std::shared_ptr<User> Users::Add(const String& Name, const String& Login, Long Id, const String& Pwd,
                                 const String& MobilePhone, const String& Email, const String& deptId,
                                 const String& deptName, const String& deptFullName, Boolean, Boolean,
                                 Boolean PwdNoChange) {
  auto user = connected();
  user->Id(Id);
  user->Name(Name);
  user->Login(Login);
  user->Pwd(Pwd);
  user->MobilePhone(MobilePhone);
  user->Email(Email);
  user->deptId(deptId);
  user->deptName_ = deptName;
  user->deptFullName_ = deptFullName;
  user->PwdNoChange(PwdNoChange);
  add(user, Name);
  return user;
}

Variant Users::Clear() {
  clearItems();
  return {};
}

Boolean Users::GetAllOfTheDept(Long deptId) {
  return operation(prefixedBlank(message::usersNotListed), [&] {
    Clear();
    Connection connection = open();
    String statement =
        "select u.userid , u.userName , d.fullName from users u , departments d "
        " where u.deptId = d.deptId ";
    if (deptId > 0) statement += subtree;
    statement += " order by userName ";
    Recordset row = connection.Execute(sql(statement).number("deptID", deptId));
    for (; !row.EOF_(); row.MoveNext()) {
      auto user = connected();
      user->Id(row["userid"].asLong());
      user->Name(row["userName"].asText());
      user->deptFullName_ = row["fullName"].asText();
      add(user, user->Name());
    }
    return true;
  });
}

Boolean Users::GetAllOfTheDeptAndRole(Long deptId, const String& roleName) {
  return operation(prefixedBlank(message::usersNotListed), [&] {
    Clear();
    Connection connection = open();
    String statement =
        "select u.userid , u.userName , d.fullName , r.roleName , d.deptId , d.deptName"
        " from users u , departments d , v_userRole r "
        " where u.deptId = d.deptId and u.userId = r.userId";
    if (deptId > 0) statement += subtree;
    if (!roleName.empty()) statement += " and (r.roleName=<roleName>) ";
    statement += " order by u.userName ";
    Recordset row = connection.Execute(sql(statement).number("deptID", deptId).text("roleName", roleName));
    for (; !row.EOF_(); row.MoveNext()) {
      auto user = connected();
      user->Id(row["userid"].asLong());
      user->Name(row["userName"].asText());
      user->deptFullName_ = row["fullName"].asText();
      user->deptInnerId(row["deptId"].asLong());
      user->deptName_ = row["deptName"].asText();
      // Who has several roles has several rows: the first one stands.
      addIfNew(user, user->Name());
    }
    return true;
  });
}

Boolean Users::getAllForSelUser(const String& Jobs, Long userId, Integer isSameOrg) {
  return operation(prefixedBlank(message::usersNotListed), [&] {
    Clear();
    Connection connection = open();
    String statement =
        "select u.userid, u.userName,u.deptId,d.deptName, d.deptfullName "
        " from users u, QV_v_DeptOrg_1 d "
        " where u.deptId = d.deptId ";
    if (!Jobs.empty()) {
      statement += "   and exists (select * from userJob uj where uj.jobID in (<jobs>) and u.userId = uj.userId) ";
    }
    if (isSameOrg == 1) {
      statement +=
          " and exists (select * from users thisU, QV_v_DeptOrg_1 thisD where thisU.userId=<userid> and thisU.deptId = "
          "thisD.deptId and d.orgId = thisD.orgId )";
    }
    if (isSameOrg == 2) {
      statement +=
          " and exists (select * from users thisU, QV_v_DeptOrg_1 thisD where thisU.userId=<userid> and thisU.deptId = "
          "thisD.deptId and d.deptId = thisD.deptId )";
    }
    statement += " order by u.userName ";
    Recordset row = connection.Execute(sql(statement).list("jobs", Jobs).number("userid", userId));
    for (; !row.EOF_(); row.MoveNext()) {
      auto user = connected();
      user->Id(row["userid"].asLong());
      user->Name(row["userName"].asText());
      user->deptId(row["deptId"].asText());
      user->deptName_ = row["deptName"].asText();
      user->deptFullName_ = row["deptfullName"].asText();
      add(user, user->Name());
    }
    return true;
  });
}

Long Users::GetList(Long deptId) {
  return operation(prefixedBlank(message::usersNotListed), Long{-1}, [&](Long& result) {
    Connection connection;
    connection.CursorLocation(adUseClient);
    connection.Open(connectionString());
    connection.Execute("set nocount on");
    const auto& c = listCaptions_;
    String statement = "select '' , u.userid as " + c[0] + " , u.userName as " + c[1] + ", u.userLogin as " + c[2] +
                       ", d.deptName as " + c[3] + ", case u.isAbstract when 1 then '" + LoadResString(1134) +
                       "' else '' end as " + c[4] + ", case u.accState when 0 then '' when 1 then '" +
                       LoadResString(1135) + "' when 2 then '' end as " + c[5] +
                       " from users u , departments d "
                       " where u.deptId = d.deptId ";
    if (deptId > 0) statement += subtree;
    if (listRecordset_.State() == 1) listRecordset_.Close();
    listRecordset_.CursorType(adOpenStatic);
    listRecordset_.LockType(adLockOptimistic);
    listRecordset_.Open(sql(statement).number("deptID", deptId), connection);
    listRecordset_.ActiveConnection(nullptr);
    result = listRecordset_.RecordCount();
  });
}

Recordset& Users::GetDataMember(const String&) { return listRecordset_; }

std::shared_ptr<User> Users::connected() const {
  auto user = std::make_shared<User>();
  connectAlike(*user);
  return user;
}

}  // namespace QVSa
