#pragma once

#include "QVSa/frame/Frame.h"

namespace QVSa {

class Users;

// A named set of rights, defined once for the whole system. It takes effect as a job: held in a department.
//   Role manager;  manager.connect(server);
//   manager.Name("Manager");  manager.Save();  manager.setJobs("3,7");
class QVSA_EXPORT Role : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // What GetOne finds a role by.
  enum Key : Integer { byId = 1, byName = 2 };

  // 0 while the role is not stored.
  Long Id() const { return Id_; }
  void Id(Long value) { Id_ = value; }
  String Name() const { return Name_; }
  void Name(String value) { Name_ = std::move(value); }
  String description() const { return description_; }
  void description(String value) { description_ = std::move(value); }
  // Whether the role comes with the system.
  Boolean builtIn() const { return builtIn_; }
  // Who made and who last changed the role, and when. The hosts fill these; a time never set is day number 0.
  Long creUserId() const { return creUserId_; }
  void creUserId(Long value) { creUserId_ = value; }
  String creUserName() const { return creUserName_; }
  void creUserName(String value) { creUserName_ = std::move(value); }
  Date createTime() const { return createTime_; }
  void createTime(Date value) { createTime_ = value; }
  Long updUserId() const { return updUserId_; }
  void updUserId(Long value) { updUserId_ = value; }
  String upduserName() const { return upduserName_; }
  void upduserName(String value) { upduserName_ = std::move(value); }
  Date updTime() const { return updTime_; }
  void updTime(Date value) { updTime_ = value; }
  // For the hosts; nothing in this library looks at it.
  Boolean otherCanDesign() const { return otherCanDesign_; }
  void otherCanDesign(Boolean value) { otherCanDesign_ = value; }

  // Loads by a Key; any other `keyName` finds none. roleUnknown (0x800404B1) where there is no such role.
  Boolean GetOne(Integer keyName, const Variant& keyValue);
  // Inserts the role, or updates it where `Id` is not 0; an id that is not stored changes nothing and gives True.
  // For a new one: roleIncomplete (0x800404B2) name empty, roleExists (0x800404B9) name taken. An update tests neither.
  Boolean Save();
  // Deletes the role `Id` (0: this one), its jobs and all that hangs on them; built-in ones too, and unknown ones give
  // True. Groups keep their rows for it. What hangs on the jobs goes table by table: rights to fields, tasks,
  // holders, rights to reports, supervisors. Where one of these can't be emptied, as for a lock of another session, it
  // and those behind it keep their rows, for jobs that are gone: the role and its jobs go all the same, with True.
  Boolean Delete(Long Id = 0);

  // The holders, directly or through a group; `deptId`: only those of the department of that number. `noBuiltIn`:
  // without built-in users. `haveAuth` plays no part. No object on failure, and 457 where two holders have one name.
  std::shared_ptr<Users> GetUsers(Boolean haveAuth = true, Boolean noBuiltIn = true, const String& deptId = "");
  // Users by department, with all below it, and by role name, empty for any. `deptId` is an inner id as text, empty for
  // any; no object and 6 where it is above 32,767. Of two users of one name only the first is listed.
  std::shared_ptr<Users> GetUsersOfRole(const String& deptId = "", const String& roleName = "");
  // The direct holders as XML: <users><user id name deptid deptname jobid deptno/>...</users>, one `user` for each job
  // held; the department is the holder's home.
  Boolean GetUsers2(String& UsersXml);
  // Adds and removes holders: pairs "userId,jobId" with "|" between, of whatever role. Removes first. No transaction:
  // what was done before a failure stays. 9 for a pair without a comma.
  Boolean UpdateUsers(const String& newUserJobIds, const String& delUserJobIds);

  // Makes jobs of this role in the departments `depts`, and removes those in `DeptIdsDeleted` with all that hangs on
  // them: inner ids, comma-separated. An id in both loses its job. Every failure is roleJobsNotSet (0x800404B8).
  Boolean setJobs(const String& depts, const String& DeptIdsDeleted = "");
  // The job of this role in a department, given by its inner id as text. 0 with roleNotInDepartment (0x800404BA) where
  // there is none, -1 on any other failure.
  Long GetJobIdOfTheDept(const String& deptId);
  // What the role `Id` (0: this one) may reach, as XML: <acl><rep id name authType tName/>...</acl>, by direct rights
  // and by process tasks (authType 3, tName the task). The empty text where there is nothing.
  String getAcl(Long Id = 0);

 private:
  friend class Roles;

  void read(Recordset& row);
  Boolean insertRole();
  Boolean updateRole();
  SqlText filled(const String& statement);

  Long Id_ = 0;
  String Name_;
  String description_;
  Boolean builtIn_ = false;
  Long creUserId_ = 0;
  String creUserName_;
  Date createTime_;
  Long updUserId_ = 0;
  String upduserName_;
  Date updTime_;
  Boolean otherCanDesign_ = false;
};

}  // namespace QVSa
