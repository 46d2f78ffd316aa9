#include <optional>

#include "QVSa/identity/User.h"
#include "QVSa/identity/safeRule.h"

namespace QVSa {

Boolean User::Save(Boolean passPwdCheck) {
  return operation(plain(), [&]() -> Boolean {
    Integer cycle = 0;
    if (uType_ == Genaral && !passPwdCheck && !passesPolicy(Pwd_.text(), cycle)) return false;
    if (Id_ != 0) {
      // Also where the password is the old one: callers that leave it alone pass `passPwdCheck`.
      if (pwdUsedBefore(cycle)) return refuse(message::passwordUsedBefore);
      if (!updateUser()) return false;
    } else if (!insertUser()) {
      return false;
    }
    if (cycle > 0 && pwdChanged_) {
      pushPwdHistory(cycle);
      pwdChanged_ = false;
    }
    return true;
  });
}

Boolean User::passesPolicy(const String& password, Integer& cycle) {
  safeRule rule;
  connectAlike(rule);
  if (!rule.GetOne() || !rule.checkPwd(password)) return refuseAs(rule);
  cycle = rule.cycle();
  return true;
}

// The name is stored without its trailing blanks, and a password is read under the name as it is stored.
String User::storedPwd() const { return Pwd_.encrypted(trimRight(Name_)); }

void User::noteStored(String name) {
  storedName_ = std::move(name);
  isStored_ = true;
}

Boolean User::insertUser() {
  if (Name_.empty() || Login_.empty()) return refuse(message::userIncomplete);
  Connection connection = open();
  connection.Execute("set nocount on");
  findDepartment(connection);
  connection.BeginTrans();
  insertRow(connection);
  const Long id = insertedId(connection);
  if (!jobList_.empty()) {
    connection.Execute(sql("insert into userJob(userId,jobId)"
                           " select userId,jobId from users u,jobs j"
                           " where u.userName=<userName> and u.isRole=0"
                           " and jobId in (<jobList>)")
                           .text("userName", Name_)
                           .raw("jobList", jobList_));
  }
  saveGroup(connection, id);
  // Behind the commit nothing may fail, want of memory neither.
  String stored = trimRight(Name_);
  connection.CommitTrans();
  // Not before: where the row is rolled back, another user may get its number.
  Id_ = id;
  noteStored(std::move(stored));
  return true;
}

Long User::insertedId(Connection& connection) {
  Recordset row = connection.Execute("select scope_identity()");
  if (row.EOF_()) fail("User", message::rowNotAdded);
  return row[0].asLong();
}

void User::findDepartment(Connection& connection) {
  if (deptId_.empty()) deptId_ = "_root";
  if (deptInnerId_ != 0) return;
  Recordset row = connection.Execute(sql("select * from departments where deptNo=<deptNo>").text("deptNo", deptId_));
  deptInnerId_ = row["deptId"].asLong();
  deptName_ = row["deptName"].asText();
  deptFullName_ = row["fullName"].asText();
}

void User::insertRow(Connection& connection) {
  connection.Execute(
      withColumns(sql(" insert into users "
                      "( userName , userLogin , userPwd , deptId , mobilePhone , email , isAbstract , "
                      " isRole , useSms , useKey , company , address , zipcode , Telephone , isOuter , accState "
                      " , PwdNoChange "
                      " , useOTPAuth "
                      " , OTPTokenId "
                      " , uType , Domain , ldsName , ldDn , ipList , synLogin ) "
                      " values( <userName> , <userLogin> , <userPwd> , "
                      "         <deptId> , <mobilePhone> , <email> , 0 , 0 , <useSms> , <useKey> , "
                      "         <company> , <address> , <zipcode> , <Telephone> , <isOuter> , <accState> , "
                      "         <PwdNoChange> , "
                      "         <useOTPAuth> , "
                      "         <OTPTokenId> , "
                      "         <uType> , <domain> , <ldsName> , <ldDn> , <ipList> , <synLogin> "
                      ")"))
          .number("deptId", deptInnerId_)
          .number("accState", regState_)
          .secret("userPwd", storedPwd())
          .text("userLogin", Login_)
          .text("userName", Name_));
}

Boolean User::updateUser() {
  if (Name_.empty() || Login_.empty()) return refuse(message::userIncomplete);
  Connection connection = open();
  connection.Execute("set nocount on");
  connection.BeginTrans();
  // Saving a locked account unlocks it. One that waits for audit, or was refused there, stays what it is.
  const Integer state = locked() ? Integer{accountNormal} : regState_;
  updateRow(connection, state);
  if (!builtIn_) {
    connection.Execute("delete from userjob where userId=" + text(Id_));
    if (!jobList_.empty()) {
      connection.Execute(
          "insert into userJob(userId,jobId) "
          " select " +
          text(Id_) + ",jobId from jobs where jobId in (" + jobList_ + ")");
    }
  }
  saveGroup(connection, Id_);
  String stored = trimRight(Name_);
  connection.CommitTrans();
  regState_ = state;
  noteStored(std::move(stored));
  return true;
}

// Writes the password at every save, as it is stored under the name. Leaves the account's type and domain alone.
void User::updateRow(Connection& connection, Integer state) {
  connection.Execute(withColumns(sql("update users set "
                                     "userName=<userName>"
                                     ",userLogin=<userLogin>"
                                     ",userPwd=<userPwd>"
                                     ",deptId=<deptId>"
                                     ",mobilePhone=<mobilePhone>"
                                     ",email=<email>"
                                     ",company=<company>"
                                     ",address=<address>"
                                     ",zipcode=<zipcode>"
                                     ",Telephone=<Telephone>"
                                     ",isOuter=<isOuter>"
                                     ",useSms=" +
                                     text(Long{sendSms_}) + ",useKey=" + text(Long{keyLogin_}) +
                                     ",accstate=<accstate>,pwdDate=getdate(),lockDate=null"
                                     ",ldsName=<ldsName>,ldDn=<ldDn>"
                                     ",ipList=<ipList>,synLogin=<synLogin>"
                                     " , PwdNoChange = <PwdNoChange> "
                                     " , useOTPAuth = <useOTPAuth> "
                                     " , OTPTokenId = <OTPTokenId> "
                                     " where userId=" +
                                     text(Id_)))
                         .number("deptId", deptInnerId_)
                         .number("accstate", state)
                         .secret("userPwd", storedPwd())
                         .text("userLogin", Login_)
                         .text("userName", Name_));
}

void User::saveGroup(Connection& connection, Long id) {
  connection.Execute("delete from grpUser where userId=" + text(id));
  if (grpName_.empty()) return;
  connection.Execute(sql("insert into grpUser(userId,gId)"
                         " select " +
                         text(id) +
                         ", gId from ItemGroups"
                         " where gName=<grpName>")
                         .text("grpName", grpName_));
}

Boolean User::pwdUsedBefore(Integer cycle, const String& Pwd) {
  const StoredPassword password = Pwd.empty() ? Pwd_ : StoredPassword(Pwd);
  // The present name is that of the row, or the one that a save is about to store.
  const String name = Name_ == storedName_ ? storedName_ : trimRight(Name_);
  Connection connection = open();
  Recordset row = connection.Execute("select top " + text(cycle) +
                                     " isnull(pwd,''),creDate from userPwdHis"
                                     " where userId=" +
                                     text(Id_) + " order by creDate desc");
  for (; !row.EOF_(); row.MoveNext()) {
    // Kept under the name of its time: after a change of name it no longer reads, and so no longer counts.
    const auto earlier = StoredPassword::read(row[0].asText(), name);
    if (earlier.isReadable() && password.is(earlier.text())) return true;
  }
  return false;
}

// Keeps the newest `cycle` passwords, the present one among them.
void User::pushPwdHistory(Integer cycle) {
  Connection connection = open();
  std::optional<Date> oldest;
  {
    Recordset row = connection.Execute("select top " + text(cycle - 1) +
                                       " creDate from userPwdHis"
                                       " where userId=" +
                                       text(Id_) + " order by creDate Desc");
    for (; !row.EOF_(); row.MoveNext()) oldest = row["creDate"].asDate();
  }
  if (oldest) {
    connection.Execute("delete from userPwdHis where userId=" + text(Id_) + " and creDate<'" + oldest->sqlText() + "'");
  }
  connection.Execute(
      "insert into userPwdHis(userId,creDate,pwd)"
      " select userId,pwdDate,userPwd from users"
      " where userId=" +
      text(Id_));
}

}  // namespace QVSa
