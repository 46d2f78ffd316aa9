#include <algorithm>
#include <limits>

#include "QVSa/identity/Sessions.h"
#include "QVSa/identity/User.h"
#include "QVSa/identity/internal/IpRules.h"
#include "QVSa/identity/safeRule.h"
#include "platform/SecretMessage.h"
#include "platform/Services.h"

namespace QVSa {
namespace {

// What a sign-on gives its caller, at its end and not before: the text may be the one of another argument.
class SessionId {
 public:
  explicit SessionId(String* given) : given_(given) {}
  ~SessionId() {
    if (given_ != nullptr) *given_ = std::move(value_);
  }
  SessionId(const SessionId&) = delete;
  SessionId& operator=(const SessionId&) = delete;

  void set(String value) { value_ = std::move(value); }

 private:
  String* given_;
  String value_;
};

}  // namespace

// The password stage of the load; False ends the load. A wrong password does not: it is counted here, so that the
// counter moves in one place, and loginAuth decides later what to say.
Boolean User::testPassword(Connection& connection, const String& Pwd, Boolean* wrongPwd, Boolean authLd) {
  if (uType_ == ldapUser) {
    if (!isInDirectory(connection, Pwd, authLd)) return refuse(message::notInDirectory);
    return true;
  }
  const Boolean right = uType_ == adUser ? isWindowsUser(Pwd) : Pwd_.is(Pwd);
  if (right) {
    lgts_ = 0;
    connection.Execute("update users set lgts=0 where userId=" + text(Id_));
  } else {
    countFailure(connection);
  }
  if (wrongPwd != nullptr) *wrongPwd = !right;
  return true;
}

void User::countFailure(Connection& connection) {
  ++lgts_;
  connection.Execute(
      "update u set lgts=lgts+1 from users u,saferule s"
      " where userId=" +
      text(Id_) + " and s.id=1 and s.lockErr=1");
  connection.Execute(
      "update u set accstate=1,lockdate=getdate()"
      " from users u,safeRule s"
      " where s.id=1 and s.lockErr=1"
      " and u.userId=" +
      text(Id_) +
      " and u.accstate=0"
      " and " +
      text(lgts_) + ">=s.errTimes");
}

Boolean User::loginAuth(const String& loginName, const String& Pwd, String* sI, Boolean authLd, const String& ipAddr,
                        const String& hostName, const Integer* userVerifyLevel) try {
  SessionId given(sI);
  const Integer level = userVerifyLevel == nullptr ? Integer{0} : *userVerifyLevel;
  Boolean wrongPwd = false;
  if (!GetOne(byLogin, loginName, level <= 0, Pwd, &wrongPwd, authLd)) return false;
  if (level == 1 && !digestMatches(Pwd)) wrongPwd = true;
  if (!fromPermittedAddress(ipAddr)) return refuse(message::addressNotPermitted);

  Sessions sessions;
  if (!hostName.empty() && !synLogin_) {
    if (!sessions.connect(server(), "")) return refuseAs(sessions);
    for (const auto& session : sessions) {
      // The row has its texts without trailing blanks.
      const Boolean elsewhere = session->DBName() == DBName() && session->UserLogin() == trimRight(loginName) &&
                                session->Computer() != trimRight(hostName);
      if (elsewhere) return refuse(message::signedOnElsewhere, {session->Computer()});
    }
  }

  safeRule rule;
  connectAlike(rule);
  // Where the policy can't be read, nothing of it is tested; but want of memory opens no locked account.
  const Boolean known = rule.GetOne();
  if (!known && rule.errNumber() == number::memory) return refuseAs(rule);
  if (known && isLockedOut(rule)) return refuse(message::lockedOut);
  if (wrongPwd) {
    clearRecord();
    return refuse(uType_ == adUser ? message::domainPasswordWrong : message::passwordWrong);
  }
  // The host lets the user in as far as changing the password.
  if (isExpired(rule.maxDay())) return true;

  if (!sessions.connect(server(), "")) return refuseAs(sessions);
  String id = sessions.newSession(loginName, hostName, DBName(), split(ipAddr, '|').front());
  if (id.empty()) return refuseAs(sessions);
  given.set(std::move(id));
  return true;
} catch (...) {
  return refuseButFailures();
}

Boolean User::fromPermittedAddress(const String& ipAddr) const {
  if (ipAddr.empty() || ipList_.empty()) return true;
  const std::vector<String> addresses = split(ipAddr, '|');
  return std::any_of(addresses.begin(), addresses.end(),
                     [&](const String& address) { return ipMatches(address, ipList_); });
}

// An account that waits for audit or was refused counts as locked.
Boolean User::isLockedOut(const safeRule& rule) {
  if (rule.lockErr() && lgts_ >= rule.errTimes()) regState_ = accountLocked;
  return regState_ != accountNormal;
}

// Reports the expiry and tells it by the result.
Boolean User::isExpired(Integer maxDay) {
  if (maxDay <= 0 || uType_ == adUser) return false;
  const double today = platform::services().localTime().dateOnly().days();
  const double left = pwdDate_.dateOnly().days() + maxDay - today;
  // A date far off must not make a sign-on fail.
  validDay_ = static_cast<Integer>(
      std::clamp<double>(left, std::numeric_limits<Integer>::min(), std::numeric_limits<Integer>::max()));
  if (validDay_ > 0) return false;
  note(message::passwordExpired);
  return true;
}

Boolean User::digestMatches(const String& digest) const {
  return Pwd_.isReadable() && upperCase(digest) == upperCase(platform::md5Hex(Pwd_.text()));
}

Boolean User::loginAuth_1(const String& loginName, const String& pwdMd5) try {
  if (!GetOne(byLogin, loginName)) return false;
  if (!digestMatches(pwdMd5)) return refuse(message::passwordWrong);
  return true;
} catch (...) {
  return refuseButFailures();
}

Boolean User::chgPwd(const String& oldPwd, const String& newPwd) {
  return operation(plain(), [&]() -> Boolean {
    if (!isStored_ || !Pwd_.is(oldPwd)) return refuse(message::oldPasswordWrong);
    Integer cycle = 0;
    if (!passesPolicy(newPwd, cycle)) return false;
    if (pwdUsedBefore(cycle, newPwd)) return refuse(message::passwordUsedBefore, {cycle});

    writePwd(newPwd);
    Pwd_ = StoredPassword(newPwd);
    if (cycle > 0) pushPwdHistory(cycle);
    return true;
  });
}

void User::writePwd(const String& newPwd) {
  Connection connection = open();
  connection.Execute("set nocount on");
  connection.Execute(sql("update users set "
                         "userPwd=<pwd>,pwddate=getdate() "
                         " where userId=" +
                         text(Id_))
                         .secret("pwd", platform::encryptText(newPwd, storedName_)));
}

Boolean User::chkRegPwd(const String&) { return true; }

Boolean User::RecordAction(Long, const String&, String&) { return false; }

}  // namespace QVSa
