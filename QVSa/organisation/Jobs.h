#pragma once

#include "QVSa/frame/Frame.h"

namespace QVSa {

// Jobs: roles held in departments.
class Jobs : private Frame {
 public:
  using Frame::errDescription;
  using Frame::errNumber;

 private:
  friend class Department;

  // Removes the jobs of a role, of a department, or with both given of the role in that department, and all that hangs
  // on them; 0 means not given. Works on the caller's connection and so in his transaction. `ok` is False on failure,
  // which then stands in this object's error values.
  void removeJobs(Connection& conn, Long roleId, Long deptId, Boolean& ok);
};

}  // namespace QVSa
