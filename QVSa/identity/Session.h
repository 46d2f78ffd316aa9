#pragma once

#include "QVSa/values/Values.h"

namespace QVSa {

// One signed-on session, as Sessions::GetAll read it. All values are texts, the times in the default form of a date;
// what the row does not hold is empty.
class QVSA_EXPORT Session {
 public:
  const String& SessionId() const { return SessionId_; }
  const String& UserLogin() const { return UserLogin_; }
  // The address that the host named at sign-on.
  const String& ip() const { return ip_; }
  const String& Computer() const { return Computer_; }
  const String& BeginTime() const { return BeginTime_; }
  // The application database that the session works on.
  const String& DBName() const { return DBName_; }
  const String& ModuName() const { return ModuName_; }
  const String& LastActTime() const { return LastActTime_; }

 private:
  friend class Sessions;

  String SessionId_;
  String UserLogin_;
  String ip_;
  String Computer_;
  String BeginTime_;
  String DBName_;
  String ModuName_;
  String LastActTime_;
};

}  // namespace QVSa
