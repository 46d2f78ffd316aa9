#include "QVSa/hosting/SignOn.h"

#include <thread>

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/hosting/Collisions.h"
#include "QVSa/hosting/internal/ApplicationLock.h"

namespace QVSa {

namespace {

using std::chrono::steady_clock;

// The end of the unit of time that is running.
steady_clock::time_point endOfUnit(steady_clock::time_point start, std::chrono::milliseconds unit) {
  return start + unit * ((steady_clock::now() - start) / unit + 1);
}

}  // namespace

Boolean SignOn::signOn(const String& loginName, const String& Pwd, Boolean authLd, const String& ipAddr,
                       const String& hostName) {
  constexpr Integer passwordIsTested = 0, passwordWasTested = 2;
  sessionId_.clear();
  user_ = User();
  user_.connect(server(), DBName());
  return operation(plain(), [&]() -> Boolean {
    Connection connection;
    connection.Open(buildConnString(server(), "", false));
    const String account = accountOf(connection, loginName);
    const ApplicationLock turn(std::move(connection), "sign-on of " + account, patience_);
    const auto start = steady_clock::now();
    const Boolean hidesReasons = refusalTime_ > 0;
    if (hidesReasons && isRefused(loginName, Pwd, authLd)) {
      user_ = User();
      // Within the turn: who waits for it must not see how long the attempt before took.
      std::this_thread::sleep_until(endOfUnit(start, std::chrono::milliseconds(refusalTime_)));
      return refuse(message::passwordWrong);
    }
    const Integer level = hidesReasons ? passwordWasTested : passwordIsTested;
    const Boolean done = repeatCollided(
        user_, [&] { return user_.loginAuth(loginName, Pwd, &sessionId_, authLd, ipAddr, hostName, &level); });
    if (!done || sessionId_.empty()) note(user_.errNumber(), user_.errDescription());
    if (!done) user_ = User();
    return done;
  });
}

// Whatever spellings of a login the server takes for one, they are one account. An unknown login waits for its turn as
// a known one does.
String SignOn::accountOf(Connection& connection, const String& loginName) {
  Recordset row = connection.Execute(
      sql("select userId from users where isRole=0 and userLogin=<userLogin>").text("userLogin", loginName));
  return row.EOF_() ? "nobody " + lowerCase(trimRight(loginName)) : "user " + row[0].asText();
}

// Tests the password, which moves the count and may lock the account.
Boolean SignOn::isRefused(const String& loginName, const String& Pwd, Boolean authLd) {
  Boolean wrongPwd = false;
  if (user_.GetOne(User::byLogin, loginName, true, Pwd, &wrongPwd, authLd))
    return wrongPwd || user_.regState() != accountNormal;
  for (const Long unknown : {messageNumber(message::userUnknown), messageNumber(message::notInDirectory)})
    if (user_.errNumber() == unknown) return true;
  throw Failure(user_.errNumber(), "SignOn", user_.errDescription());
}

}  // namespace QVSa
