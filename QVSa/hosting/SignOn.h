#pragma once

#include "QVSa/identity/User.h"

namespace QVSa {

// The sign-on of a host that people reach: User::loginAuth, one attempt at a login at a time on the whole installation,
// so that the count of failed sign-ons and the lock hold against guesses that come at once; repeated where two sign-ons
// collide over the number of their session.
//   SignOn entrance;  entrance.connect(server, "QVApp");
//   if (entrance.signOn("ann", password) && !entrance.sessionId().empty()) greet(entrance.user().Name());
// It costs one more connection with an open transaction (of no writes) during the attempt, and two short statements.
// Who guesses at a login makes its owner wait, for as long as `patience` says. As loginAuth does, it goes on where the
// policy or the list of sessions can't be read: `qvsa doctor` looks at both.
class QVSA_EXPORT SignOn : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // 0, the default: a refusal tells its reason, at once. Above: an unknown login, a wrong password and an account that
  // is locked, waits for audit or was refused there all get passwordWrong (0x80040452), and each such answer, from the
  // attempt's turn on, takes this many milliseconds, or a multiple of them. Choose it longer than a sign-on takes, with
  // the directory's or the domain's answer where accounts have their passwords there.
  Long refusalTime() const { return refusalTime_; }
  void refusalTime(Long milliseconds) { refusalTime_ = milliseconds; }
  // Seconds that an attempt waits for others at the same login, 30 by default; 0x80040E31 behind them.
  Long patience() const { return patience_; }
  void patience(Long seconds) { patience_ = seconds; }

  // The arguments, the refusals and the result are those of User::loginAuth with a password in clear: True with
  // passwordExpired (0x8004045F) and an empty `sessionId` where the password has expired and only its change is
  // allowed.
  Boolean signOn(const String& loginName, const String& Pwd, Boolean authLd = false, const String& ipAddr = "",
                 const String& hostName = "");
  const String& sessionId() const { return sessionId_; }
  // Who signed on; a user without values after a refusal.
  User& user() { return user_; }

 private:
  String accountOf(Connection& connection, const String& loginName);
  Boolean isRefused(const String& loginName, const String& Pwd, Boolean authLd);

  Long refusalTime_ = 0;
  Long patience_ = 30;
  String sessionId_;
  User user_;
};

}  // namespace QVSa
