#include "QVSa/identity/User.h"

#include "QVSa/organisation/Department.h"
#include "QVSa/organisation/Users.h"
#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<User>& user) {
  user.property<Long>("Id", &User::Id, &User::Id)
      .property<String>("Name", &User::Name, &User::Name)
      .property<String>("Login", &User::Login, &User::Login)
      .writeOnly("Pwd", &User::Pwd)
      .property<String>("MobilePhone", &User::MobilePhone, &User::MobilePhone)
      .property<String>("Email", &User::Email, &User::Email)
      .readOnly("builtIn", &User::builtIn)
      .property<Boolean>("sendSms", &User::sendSms, &User::sendSms)
      .property<Boolean>("keyLogin", &User::keyLogin, &User::keyLogin)
      .property<Integer>("regState", &User::regState, &User::regState)
      .readOnly("locked", &User::locked)
      .property<Integer>("uType", &User::uType, &User::uType)
      .property<String>("Domain", &User::Domain, &User::Domain)
      .property<String>("company", &User::company, &User::company)
      .property<String>("Address", &User::Address, &User::Address)
      .property<String>("zipcode", &User::zipcode, &User::zipcode)
      .property<String>("telePhone", &User::telePhone, &User::telePhone)
      .property<Boolean>("isOuter", &User::isOuter, &User::isOuter)
      .property<String>("dn", &User::dn, &User::dn)
      .property<String>("ipList", &User::ipList, &User::ipList)
      .property<Boolean>("synLogin", &User::synLogin, &User::synLogin)
      .property<Boolean>("PwdNoChange", &User::PwdNoChange, &User::PwdNoChange)
      .property<Boolean>("useOTPAuth", &User::useOTPAuth, &User::useOTPAuth)
      .property<String>("OTPTokenId", &User::OTPTokenId, &User::OTPTokenId)
      .property<Long>("deptInnerId", &User::deptInnerId, &User::deptInnerId)
      .property<String>("deptId", &User::deptId, &User::deptId)
      .readOnly("deptName", &User::deptName)
      .readOnly("deptFullName", &User::deptFullName)
      .readOnly("orgId", &User::orgId)
      .readOnly("orgName", &User::orgName)
      .readOnly("orgFullName", &User::orgFullName)
      .property<String>("grpName", &User::grpName, &User::grpName)
      .property<String>("RegUserDesc", &User::RegUserDesc, &User::RegUserDesc)
      .readOnly("isAdministrator", &User::isAdministrator)
      .readOnly("isDesigner", &User::isDesigner)
      .readOnly("isDeptadmin", &User::isDeptadmin)
      .readOnly("isProcAdmin", &User::isProcAdmin)
      .readOnly("isNoticeAdmin", &User::isNoticeAdmin)
      .readOnly("isOwner", &User::isOwner)
      .readOnly("isUser", &User::isUser)
      .readOnly("validDay", &User::validDay)
      .readOnly("errNumber", &User::errNumber)
      .readOnly("errDescription", &User::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &User::connect, failsWith(false))
      .operation("GetOne",
                 {"keyName", "keyValue", optional("chkPwd", false), optional("Pwd", ""), "wrongPwd",
                  optional("authLd", false)},
                 &User::GetOne, failsWith(false))
      .operation("Save", {optional("passPwdCheck", false)}, &User::Save, failsWith(false))
      .operation("Delete", {optional("Id", 0)}, &User::Delete, failsWith(false))
      .operation("setJobs", {"jobList"}, &User::setJobs, failsWith(false))
      .operation("setDept", {"dept"}, &User::setDept, failsWith(false))
      .operation("loginAuth",
                 {"loginName", "Pwd", "sI", optional("authLd", false), optional("ipAddr", ""), optional("hostName", ""),
                  "userVerifyLevel"},
                 &User::loginAuth, failsWith(false))
      .operation("loginAuth_1", {"loginName", "pwdMd5"}, &User::loginAuth_1, failsWith(false))
      .operation("chgPwd", {"oldPwd", "newPwd"}, &User::chgPwd, failsWith(false))
      .operation("setManager", {"flag", optional("jobId", 0), optional("userId", 0)}, &User::setManager,
                 failsWith(false))
      .operation("getManager", {"flag", "jobId", "userId"}, &User::getManager, failsWith(false))
      .operation("getSubUsers", {}, &User::getSubUsers, failsWithNothing())
      .operation("Reg", {optional("deptName", ""), optional("desc", "")}, &User::Reg, failsWith(false))
      .operation("regAudit", {"pass", optional("desc", ""), optional("userId", 0)}, &User::regAudit, failsWith(false))
      .operation("chkRegPwd", {"Pwd"}, &User::chkRegPwd)
      .operation("RecordAction", {"uid", "sId", input("s")}, &User::RecordAction)
      .enumeration("userTypes",
                   {{"Genaral", Genaral}, {"adUser", adUser}, {"autoReg", autoReg}, {"ldapUser", ldapUser}})
      .enumeration("AccountState", {{"accountNormal", accountNormal},
                                    {"accountLocked", accountLocked},
                                    {"accountWaiting", accountWaiting},
                                    {"accountRefused", accountRefused}})
      .enumeration("UserKey", {{"byId", User::byId}, {"byName", User::byName}, {"byLogin", User::byLogin}});
}

}  // namespace QVSa::binding
