#include "QVSa/organisation/userGroup.h"

#include "platform/XmlElement.h"

namespace QVSa {

String userGroup::GetUsers(Long Id) {
  return operation(plain(), [&]() -> String {
    Connection connection = open();
    connection.Execute("set nocount on");
    Recordset row = connection.Execute(
        "select g.UserId,u.UserName,d.DeptName from GrpUser g,Users u,Departments d"
        " where g.gId=" +
        text(Id == 0 ? Id_ : Id) + " and g.UserId=u.UserId and u.DeptId=d.DeptId");
    if (row.EOF_()) return "";
    platform::XmlElement users("users");
    for (; !row.EOF_(); row.MoveNext()) {
      platform::XmlElement user("user");
      user.setAttribute("id", row["UserId"].asText());
      user.setAttribute("name", row["UserName"].asText());
      user.setAttribute("deptFullName", row["DeptName"].asText());
      users.append(std::move(user));
    }
    return users.text();
  });
}

Boolean userGroup::SetUsers(const String& userList) {
  return operation(prefixedBlank(message::groupMembersNotSet), [&] {
    const String id = text(Id_);
    Connection connection = open();
    connection.BeginTrans();
    connection.Execute("delete from GrpUser where gId=" + id);
    if (!userList.empty()) {
      connection.Execute(sql("insert into GrpUser(gId,userId)"
                             " select " +
                             id + ",userId from Users where userId in (<userList>)")
                             .list("userList", userList));
    }
    connection.CommitTrans();
    return true;
  });
}

Boolean userGroup::SetRoles(const String& roleList) {
  return operation(prefixedBlank(message::groupRolesNotSet), [&] {
    const String id = text(Id_);
    Connection connection = open();
    connection.BeginTrans();
    connection.Execute("delete from GrpRole where gId=" + id);
    if (!roleList.empty()) {
      connection.Execute(sql("insert into GrpRole(gId,roleId)"
                             " select " +
                             id + ",roleId from Roles where roleName in (<roleList>)")
                             .list("roleList", roleList));
    }
    connection.CommitTrans();
    return true;
  });
}

Boolean userGroup::GetRoles(String& roleList) {
  return operation(prefixedBlank(message::groupRolesNotRead), [&] {
    roleList.clear();
    Connection connection = open();
    connection.Execute("set nocount on");
    Recordset row = connection.Execute(sql("select r.roleName from GrpRole g,Roles r"
                                           " where g.gId=<gId>"
                                           " and g.roleId=r.roleId")
                                           .number("gId", Id_));
    std::vector<String> names;
    for (; !row.EOF_(); row.MoveNext()) names.push_back(row["roleName"].asText());
    roleList = join(names, ",");
    return true;
  });
}

Boolean userGroup::GetOne(Integer keyName, const Variant& keyValue) {
  return operation(plain(), [&]() -> Boolean {
    const String key = keyName == byId ? " where gId=<gId>" : keyName == byName ? " where gName=<gName>" : " where 1=2";
    Connection connection = open();
    connection.Execute("set nocount on");
    Recordset row = connection.Execute(
        sql("select gId,gName,gDesc from ItemGroups" + key).number("gId", keyValue).text("gName", keyValue));
    if (row.EOF_()) return refuse(message::groupUnknown, {keyValue});
    Id_ = row["gId"].asLong();
    Name_ = row["gName"].asText();
    if (!row["gDesc"].isNull()) description_ = row["gDesc"].asText();
    return true;
  });
}

Boolean userGroup::Save() {
  return operation(plain(), [&]() -> Boolean {
    if (Name_.empty()) return refuse(message::groupIncomplete);
    {
      Connection connection = open();
      connection.Execute("set nocount on");
      String statement = "select count(*) from ItemGroups where gName=<gName>";
      if (Id_ != 0) statement += " and gId<>" + text(Id_);
      if (connection.Execute(sql(statement).text("gName", Name_))[0].asLong() > 0) return refuse(message::groupExists);
    }
    return Id_ == 0 ? insertGroup() : updateGroup();
  });
}

Boolean userGroup::insertGroup() {
  return operation(plain(), [&]() -> Boolean {
    Connection connection = open();
    connection.Execute("set nocount on");
    connection.BeginTrans();
    connection.Execute(sql("insert into ItemGroups(gName,gDesc)"
                           " values(<gName>,<gDesc>)")
                           .text("gDesc", description_)
                           .text("gName", Name_));
    Long id = 0;
    {
      Recordset row = connection.Execute("select scope_identity()");
      if (row.EOF_()) return refuse(message::groupNotAdded);
      id = row[0].asLong();
    }
    connection.CommitTrans();
    Id_ = id;
    return true;
  });
}

Boolean userGroup::updateGroup() {
  return operation(prefixedBlank(message::groupNotUpdated), [&] {
    Connection connection = open();
    connection.Execute("set nocount on");
    connection.Execute(sql("update ItemGroups set "
                           "gName=<gName>,"
                           "gDesc=<gDesc>"
                           " where gId=" +
                           text(Id_))
                           .text("gDesc", description_)
                           .text("gName", Name_));
    return true;
  });
}

Boolean userGroup::Delete(Long Id) {
  return operation(prefixedBlank(message::groupNotDeleted), [&] {
    const String id = text(Id == 0 ? Id_ : Id);
    Connection connection = open();
    connection.Execute("set nocount on");
    connection.BeginTrans();
    connection.Execute("delete from ItemGroups where gId=" + id);
    connection.Execute("delete from GrpUser where gId=" + id);
    connection.Execute("delete from GrpRole where gId=" + id);
    connection.CommitTrans();
    return true;
  });
}

}  // namespace QVSa
