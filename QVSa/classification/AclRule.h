#pragma once

#include "QVSa/frame/Frame.h"

namespace QVSa {

// The one access rule of the system: who may read and write reports, who may design them. The numbers mean something to
// the hosts only; nothing here tests them.
//   AclRule rule;  rule.connect(server);  rule.GetOne();  rule.RWType(2);  rule.Save();
class QVSA_EXPORT AclRule : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // 0 while there is no rule that this object knows of.
  Long Id() const { return Id_; }
  void Id(Long value) { Id_ = value; }
  // Reading and writing: the type of the rule, its settings for departments and for roles.
  Integer RWType() const { return RWType_; }
  void RWType(Integer value) { RWType_ = value; }
  Integer RWDeptSet() const { return RWDeptSet_; }
  void RWDeptSet(Integer value) { RWDeptSet_ = value; }
  Integer RWRoleSet() const { return RWRoleSet_; }
  void RWRoleSet(Integer value) { RWRoleSet_ = value; }
  // The same for designing.
  Integer DesignType() const { return DesignType_; }
  void DesignType(Integer value) { DesignType_ = value; }
  Integer DesignDeptSet() const { return DesignDeptSet_; }
  void DesignDeptSet(Integer value) { DesignDeptSet_ = value; }
  Integer DesignRoleSet() const { return DesignRoleSet_; }
  void DesignRoleSet(Integer value) { DesignRoleSet_ = value; }
  // Whether the rule leaves administrators out.
  Integer ExcludeAdmin() const { return ExcludeAdmin_; }
  void ExcludeAdmin(Integer value) { ExcludeAdmin_ = value; }

  // Loads the rule. True also where there is none: the properties then stay as they are.
  Boolean GetOne();
  // Inserts the rule where `Id` is 0, and updates it otherwise. Load it first: 0x80040E2F where `Id` is 0 and the rule
  // is there.
  Boolean Save();

 private:
  Long Id_ = 0;
  Integer RWType_ = 0;
  Integer RWDeptSet_ = 0;
  Integer RWRoleSet_ = 0;
  Integer DesignType_ = 0;
  Integer DesignDeptSet_ = 0;
  Integer DesignRoleSet_ = 0;
  Integer ExcludeAdmin_ = 0;
};

}  // namespace QVSa
