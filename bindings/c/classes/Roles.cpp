#include "QVSa/organisation/Roles.h"

#include "QVSa/organisation/Role.h"
#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<Roles>& roles) {
  roles.readOnly("errNumber", &Roles::errNumber)
      .readOnly("errDescription", &Roles::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &Roles::connect, failsWith(false))
      .operation("Remove", {"Index"}, &Roles::Remove)
      .operation("Add", {"Id", "Name"}, &Roles::Add)
      .operation("GetAll", {}, &Roles::GetAll, failsWith(false))
      .operation("Count", {}, &Roles::Count)
      .operation("Item", {"Index"}, &Roles::Item)
      .items<Role>();
}

}  // namespace QVSa::binding
