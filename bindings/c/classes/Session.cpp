#include "QVSa/identity/Session.h"

#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<Session>& session) {
  session.readOnly("SessionId", &Session::SessionId)
      .readOnly("UserLogin", &Session::UserLogin)
      .readOnly("ip", &Session::ip)
      .readOnly("Computer", &Session::Computer)
      .readOnly("BeginTime", &Session::BeginTime)
      .readOnly("DBName", &Session::DBName)
      .readOnly("ModuName", &Session::ModuName)
      .readOnly("LastActTime", &Session::LastActTime);
}

}  // namespace QVSa::binding
