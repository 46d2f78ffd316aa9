#include "QVSa/organisation/Role.h"

#include "QVSa/organisation/Jobs.h"

namespace QVSa {

Boolean Role::GetOne(Integer keyName, const Variant& keyValue) {
  return operation(plain(), [&]() -> Boolean {
    const String key = keyName == byId     ? " where roleId=<roleId>"
                       : keyName == byName ? " where roleName=<roleName>"
                                           : " where 1=2";
    Connection connection = open();
    connection.Execute("set nocount on");
    Recordset row = connection.Execute(sql("select roleId,roleName,roleDesc,builtIn , "
                                           "CreUId , CreUName , CreateTime , UpdUId , UpdUName , UpdTime , OtherCanUpd "
                                           "from roles " +
                                           key)
                                           .number("roleId", keyValue)
                                           .text("roleName", keyValue));
    if (row.EOF_()) return refuse(message::roleUnknown, {keyValue});
    read(row);
    return true;
  });
}

void Role::read(Recordset& row) {
  Id_ = row["roleId"].asLong();
  Name_ = row["roleName"].asText();
  if (!row["roleDesc"].isNull()) description_ = row["roleDesc"].asText();
  builtIn_ = row["builtIn"].isOne();
  creUserId_ = row["CreUId"].asLong();
  creUserName_ = row["CreUName"].asText();
  createTime_ = row["CreateTime"].asDate();
  updUserId_ = row["UpdUId"].asLong();
  upduserName_ = row["UpdUName"].asText();
  updTime_ = row["UpdTime"].asDate();
  otherCanDesign_ = row["OtherCanUpd"].asBoolean();
}

Boolean Role::Save() { return Id_ == 0 ? insertRole() : updateRole(); }

Boolean Role::insertRole() {
  return operation(plain(), [&]() -> Boolean {
    if (Name_.empty()) return refuse(message::roleIncomplete);
    Connection connection = open();
    connection.Execute("set nocount on");
    const Long taken =
        connection.Execute(sql("select count(*) from roles where roleName=<roleName>").text("roleName", Name_))[0]
            .asLong();
    if (taken > 0) return refuse(message::roleExists);

    connection.BeginTrans();
    connection.Execute(
        filled("insert into roles(roleName,roleDesc,builtIn "
               " , CreUId , CreUName , CreateTime , UpdUId , UpdUName , UpdTime , OtherCanUpd ) "
               " values(<roleName>,<roleDesc>,0 "
               " ,<CreUId>,<CreUName>,<CreateTime>,<UpdUId>,<UpdUName>,<UpdTime>,<OtherCanUpd>) "));
    Long id = 0;
    {
      Recordset row = connection.Execute("select scope_identity()");
      if (row.EOF_()) return refuse(message::roleNotAdded);
      id = row[0].asLong();
    }
    connection.CommitTrans();
    Id_ = id;
    return true;
  });
}

Boolean Role::updateRole() {
  return operation(prefixedBlank(message::roleNotUpdated), [&] {
    Connection connection = open();
    connection.Execute("set nocount on");
    connection.Execute(
        filled("update roles set "
               "roleName=<roleName>,"
               "roleDesc=<roleDesc> , "
               " CreUId = <CreUId> , "
               " CreUName = <CreUName> , "
               " CreateTime = <CreateTime> , "
               " UpdUId = <UpdUId> , "
               " UpdUName = <UpdUName> , "
               " UpdTime = <UpdTime> , "
               " OtherCanUpd = <OtherCanUpd> "
               " where roleId = " +
               text(Id_)));
    return true;
  });
}

SqlText Role::filled(const String& statement) {
  return sql(statement)
      .text("roleName", Name_)
      .text("roleDesc", description_)
      .number("CreUId", creUserId_)
      .text("CreUName", creUserName_)
      .date("CreateTime", createTime_)
      .number("UpdUId", updUserId_)
      .text("UpdUName", upduserName_)
      .date("UpdTime", updTime_)
      .number("OtherCanUpd", otherCanDesign_);
}

Boolean Role::Delete(Long Id) {
  return operation(prefixedBlank(message::roleNotDeleted), [&] {
    const Long id = Id == 0 ? Id_ : Id;
    Connection connection = open();
    connection.Execute("set nocount on");
    connection.BeginTrans();
    Jobs jobs;
    // What it can't remove does not stop the rest.
    Boolean ignored = false;
    jobs.removeJobs(connection, id, 0, ignored);
    connection.Execute("delete from jobs where roleId=" + text(id));
    connection.Execute("delete from roles where roleId=" + text(id));
    connection.CommitTrans();
    return true;
  });
}

}  // namespace QVSa
