#include "QVSa/identity/User.h"

namespace QVSa {
namespace {

String condition(Integer keyName) {
  switch (keyName) {
    case User::byId:
      return " and userId=<userId>";
    case User::byName:
      return " and userName=<userName>";
    case User::byLogin:
      return " and userLogin=<userLogin>";
    default:
      return " and 1=2";
  }
}

}  // namespace

// What the search for the organisation needs of the department's row.
struct User::Residence {
  Boolean isOrg;
  String path;
};

void User::Id(Long value) {
  if (idGiven_) return;
  idGiven_ = true;
  Id_ = value;
}

void User::Pwd(const String& value) {
  pwdChanged_ = !Pwd_.is(value);
  Pwd_ = StoredPassword(value);
}

Boolean User::setJobs(const String& jobList) {
  jobList_ = jobList;
  return true;
}

Boolean User::GetOne(Integer keyName, const Variant& keyValue, Boolean chkPwd, const String& Pwd, Boolean* wrongPwd,
                     Boolean authLd) {
  return operation(plain(), [&] {
    clearRecord();
    Connection connection = open();
    connection.Execute("set nocount on");
    Residence residence;
    {
      Recordset row =
          connection.Execute(sql("select u.userId,u.userName,u.userLogin,u.userPwd,u.mobilePhone,u.email,u.isAbstract,"
                                 "u.deptId,u.useSms,u.useKey,u.accstate,u.pwdDate,u.lgts"
                                 ",u.uType,u.domain"
                                 ",d.deptName,d.fullName,d.isOrg,d.superDept,d.deptNo,d.path"
                                 ",u.company,u.address,u.zipcode,u.telephone,u.isouter"
                                 ",u.ldsName,u.ldDn,u.ipList,u.synLogin"
                                 " , u.PwdNoChange "
                                 " , u.useOTPAuth "
                                 " , u.OTPTokenId "
                                 " from users u , departments d "
                                 " where u.isRole = 0 "
                                 "     and u.deptId = d.deptId " +
                                 condition(keyName))
                                 .number("userId", keyValue)
                                 .text("userName", keyValue)
                                 .text("userLogin", keyValue));
      if (row.EOF_()) fail("User", message::userUnknown);
      read(row);
      residence = {row["isOrg"].isOne(), row["path"].asText()};
    }
    findOrganisation(connection, residence);
    if (chkPwd && !testPassword(connection, Pwd, wrongPwd, authLd)) return false;
    readRoles(connection);
    readGroups(connection, "itemGroups");
    isUser_ = isStored_ = true;
    return true;
  });
}

void User::clearRecord() {
  for (String* value : {&Name_, &Login_, &MobilePhone_, &Email_, &deptId_, &deptName_, &deptFullName_, &orgId_,
                        &orgName_, &orgFullName_, &Domain_}) {
    value->clear();
  }
  Pwd_ = StoredPassword();
  isStored_ = false;
  clearRoles();
  validDay_ = -1;
}

void User::clearRoles() {
  isAdministrator_ = isDesigner_ = isDeptadmin_ = isProcAdmin_ = isNoticeAdmin_ = isOwner_ = false;
}

void User::read(Recordset& row) {
  Id_ = row["userId"].asLong();
  readAccount(row);
  readFurther(row);
  storedName_ = Name_;
  Pwd_ = StoredPassword::read(row["userPwd"].asText(), storedName_);
  builtIn_ = row["isAbstract"].isOne();
  deptInnerId_ = row["deptId"].asLong();
  regState_ = row["accstate"].asInteger();
  pwdDate_ = row["pwdDate"].asDate();
  lgts_ = row["lgts"].asLong();
  deptId_ = row["deptNo"].asText();
}

void User::findOrganisation(Connection& connection, const Residence& residence) {
  if (residence.isOrg) {
    orgId_ = deptId_;
    orgName_ = deptName_;
    orgFullName_ = deptFullName_;
    return;
  }
  Recordset row = connection.Execute(sql("select deptId,deptName,fullName,deptNo from departments"
                                         " where (<myPath> like '%'+path+'%'"
                                         " and isOrg=1 and deptId<><deptId>)"
                                         " or deptNo='_root'"
                                         " order by path desc")
                                         .text("myPath", residence.path)
                                         .number("deptId", deptInnerId_));
  if (row.EOF_()) return;
  orgId_ = row["deptNo"].asText();
  orgName_ = row["deptName"].asText();
  orgFullName_ = row["fullName"].asText();
}

void User::readRoles(Connection& connection) {
  static const std::pair<const char*, Boolean User::*> builtInRoles[] = {
      {"Administrators", &User::isAdministrator_}, {"Report Designers", &User::isDesigner_},
      {"Dept Admin", &User::isDeptadmin_},         {"Process Admin", &User::isProcAdmin_},
      {"Notice Admin", &User::isNoticeAdmin_},     {"Report Owners", &User::isOwner_}};
  clearRoles();
  Recordset row = connection.Execute(
      "select r.roleName from userJob uj,jobs j,roles r"
      " where uj.userId=" +
      text(Id_) + " and uj.jobId=j.jobId and j.roleId=r.roleId and r.builtIn=1");
  for (; !row.EOF_(); row.MoveNext()) {
    const String roleName = row["roleName"].asText();
    for (const auto& [name, flag] : builtInRoles) {
      if (roleName == name) this->*flag = true;
    }
  }
}

void User::readGroups(Connection& connection, const String& table) {
  std::vector<String> names;
  Recordset row = connection.Execute("select g.gName from " + table +
                                     " g,grpUser x"
                                     " where x.userId=" +
                                     text(Id_) + " and x.gId=g.gId");
  for (; !row.EOF_(); row.MoveNext()) names.push_back(row["gName"].asText());
  grpName_ = join(names, ",");
}

Boolean User::Delete(Long Id) {
  return operation(prefixedBlank(message::userNotDeleted), [&] {
    const Long id = Id == 0 ? Id_ : Id;
    Connection connection = open();
    connection.Execute("set nocount on");
    connection.BeginTrans();
    connection.Execute("delete from grpUser where userId=" + text(id));
    connection.Execute(sql(" delete from agentuser where agentuserid = <ID>").text("ID", id));
    connection.Execute("delete from users where userId=" + text(id));
    connection.CommitTrans();
    return true;
  });
}

}  // namespace QVSa
