#include "QVSa/organisation/Jobs.h"

namespace QVSa {

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
