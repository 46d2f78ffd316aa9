#pragma once

#include <array>

#include "QVSa/frame/Collection.h"
#include "QVSa/identity/User.h"

namespace QVSa {

// Users in lists, and a data source whose one member "users" is the row set of the last GetList. The key is the display
// name: the second user of one name ends a list with 457, but for GetAllOfTheDeptAndRole. Lists fill the values that
// they name and nothing else; load a user by his own GetOne before saving him.
class QVSA_EXPORT Users : public Collection<User> {
 public:
  using Collection::Remove;

  Users();

  // Makes a user in memory. Throws 457 where the name is taken in this collection. `sendSms` and `keyLogin` play no
  // part.
  std::shared_ptr<User> Add(const String& Name, const String& Login, Long Id = 0, const String& Pwd = "",
                            const String& MobilePhone = "", const String& Email = "", const String& deptId = "",
                            const String& deptName = "", const String& deptFullName = "", Boolean sendSms = false,
                            Boolean keyLogin = false, Boolean PwdNoChange = false);
  // Throws 6 for more than 32,767 items. Gives nothing.
  Variant Clear();

  // The users in state 0 or 1, by name, with the flags of jobs 1 to 4, groups and addresses; `deptId` holds the inner
  // id. Filters: the department's number, without those below it; a role, held directly or through a group (0: any);
  // without built-in users; a group (0: in none, -1: any); the account's type (-1: any).
  Boolean GetAll(const String& deptId = "", Long roleId = 0, Boolean noBuiltIn = false, Long grpId = -1,
                 Integer uType = -1);
  // The self-registered users, in a state (-1: any), in no order. `deptId` must be 0: above, the call fails in the
  // database.
  Boolean GetAllReg(Integer regState = -1, Long deptId = 0);
  // Users of a department, given by its inner id (0: any), and of all below it, by name: id, name, department's full
  // name.
  Boolean GetAllOfTheDept(Long deptId);
  // The same by role name too (empty: any), held directly or through a group; with the department's name and inner id.
  // A name that stands there already is passed over.
  Boolean GetAllOfTheDeptAndRole(Long deptId = 0, const String& roleName = "");
  // The candidates of a person picker, by name. `Jobs`: only holders of one of these job ids, comma-separated;
  // `isSameOrg`: 1 only in the organisation of user `userId`, 2 only in his department.
  Boolean getAllForSelUser(const String& Jobs = "", Long userId = 0, Integer isSameOrg = 0);

  // Fills the row set of users in whatever state, of a department by its inner id (0: all) and all below it. Columns,
  // in the system's language: one without a name, empty; userid, Name, Login, Department, Remark ("BuiltIn" or empty),
  // State ("Locked" or empty). The number of rows, -1 on failure. The row set stands by itself: no connection is held.
  Long GetList(Long deptId);
  // The names of the data members: "users".
  std::vector<String> DataMembers() const { return {"users"}; }
  // The row set of the last GetList, whatever member is asked for; closed before the first. Lives as long as this
  // object.
  Recordset& GetDataMember(const String& DataMember);

 private:
  std::shared_ptr<User> listedUser(Recordset& row) const;
  std::shared_ptr<User> connected() const;

  Recordset listRecordset_;
  std::array<String, 6> listCaptions_;
};

}  // namespace QVSa
