#include "QVSa/organisation/userGroups.h"

namespace QVSa {

std::shared_ptr<userGroup> userGroups::Add(const String& Name) {
  auto group = std::make_shared<userGroup>();
  group->Name(Name);
  connectAlike(*group);
  add(group, Name);
  return group;
}

Boolean userGroups::GetAll() {
  return operation(prefixedBlank(message::groupsNotListed), [&] {
    clearItems();
    Connection connection = open();
    connection.Execute("set nocount on");
    for (Recordset row = connection.Execute("select gId,gName from ItemGroups"); !row.EOF_(); row.MoveNext()) {
      auto group = std::make_shared<userGroup>();
      connectAlike(*group);
      // A group that can't be read stands in the list all the same, without its values.
      group->GetOne(userGroup::byId, row["gId"].Value());
      add(group, row["gName"].asText());
    }
    return true;
  });
}

}  // namespace QVSa
