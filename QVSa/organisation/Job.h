#pragma once

#include "QVSa/values/Values.h"

namespace QVSa {

// A role held in a department, as Jobs lists it. Users, report rights and process tasks are bound to jobs.
class QVSA_EXPORT Job {
 public:
  Long Id() const { return Id_; }
  // "Sales-East--Manager": the department's full name and the role's name.
  String Name() const { return deptFullName_ + "--" + roleName_; }
  // The department's number; after Jobs::GetAllSameRole its inner id as text.
  String deptId() const { return deptId_; }
  // The department's inner id; 0 after Jobs::GetAllSameRole.
  Long innerDeptId() const { return innerDeptId_; }
  void innerDeptId(Long value) { innerDeptId_ = value; }
  String deptName() const { return deptName_; }
  String deptFullName() const { return deptFullName_; }
  Long roleId() const { return roleId_; }
  String roleName() const { return roleName_; }
  // Whether the role comes with the system.
  Boolean builtIn() const { return builtIn_; }

 private:
  friend class Jobs;

  Long Id_ = 0;
  String deptId_;
  Long innerDeptId_ = 0;
  String deptName_;
  String deptFullName_;
  Long roleId_ = 0;
  String roleName_;
  Boolean builtIn_ = false;
};

}  // namespace QVSa
