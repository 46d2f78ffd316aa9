#include "QVSa/hosting/UserKeeping.h"

#include "QVSa/hosting/SafeTexts.h"
#include "QVSa/organisation/Jobs.h"

namespace QVSa {

// What a save takes away, as the tables have it.
struct UserKeeping::Kept {
  std::vector<Long> groups;
  Integer state;
  Variant lockDate;
  Variant passwordDate;
};

Boolean UserKeeping::save(User& user, Boolean newPassword) {
  return operation(plain(), [&]() -> Boolean {
    Connection connection = open();
    connection.Execute("set nocount on");
    const Kept kept = read(connection, user.Id());
    const String groups = user.grpName();
    user.setJobs(jobsOf(user.Id()));
    user.grpName("");
    const Boolean saved = user.Save(!newPassword);
    user.grpName(groups);
    if (!saved) return refuseAs(user);
    try {
      putBack(connection, user, kept, newPassword);
    } catch (const Failure& failure) {
      note(failure.number(),
           "The user is saved, but his groups and the state of his account are not put back: " + failure.description());
      return false;
    }
    user.regState(kept.state);
    return true;
  });
}

String UserKeeping::jobsOf(Long userId) {
  Jobs jobs;
  jobs.connect(server(), DBName());
  if (!jobs.GetAll("", "", userId)) throw Failure(jobs.errNumber(), "UserKeeping", jobs.errDescription());
  std::vector<Long> ids;
  for (const auto& job : jobs) ids.push_back(job->Id());
  return idList(ids);
}

UserKeeping::Kept UserKeeping::read(Connection& connection, Long userId) {
  Kept kept;
  {
    Recordset row =
        connection.Execute("select accstate,lockDate,pwdDate from users where isRole=0 and userId=" + text(userId));
    if (row.EOF_()) fail("UserKeeping", message::userUnknown);
    kept.state = row[0].asInteger();
    kept.lockDate = row[1].Value();
    kept.passwordDate = row[2].Value();
  }
  Recordset row = connection.Execute("select gId from grpUser where userId=" + text(userId));
  for (; !row.EOF_(); row.MoveNext()) kept.groups.push_back(row[0].asLong());
  return kept;
}

// Each membership by itself, so that what happens to the groups' other members meanwhile is not undone. And no state
// that the save left as it was: failed sign-ons may have locked the account behind it.
void UserKeeping::putBack(Connection& connection, const User& user, const Kept& kept, Boolean newPassword) {
  const String userId = text(user.Id());
  std::vector<String> columns;
  if (kept.state != user.regState()) {
    columns.push_back("accstate=" + text(kept.state));
    if (!kept.lockDate.isNull()) columns.emplace_back("lockDate=<lockDate>");
  }
  if (!newPassword && !kept.passwordDate.isNull()) columns.emplace_back("pwdDate=<pwdDate>");
  connection.BeginTrans();
  if (!kept.groups.empty())
    connection.Execute("insert into grpUser(userId,gId) select " + userId + ",gId from itemGroups where gId in (" +
                       idList(kept.groups) + ")");
  if (!columns.empty())
    connection.Execute(sql("update users set " + join(columns, ",") + " where userId=" + userId)
                           .date("lockDate", kept.lockDate)
                           .date("pwdDate", kept.passwordDate));
  connection.CommitTrans();
}

Boolean UserKeeping::unlock(Long userId) {
  return operation(plain(), [&]() -> Boolean {
    Connection connection = open();
    Long opened = 0;
    connection.Execute(
        "update users set accstate=0,lockDate=null,lgts=0 where isRole=0 and accstate in (0,1) and userId=" +
            text(userId),
        &opened);
    if (opened == 0) return refuse(message::userUnknown);
    return true;
  });
}

}  // namespace QVSa
