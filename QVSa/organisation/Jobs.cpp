#include "QVSa/organisation/Jobs.h"

namespace QVSa {

Boolean Jobs::GetAll(const String& deptId, const String& roleName, Long userId) {
  return operation(prefixedBlank(message::planNotAdded), [&] {
    clearItems();
    Connection connection = open();
    String statement =
        "select j.jobId,j.deptId,d.deptName,d.fullName,j.roleId,r.roleName,r.builtIn,d.deptNo"
        " from jobs j,departments d,roles r"
        " Where j.deptId = d.deptId And j.roleId = r.roleId";
    if (!deptId.empty()) statement += " and d.deptNo=<deptNo>";
    if (!roleName.empty()) statement += " and r.roleName=<roleName>";
    if (userId != 0) statement += " and jobId in (select jobId from userJob where userId=" + text(userId) + ")";
    statement += " order by j.deptId";
    addRows(connection.Execute(sql(statement).text("deptNo", deptId).text("roleName", roleName)));
    return true;
  });
}

Boolean Jobs::GetAllOfDept(Long deptId, const String& roleName, Long userId) {
  return operation(prefixedBlank(message::planNotAdded), [&] {
    clearItems();
    Connection connection = open();
    String statement =
        "select j.jobId,j.deptId,d.deptName,d.fullName,j.roleId,r.roleName,r.builtIn,d.deptNo"
        " from jobs j,departments d,roles r"
        " Where j.deptId = d.deptId And j.roleId = r.roleId";
    if (deptId > 0) {
      statement +=
          " and ( d.deptid = '<deptId>' Or charindex( '."
          "<deptId>"
          ".' , d.path ) > 0 ) ";
    }
    if (!roleName.empty()) statement += " and r.roleName=<roleName>";
    if (userId != 0) statement += " and jobId in (select jobId from userJob where userId=" + text(userId) + ")";
    statement += " order by j.deptId";
    addRows(connection.Execute(sql(statement).number("deptId", deptId).text("roleName", roleName)));
    return true;
  });
}

Boolean Jobs::GetAllSameRole(Long userId) {
  return operation(prefixedBlank(message::planNotAdded), [&] {
    clearItems();
    Connection connection = open();
    String statement =
        "select j.jobId,j.deptId,d.deptName,d.fullName,j.roleId,r.roleName,r.builtIn"
        " from jobs j,departments d,roles r"
        " Where j.deptId = d.deptId And j.roleId = r.roleId";
    if (userId != 0) {
      statement += " and j.roleId in (select j1.roleId from jobs j1,userJob u1 where u1.userId=" + text(userId) +
                   " and j1.jobId=u1.jobId)";
    }
    statement += " order by j.deptId";
    for (Recordset row = connection.Execute(statement); !row.EOF_(); row.MoveNext()) {
      auto job = read(row);
      // Without the number among the columns, its place is taken by the inner id.
      job->deptId_ = row["deptId"].asText();
      add(job, text(job->Id_));
    }
    return true;
  });
}

void Jobs::addRows(Recordset row) {
  for (; !row.EOF_(); row.MoveNext()) {
    auto job = read(row);
    job->innerDeptId_ = row["deptId"].asLong();
    job->deptId_ = row["deptNo"].asText();
    add(job, text(job->Id_));
  }
}

std::shared_ptr<Job> Jobs::read(Recordset& row) const {
  auto job = std::make_shared<Job>();
  job->Id_ = row["jobId"].asLong();
  job->deptName_ = row["deptName"].asText();
  job->deptFullName_ = row["fullName"].asText();
  job->roleId_ = row["roleId"].asLong();
  job->roleName_ = row["roleName"].asText();
  job->builtIn_ = row["builtIn"].asBoolean();
  return job;
}

void Jobs::removeJobs(Connection& conn, Long roleId, Long deptId, Boolean& ok) {
  ok = operation(plain(), [&] {
    if (roleId == 0 && deptId == 0) return true;

    String statement = "select jobId from jobs where deptId=" + text(deptId);
    if (roleId != 0) statement = "select jobId from jobs where roleId=" + text(roleId);
    if (roleId != 0 && deptId != 0) statement += " and deptId=" + text(deptId);
    std::vector<String> jobIds;
    for (Recordset row = conn.Execute(statement); !row.EOF_(); row.MoveNext()) {
      jobIds.push_back(text(row["jobId"].asLong()));
    }
    if (jobIds.empty()) return true;

    const String list = join(jobIds, ",");
    conn.Execute("delete from fldAcl where jobId in (" + list + ")");
    conn.Execute("delete from cftJob where jobId in (" + list + ")");
    conn.Execute("delete from userJob where jobId in (" + list + ")");
    conn.Execute("delete from repAcl where jobId in (" + list + ")");
    conn.Execute("delete from userMgr where jobId in (" + list + ")");
    conn.Execute("delete from jobs where jobId in (" + list + ")");
    return true;
  });
}

}  // namespace QVSa
