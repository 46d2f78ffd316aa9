#include "QVSa/identity/User.h"
#include "QVSa/organisation/Department.h"
#include "QVSa/organisation/Users.h"

namespace QVSa {

// What of a user speaks of departments and of other users lies here: the room of users knows nothing of the
// organisation.

Boolean User::setDept(const Department& dept) {
  deptInnerId_ = dept.InnerId();
  deptId_ = dept.Id();
  deptName_ = dept.Name();
  deptFullName_ = dept.fullName();
  return true;
}

Boolean User::setManager(Integer flag, Long jobId, Long userId) {
  return operation(prefixed(message::supervisorNotSet), [&] {
    if (flag == 1 && jobId == 0) fail("User", message::supervisorJobMissing);
    if (flag == 2 && userId == 0) fail("User", message::supervisorUserMissing);
    Connection connection = open();
    connection.Execute("set nocount on");
    connection.BeginTrans();
    connection.Execute("delete from userMgr where userId=" + text(Id_));
    connection.Execute(
        "insert into userMgr("
        "UserId,flag,mgrId,jobId)"
        " values(" +
        text(Id_) + "," + text(flag) + "," + text(userId) + "," + text(jobId) + ")");
    connection.CommitTrans();
    return true;
  });
}

Boolean User::getManager(Integer& flag, Long& jobId, Long& userId) {
  return operation(prefixed(message::supervisorNotRead), [&] {
    Connection connection = open();
    connection.Execute("set nocount on");
    Recordset row = connection.Execute("select * from userMgr where userId=" + text(Id_));
    if (row.EOF_()) return true;
    flag = row["flag"].asInteger();
    jobId = row["jobId"].asLong();
    userId = row["mgrId"].asLong();
    return true;
  });
}

std::shared_ptr<Users> User::getSubUsers() {
  return operation(prefixed(message::subordinatesNotListed), [&] {
    Connection connection = open();
    connection.Execute("set nocount on");
    const String id = text(Id_);
    Recordset row = connection.Execute(
        "select u.* from users u,userMgr um"
        " Where u.userId = um.userId"
        " and ((um.flag=1 and um.jobId in (select jobId from userJob where userId=" +
        id +
        "))"
        " or (um.flag=2 and um.mgrId=" +
        id + "))");
    auto result = std::make_shared<Users>();
    for (; !row.EOF_(); row.MoveNext())
      result->Add(row["userName"].asText(), row["userLogin"].asText(), row["userId"].asLong());
    return result;
  });
}

}  // namespace QVSa
