#pragma once

#include "QVSa/frame/Collection.h"
#include "QVSa/organisation/Job.h"

namespace QVSa {

// Jobs in lists, by the inner id of their department. The key is the job id as text. Items can't be taken out.
// A failed list reports the message of a failed backup plan, "Fail to add new backup plan.".
class QVSA_EXPORT Jobs : public Collection<Job> {
 public:
  // The jobs in the department numbered `deptId`, of the role `roleName`, of the user `userId`: empty and 0 for any.
  Boolean GetAll(const String& deptId = "", const String& roleName = "", Long userId = 0);
  // The same for a department, given by its inner id, and all below it; 0: any.
  Boolean GetAllOfDept(Long deptId = 0, const String& roleName = "", Long userId = 0);
  // The jobs, in whatever department, of the roles that the user holds; 0: all jobs.
  Boolean GetAllSameRole(Long userId = 0);

 private:
  friend class Department;
  friend class JobsTest;
  friend class Role;

  void addRows(Recordset row);
  std::shared_ptr<Job> read(Recordset& row) const;

  // Removes the jobs of a role, of a department, or with both given of the role in that department, and all that hangs
  // on them; 0 means not given. Works on the caller's connection and so in his transaction. `ok` is False on failure,
  // which then stands in this object's error values.
  void removeJobs(Connection& conn, Long roleId, Long deptId, Boolean& ok);
};

}  // namespace QVSa
