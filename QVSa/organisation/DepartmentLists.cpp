#include "QVSa/organisation/Department.h"
#include "QVSa/organisation/Departments.h"
#include "QVSa/organisation/Users.h"

namespace QVSa {

std::shared_ptr<Departments> Department::GetAllSub() {
  return operation(plain(), [&] {
    Connection connection = open();
    connection.Execute("set nocount on");
    Recordset row = connection.Execute(sql("select d1.*,superNo=d2.deptNo "
                                           " from departments d1,departments d2"
                                           " where d1.superDept*=d2.deptId"
                                           " and d1.path like <deptId>")
                                           .text("deptId", "%." + text(InnerId_) + ".%"));
    auto result = std::make_shared<Departments>();
    for (; !row.EOF_(); row.MoveNext()) {
      String innerId = row["deptId"].asText();
      String fullName = row["FullName"].asText();
      result->Add(row["deptNo"].asText(), row["deptName"].asText(), row["superNo"].asText(), row["isOrg"].isOne(),
                  &innerId, &fullName);
    }
    return result;
  });
}

std::shared_ptr<Departments> Department::GetSub() {
  return operation(plain(), [&] {
    Connection connection = open();
    connection.Execute("set nocount on");
    Recordset row =
        connection.Execute(sql("select deptId,deptName,superDept=isnull(superDept,''),isOrg=isnull(isOrg,0) "
                               "from departments where superDept=<deptId>")
                               .text("deptId", InnerId_));
    auto result = std::make_shared<Departments>();
    for (; !row.EOF_(); row.MoveNext()) {
      // The inner id is left out, which Add refuses: the first child ends the operation here.
      String none;
      result->Add(row["deptId"].asText(), row["deptName"].asText(), row["superDept"].asText(), row["isOrg"].isOne(),
                  &none, &none);
    }
    return result;
  });
}

std::shared_ptr<Users> Department::GetUsers() {
  return operation(plain(), [&]() -> std::shared_ptr<Users> {
    auto users = std::make_shared<Users>();
    connectAlike(*users);
    // The list takes a department number, and is given the inner id.
    if (!users->GetAll(text(InnerId_), 0, false, -1, -1)) return refuseAs(*users);
    return users;
  });
}

}  // namespace QVSa
