#include "QVSa/organisation/Job.h"

#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<Job>& job) {
  job.readOnly("Id", &Job::Id)
      .readOnly("Name", &Job::Name)
      .readOnly("deptId", &Job::deptId)
      .property<Long>("innerDeptId", &Job::innerDeptId, &Job::innerDeptId)
      .readOnly("deptName", &Job::deptName)
      .readOnly("deptFullName", &Job::deptFullName)
      .readOnly("roleId", &Job::roleId)
      .readOnly("roleName", &Job::roleName)
      .readOnly("builtIn", &Job::builtIn);
}

}  // namespace QVSa::binding
