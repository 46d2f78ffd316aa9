#include "QVSa/organisation/Roles.h"

namespace QVSa {

std::shared_ptr<Role> Roles::Add(Long Id, const String& Name) {
  auto role = std::make_shared<Role>();
  role->Id(Id);
  role->Name(Name);
  connectAlike(*role);
  add(role, Name);
  return role;
}

Boolean Roles::GetAll() {
  return operation(prefixedBlank(message::rolesNotListed), [&] {
    clearItems();
    Connection connection = open();
    Recordset row = connection.Execute(
        " select roleId,roleName,roleDesc,builtIn , "
        " CreUId , CreUName , CreateTime , UpdUId , UpdUName , UpdTime , OtherCanUpd from roles    ");
    for (; !row.EOF_(); row.MoveNext()) {
      auto role = std::make_shared<Role>();
      role->read(row);
      connectAlike(*role);
      add(role, role->Name());
    }
    return true;
  });
}

}  // namespace QVSa
