#include "QVSa/organisation/userGroups.h"

#include "QVSa/organisation/userGroup.h"
#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<userGroups>& groups) {
  groups.readOnly("errNumber", &userGroups::errNumber)
      .readOnly("errDescription", &userGroups::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &userGroups::connect, failsWith(false))
      .operation("Remove", {"Index"}, &userGroups::Remove)
      .operation("Add", {"Name"}, &userGroups::Add)
      .operation("GetAll", {}, &userGroups::GetAll, failsWith(false))
      .operation("Count", {}, &userGroups::Count)
      .operation("Item", {"Index"}, &userGroups::Item)
      .items<userGroup>();
}

}  // namespace QVSa::binding
