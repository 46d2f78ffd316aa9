#include "QVSa/identity/Sessions.h"

#include "QVSa/identity/Session.h"
#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<Sessions>& sessions) {
  sessions.readOnly("errNumber", &Sessions::errNumber)
      .readOnly("errDescription", &Sessions::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &Sessions::connect, failsWith(false))
      .operation("Count", {}, &Sessions::Count)
      .operation("Item", {"Index"}, &Sessions::Item)
      .operation("Remove", {"Index"}, &Sessions::Remove)
      .operation("GetAll", {}, &Sessions::GetAll, failsWith(false))
      .operation("Terminate", {"SessionId"}, &Sessions::Terminate, failsWith(false))
      .operation("newAction", {"Id", "server", input("uid"), "computerName", "app"}, &Sessions::newAction)
      .items<Session>();
}

}  // namespace QVSa::binding
