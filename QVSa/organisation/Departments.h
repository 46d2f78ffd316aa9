#pragma once

#include "QVSa/frame/Collection.h"
#include "QVSa/organisation/Department.h"

namespace QVSa {

// Departments in lists: the whole tree, subtrees, the ways up from jobs.
//   Departments tree;  tree.connect(server);
//   if (tree.GetAll()) for (const auto& department : tree) show(department->fullName());
// The key is the department number, but for GetRoot (the inner id) and for the ways up. A key that comes again
// ends a list with 457; the departments before it stay. All lists leave `Org` empty.
class QVSA_EXPORT Departments : public Collection<Department> {
 public:
  using Collection::Remove;

  // Makes a department in memory under the key `Id`. `InnerId` is a number as text: throws 13 where it is none or is
  // left out, 457 where the key is taken; nothing is added then.
  std::shared_ptr<Department> Add(const String& Id, const String& Name, const String& Super = "", Boolean isOrg = false,
                                  String* InnerId = nullptr, String* fullName = nullptr);

  // The tree, each department behind those above it, or the subtrees of `deptIds`: inner ids, comma-separated, SQL of
  // the caller's own, which goes into the statement as it is. `outer`: 0 inside departments, 1 outside ones, -1 both,
  // the inside ones first; any other: all, in no order. A number that occurs twice ends the list with 457.
  Boolean GetAll(Integer outer = -1, const String& deptIds = "");
  // The tree level by level, by number within a level. `outer` as for GetAll.
  Boolean GetAllWithLevel(Integer outer = -1);
  // Fails with 0x800A0CC1 as soon as there is a top department, and there always is: its rows are asked for a column
  // that they don't have. Use GetAll.
  Boolean GetRoot();
  // The departments of the jobs `jobIds` (ids, comma-separated) and all above them, by path. `isSameOrg` 1: those alone
  // that belong to the organisation numbered `orgNo`; any other but 0: `orgNo` is the inner id of a department, and
  // only the jobs in that one count. `x` 0: the jobs' own departments alone; 1: those above alone; -1: both. The key is
  // the name: the second department of one name ends the list with 457.
  Boolean getAllSuper(const String& jobIds, Integer isSameOrg = 0, const String& orgNo = "", Integer x = -1);
  // The same by level, the top first. The key is the full name, which two departments share where siblings have one
  // name, or where a name holds a "-": "A-B" below "C", and "B" below "A" below "C".
  Boolean getAllSuperWithLevel(const String& jobIds, Integer isSameOrg = 0, const String& orgNo = "", Integer x = -1);

 private:
  void addRows(Connection& connection, const String& statement);
  void addRowsOfPath(Recordset row, const char* key);
};

}  // namespace QVSa
