#include "QVSa/organisation/Jobs.h"

#include "QVSa/organisation/Job.h"
#include "bindings/c/Class.h"

namespace QVSa::binding {

void describe(Class<Jobs>& jobs) {
  jobs.readOnly("errNumber", &Jobs::errNumber)
      .readOnly("errDescription", &Jobs::errDescription)
      .operation("connect", {"server", optional("DBName", "")}, &Jobs::connect, failsWith(false))
      .operation("GetAll", {optional("deptId", ""), optional("roleName", ""), optional("userId", 0)}, &Jobs::GetAll,
                 failsWith(false))
      .operation("GetAllOfDept", {optional("deptId", 0), optional("roleName", ""), optional("userId", 0)},
                 &Jobs::GetAllOfDept, failsWith(false))
      .operation("GetAllSameRole", {optional("userId", 0)}, &Jobs::GetAllSameRole, failsWith(false))
      .operation("Count", {}, &Jobs::Count)
      .operation("Item", {"Index"}, &Jobs::Item)
      .items<Job>();
}

}  // namespace QVSa::binding
