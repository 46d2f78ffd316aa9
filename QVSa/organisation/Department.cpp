#include "QVSa/organisation/Department.h"

#include "QVSa/organisation/Jobs.h"

namespace QVSa {

Boolean Department::GetOne(Integer keyName, const String& keyValue) {
  return operation(plain(), [&] {
    const String key = keyName == byNumber ? " and d1.deptNo=<deptNo>"
                       : keyName == byName ? " and d1.deptName=<fullName>"
                                           : " and d1.deptId=<deptId>";
    Connection connection = open();
    connection.Execute("set nocount on");
    bool found = false;
    String myPath;
    {
      Recordset row = connection.Execute(sql("select d1.*,superNo=d2.deptNo "
                                             " from departments d1,departments d2"
                                             " where d1.superDept*=d2.deptId" +
                                             key)
                                             .number("deptId", keyValue)
                                             .text("deptNo", keyValue)
                                             .text("fullName", keyValue));
      found = !row.EOF_();
      if (found) {
        read(row);
        // A row without a path is damaged: the load ends here, with the fields copied.
        myPath = row["path"].Value().toText();
      } else {
        note(message::departmentUnknown);
      }
    }
    // Also where no row was found: the organisation is then the root.
    findOrganisation(connection, myPath);
    return found;
  });
}

void Department::read(Recordset& row) {
  InnerId_ = row["deptId"].asLong();
  Id_ = row["deptNo"].asText();
  Name_ = row["deptName"].asText();
  if (!row["superDept"].isNull()) superInnerId_ = row["superDept"].asLong();
  if (!row["superNo"].isNull()) Super_ = row["superNo"].asText();
  fullName_ = row["fullname"].asText();
  isOrg_ = row["isOrg"].asInteger();
  // A department at the top is an organisation, whatever its column says.
  if (!row["isOrg"].isNull() && row["superDept"].isNull()) isOrg_ = 1;
  if (!row["path"].isNull()) fullId_ = row["path"].asText();
  isOuter_ = row["isOuter"].isOne();
}

void Department::findOrganisation(Connection& connection, const String& myPath) {
  if (isOrg()) {
    Org_ = Id_;
    return;
  }
  Recordset row = connection.Execute(sql("select deptId,deptName,fullName,deptNo from departments"
                                         " where (<myPath> like '%'+path+'%'"
                                         " and isOrg=1 and deptId<><deptId>)"
                                         " or deptNo='_root'"
                                         " order by path desc")
                                         .text("myPath", myPath)
                                         .number("deptId", InnerId_));
  if (!row.EOF_()) Org_ = row["deptNo"].asText();
}

Boolean Department::Delete(const String& Id) {
  return operation(plain(), [&]() -> Boolean {
    Connection connection = open();
    connection.Execute("set nocount on");
    const auto count = [&](const String& statement) { return connection.Execute(statement)[0].asLong(); };

    Long id = 0;
    {
      Recordset row = connection.Execute(
          sql("select deptId from departments where deptNo=<deptNo>").text("deptNo", Id.empty() ? Id_ : Id));
      if (row.EOF_()) return refuse(message::departmentUnknown);
      id = row["deptId"].asLong();
    }
    if (count("select count(*) from departments where superDept=" + text(id)) > 0)
      return refuse(message::departmentHasChildren);
    if (count("select count(*) from users where deptId=" + text(id)) > 0) return refuse(message::departmentHasUsers);

    Jobs jobs;
    Boolean ok = false;
    jobs.removeJobs(connection, 0, id, ok);
    if (!ok) return refuseAs(jobs);
    connection.Execute("delete from departments where deptId=" + text(id));
    return true;
  });
}

}  // namespace QVSa
