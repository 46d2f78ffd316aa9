#include "QVSa/organisation/Departments.h"

namespace QVSa {
namespace {

void fillPath(SqlText& statement, Integer isSameOrg, const String& orgNo, Integer x, const String& jobIds) {
  if (isSameOrg == 1) statement.text("orgNO", orgNo);
  if (isSameOrg != 0 && isSameOrg != 1) statement.number("orgNO", orgNo);
  if (x != -1) statement.number("X", x);
  statement.list("jobIds", jobIds);
}

}  // namespace

std::shared_ptr<Department> Departments::Add(const String& Id, const String& Name, const String& Super, Boolean isOrg,
                                             String* InnerId, String* fullName) {
  auto department = std::make_shared<Department>();
  department->Id(Id);
  department->Name(Name);
  department->Super(Super);
  department->isOrg(isOrg);
  department->InnerId_ = Variant(InnerId == nullptr ? "" : *InnerId).toLong();
  department->fullName(fullName == nullptr ? "" : *fullName);
  connectAlike(*department);
  add(department, Id);
  return department;
}

Boolean Departments::GetAll(Integer outer, const String& deptIds) {
  return operation(plain(), [&] {
    clearItems();
    Connection connection = open();
    String statement =
        "select d1.*,superNo=d2.deptNo "
        " from departments d1,departments d2"
        " where d1.superDept*=d2.deptId ";
    if (!deptIds.empty()) {
      statement =
          " select distinct d1.* ,LEN(d1.Path) - LEN(REPLACE(d1.Path, '.', '')), superNo = d2.deptNo "
          " from departments d1 , Departments d2 , ( select deptid from Departments where deptid in ( " +
          deptIds +
          " ) ) as f "
          " where d1.superDept *= d2.deptId "
          " and ( d1.deptid = f.deptid or charindex( '.' + convert( varchar , f.deptid ) + '.' , d1.path ) > 0 ) ";
    }
    if (outer == -1) statement += " order by d1.isOuter, d1.path";
    if (outer == 0) statement += " and d1.isOuter=0 order by d1.isOuter,d1.path";
    if (outer == 1) statement += " and d1.isOuter=1 order by d1.isOuter,d1.path";
    addRows(connection, statement);
    return true;
  });
}

Boolean Departments::GetAllWithLevel(Integer outer) {
  return operation(plain(), [&] {
    clearItems();
    Connection connection = open();
    String statement = " select * from QV_v_Dept ";
    if (outer == -1) statement += " order by isOuter , l , deptNo ";
    if (outer == 0) statement += " where isOuter = 0 order by l , deptNo ";
    if (outer == 1) statement += " where isOuter = 1 order by l , deptNo ";
    addRows(connection, statement);
    return true;
  });
}

void Departments::addRows(Connection& connection, const String& statement) {
  for (Recordset row = connection.Execute(statement); !row.EOF_(); row.MoveNext()) {
    auto department = std::make_shared<Department>();
    department->Id(row["deptNo"].asText());
    department->InnerId_ = row["deptId"].asLong();
    department->Name(row["deptName"].asText());
    department->fullName(row["fullName"].asText());
    department->isOrg(row["isOrg"].isOne());
    department->fullId(row["path"].asText());
    department->superInnerId_ = row["superDept"].asLong();
    department->Super(row["superNo"].asText());
    department->isOuter(row["isOuter"].isOne());
    connectAlike(*department);
    add(department, department->Id());
  }
}

Boolean Departments::GetRoot() {
  return operation(plain(), [&] {
    clearItems();
    Connection connection = open();
    Recordset row = connection.Execute(
        "select deptId,deptName,superDept from departments "
        "where superDept is null or superDept=''");
    for (; !row.EOF_(); row.MoveNext()) {
      auto department = std::make_shared<Department>();
      department->Id(row["deptId"].asText());
      department->Name(row["deptName"].asText());
      department->setServer(server());
      department->setDBName(DBName());
      department->Super(row["superDept"].asText());
      // Not among the columns: the first row ends the list here.
      department->isOrg(row["isOrg"].isOne());
      add(department, department->Id());
    }
    return true;
  });
}

Boolean Departments::getAllSuper(const String& jobIds, Integer isSameOrg, const String& orgNo, Integer x) {
  return operation(prefixedBlank(message::usersNotListed), [&] {
    clearItems();
    Connection connection = open();
    String statement;
    switch (isSameOrg) {
      case 0:
        statement =
            " select distinct pathDeptId , pathDeptName , superDeptId , fullName , path , deptNo "
            "     from QV_v_JobDeptPath "
            "     where jobid in (<jobIds>) ";
        break;
      case 1:
        statement =
            " select distinct jd.pathDeptId , jd.pathDeptName , jd.superDeptId , jd.fullName , jd.path , jd.deptNo "
            "     from QV_v_JobDeptPath jd , QV_v_DeptOrg_1 do "
            "     where jobid in (<jobIds>) and jd.pathdeptid = do.deptid and do.orgno = <orgNO> ";
        break;
      default:
        statement =
            " select distinct pathDeptId , pathDeptName , superDeptId , fullName , path , deptNo "
            "     from QV_v_JobDeptPath"
            "     where jobid in (<jobIds>) and deptid = <orgNO> ";
    }
    if (x != -1) statement += isSameOrg == 1 ? " and jd.x = <X> " : " and x = <X> ";
    statement += " order by path ";
    SqlText filled = sql(statement);
    fillPath(filled, isSameOrg, orgNo, x, jobIds);
    addRowsOfPath(connection.Execute(filled), "pathDeptName");
    return true;
  });
}

Boolean Departments::getAllSuperWithLevel(const String& jobIds, Integer isSameOrg, const String& orgNo, Integer x) {
  return operation(prefixedBlank(message::usersNotListed), [&] {
    clearItems();
    Connection connection = open();
    String statement;
    switch (isSameOrg) {
      case 0:
        statement =
            " select distinct pathDeptId , pathDeptName , superDeptId , fullName , path , deptNo , l "
            "     from QV_v_JobDeptPathWithLevel "
            "     where jobid in (<jobIds>) ";
        break;
      case 1:
        statement =
            " select distinct jd.pathDeptId , jd.pathDeptName , jd.superDeptId , jd.fullName , jd.path , jd.deptNo ,"
            " jd.l "
            "     from QV_v_JobDeptPathWithLevel jd , QV_v_DeptOrg_1WithLevel do "
            "     where jobid in (<jobIds>) and jd.pathdeptid = do.deptid and do.orgno = <orgNO> ";
        break;
      default:
        statement =
            " select distinct pathDeptId , pathDeptName , superDeptId , fullName , path , deptNo , l "
            "     from QV_v_JobDeptPathWithLevel "
            "     where jobid in (<jobIds>) and deptid = <orgNO> ";
    }
    if (x != -1) statement += isSameOrg == 1 ? " and jd.x = <X> " : " and x = <X> ";
    statement += isSameOrg == 1 ? "order by jd.l , jd.deptno " : "order by l , deptno ";
    SqlText filled = sql(statement);
    fillPath(filled, isSameOrg, orgNo, x, jobIds);
    addRowsOfPath(connection.Execute(filled), "fullName");
    return true;
  });
}

// The records can't reach the database: they are for showing.
void Departments::addRowsOfPath(Recordset row, const char* key) {
  for (row.ActiveConnection(nullptr); !row.EOF_(); row.MoveNext()) {
    auto department = std::make_shared<Department>();
    department->InnerId_ = row["pathDeptId"].asLong();
    department->Name(row["pathDeptName"].asText());
    department->superInnerId_ = row["superDeptId"].asLong();
    department->fullName(row["fullName"].asText());
    department->Id(row["deptNo"].asText());
    add(department, row[key].asText());
  }
}

}  // namespace QVSa
