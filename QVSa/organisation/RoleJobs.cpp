#include "QVSa/organisation/Role.h"
#include "platform/XmlElement.h"

namespace QVSa {

Boolean Role::setJobs(const String& depts, const String& DeptIdsDeleted) {
  return operation(prefixed(message::roleJobsNotSet).number(messageNumber(message::roleJobsNotSet)), [&] {
    const String id = text(Id_);
    Connection connection = open();
    connection.Execute("set nocount on");
    connection.BeginTrans();
    connection.Execute(sql("insert into jobs(roleId,deptId)"
                           "select " +
                           id +
                           ",deptId from departments"
                           " where deptId in (<depts>)"
                           " and deptId not in (select deptId from jobs where roleId=" +
                           id + ")")
                           .list("depts", depts));
    for (const char* remove : {" delete from userjob where jobId in ", " delete from CFTJob where jobId in ",
                               " delete from fldAcl where jobId in ", " delete from repAcl where jobId in ",
                               " delete from userMgr where jobId in "}) {
      connection.Execute(
          sql(remove + (" (select jobId from jobs where roleId=" + id + " " + "     and deptId in (<DeptIdsDeleted>))"))
              .list("DeptIdsDeleted", DeptIdsDeleted));
    }
    connection.Execute(sql("delete from jobs where roleId=" + id + "  and deptId in (<DeptIdsDeleted>)")
                           .list("DeptIdsDeleted", DeptIdsDeleted));
    connection.CommitTrans();
    return true;
  });
}

Long Role::GetJobIdOfTheDept(const String& deptId) {
  return operation(plain(), Long{-1}, [&](Long& result) {
    Connection connection = open();
    Recordset row = connection.Execute(sql(" select jobid from jobs "
                                           " Where roleId = <RoleID> "
                                           " and deptid = <DeptID> ")
                                           .number("RoleID", Id_)
                                           .number("DeptID", deptId));
    if (row.EOF_()) {
      result = 0;
      fail("Role", message::roleNotInDepartment);
    }
    result = row["jobid"].asLong();
  });
}

String Role::getAcl(Long Id) {
  return operation(plain(), [&]() -> String {
    const String id = text(Id == 0 ? Id_ : Id);
    Connection connection = open();
    connection.Execute("set nocount on");
    Recordset row = connection.Execute(
        "select r.repId,r.repName,a.authType,tName='' from reports r,repAcl a,jobs j"
        " where j.roleId=" +
        id +
        " and j.jobId=a.jobId and a.repId=r.repId"
        " union"
        " select r.repId,r.repName,authType=3,t.tName"
        " from jobs j,cftjob tj,cftasks t,cfprocesses p,reptmps rt,reports r"
        " Where j.roleId=" +
        id +
        " and j.jobId = tj.jobId"
        " and tj.tid=t.tid and t.pid=p.pid and p.rtUid=rt.rtUid and rt.repId=r.repId");
    if (row.EOF_()) return "";
    platform::XmlElement acl("acl");
    for (; !row.EOF_(); row.MoveNext()) {
      platform::XmlElement rep("rep");
      rep.setAttribute("id", row["repId"].asText());
      rep.setAttribute("name", row["repName"].asText());
      rep.setAttribute("authType", row["authType"].asText());
      rep.setAttribute("tName", row["tName"].asText());
      acl.append(std::move(rep));
    }
    return acl.text();
  });
}

}  // namespace QVSa
