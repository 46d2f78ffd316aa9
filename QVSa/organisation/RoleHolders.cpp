#include "QVSa/organisation/Role.h"
#include "QVSa/organisation/Users.h"
#include "platform/XmlElement.h"

namespace QVSa {

std::shared_ptr<Users> Role::GetUsers(Boolean, Boolean noBuiltIn, const String& deptId) {
  return operation(prefixedBlank(message::holdersNotListed).filledWith(Name_), [&]() -> std::shared_ptr<Users> {
    auto users = std::make_shared<Users>();
    connectAlike(*users);
    if (!users->GetAll(deptId, Id_, noBuiltIn, -1, -1)) return refuseAs(*users);
    return users;
  });
}

std::shared_ptr<Users> Role::GetUsersOfRole(const String& deptId, const String& roleName) {
  return operation(prefixedBlank(message::holdersNotListed).filledWith(Name_), [&]() -> std::shared_ptr<Users> {
    auto users = std::make_shared<Users>();
    connectAlike(*users);
    const Integer dept = deptId.empty() ? Integer{0} : Variant(deptId).toInteger();
    if (!users->GetAllOfTheDeptAndRole(dept, roleName)) return refuseAs(*users);
    return users;
  });
}

Boolean Role::GetUsers2(String& UsersXml) {
  return operation(plain(), [&] {
    Connection connection = open();
    platform::XmlElement users("users");
    Recordset row = connection.Execute(sql(" select u.userId, userName, u.deptId, d.deptName, d.deptNo, uj.jobid "
                                           " from users u, userJob uj, jobs j, departments d "
                                           " where j.roleId = <RoleID> "
                                           " and uj.jobid = j.jobid "
                                           " and uj.userID = u.userId "
                                           " and u.deptid = d.deptid ")
                                           .text("RoleID", Id_));
    for (; !row.EOF_(); row.MoveNext()) {
      platform::XmlElement user("user");
      user.setAttribute("id", row["userID"].asText());
      user.setAttribute("name", row["userName"].asText());
      user.setAttribute("deptid", row["deptID"].asText());
      user.setAttribute("deptname", row["deptName"].asText());
      user.setAttribute("jobid", row["jobid"].asText());
      user.setAttribute("deptno", row["deptno"].asText());
      users.append(std::move(user));
    }
    UsersXml = users.text();
    return true;
  });
}

Boolean Role::UpdateUsers(const String& newUserJobIds, const String& delUserJobIds) {
  return operation(plain(), [&] {
    Connection connection = open();
    const auto forEachPair = [&](const String& pairs, const String& statement) {
      if (pairs.empty()) return;
      for (const String& pair : split(pairs, '|')) {
        const std::vector<String> ids = split(pair, ',');
        if (ids.size() < 2) throw runtimeFailure(number::position);
        connection.Execute(sql(statement).number("Uid", ids[0]).number("Jid", ids[1]));
      }
    };
    forEachPair(delUserJobIds,
                " delete from userjob "
                " where jobid = <Jid> And userId = <Uid> ");
    forEachPair(newUserJobIds,
                " insert into userJob ( userid ,jobid ) "
                " values ( <Uid> ,<Jid> ) ");
    return true;
  });
}

}  // namespace QVSa
