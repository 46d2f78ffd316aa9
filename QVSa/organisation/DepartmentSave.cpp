#include "QVSa/organisation/Department.h"
#include "QVSa/resources/Messages.h"

namespace QVSa {
namespace {

const char* const root = "_root";
constexpr std::size_t longestPath = 850;  // of the column

String joinNames(const String& superior, const String& name) { return superior + LoadResString(1005) + trim(name); }

}  // namespace

// Where the department is to stand.
struct Department::Place {
  String path;
  String fullName;
};

// The superior as a department below it sees it; empty where its own column is NULL.
struct Department::Superior {
  String path;
  String fullNameBelow;
};

// What the row held before the update.
struct Department::Stored {
  String path;
  String fullName;
  String superNo;
  String superFullName;
  String deptName;
};

Boolean Department::Save() {
  return operation(plain(), [&]() -> Boolean {
    if (Id_.empty() || Name_.empty()) return refuse(message::departmentIncomplete);
    return InnerId_ == 0 ? insertDept() : updateDept();
  });
}

Boolean Department::insertDept() {
  Connection connection = open();
  connection.Execute("set nocount on");
  Place place{".", trim(Name_)};
  if (Super_.empty()) {
    superInnerId_ = 0;
  } else {
    const auto superior = findSuper(connection);
    if (!superior) return refuse(message::superiorUnknown);
    place = {trim(superior->path), superior->fullNameBelow};
  }
  requireRoomBelow(place.path);

  connection.Execute(sql("insert into departments(deptNo,deptName,superDept,fullName,isOrg,isOuter) "
                         " values(<deptNo>,<deptName>,<superDept>,<fullName>,<isOrg>,<isOuter>)")
                         .number("superDept", superInnerId_)
                         .number("isOrg", isOrg_)
                         .number("isOuter", isOuter_ ? 1 : 0)
                         .text("deptNo", Id_)
                         .text("deptName", Name_)
                         .text("fullName", place.fullName));
  {
    Recordset row = connection.Execute("select scope_identity()");
    if (row.EOF_()) fail("Department", message::rowNotAdded);
    InnerId_ = row[0].asLong();
  }
  // In two steps, as the path holds the id that only the insert hands out.
  connection.Execute(sql("update departments"
                         " set path=<path> where deptId=" +
                         text(InnerId_))
                         .text("path", place.path + text(InnerId_) + "."));
  fullName_ = place.fullName;
  fullId_.clear();
  return true;
}

// The last statement of the insert must not find that the path is too long. The new id is not known before, but it has
// no fewer digits than the superior's, which was given out earlier.
void Department::requireRoomBelow(const String& path) const {
  if (path.size() + text(superInnerId_).size() + 1 <= longestPath) return;
  throw Failure(number::range, "Department",
                "The department lies too deep in the tree: its path would be longer than " +
                    text(static_cast<Long>(longestPath)) + " characters.");
}

Boolean Department::updateDept() {
  Connection connection = open();
  connection.Execute("set nocount on");
  const Stored stored = readStored(connection);
  const auto place = locate(connection, stored);
  if (!place) return refuse(message::superiorUnknown);

  connection.BeginTrans();
  updateRow(connection, *place);
  const bool hasChanged = place->path != stored.path || Name_ != stored.deptName;
  // The pattern of no path would be that of every department.
  if (hasChanged && !stored.path.empty()) rewriteSubtree(connection, stored, *place);
  connection.CommitTrans();
  fullName_ = place->fullName;
  return true;
}

std::optional<Department::Superior> Department::findSuper(Connection& connection) {
  Recordset row = connection.Execute(sql("select deptId,path,fullName,deptNo "
                                         "from departments where deptNo=<super>")
                                         .text("super", Super_));
  if (row.EOF_()) return std::nullopt;
  superInnerId_ = row["deptId"].asLong();
  Superior superior;
  superior.path = row["path"].asText();
  if (row["fullName"].isNull()) return superior;
  superior.fullNameBelow = row["deptNo"].asText() == root ? Name_ : joinNames(trim(row["fullName"].asText()), Name_);
  return superior;
}

Department::Stored Department::readStored(Connection& connection) {
  Recordset row =
      connection.Execute(sql("select d1.path,d1.fullName,superNo=d2.deptNo,superFullName=d2.fullName,d1.deptName"
                             " from departments d1,departments d2"
                             " where d1.deptId=<deptId> and d1.superDept*=d2.deptId")
                             .number("deptId", InnerId_));
  return {row["path"].asText(), row["fullName"].asText(), row["superNo"].asText(), row["superFullName"].asText(),
          row["deptName"].asText()};
}

std::optional<Department::Place> Department::locate(Connection& connection, const Stored& stored) {
  const String own = text(InnerId_) + ".";
  if (Super_.empty()) {
    superInnerId_ = 0;
    return Place{"." + own, trim(Name_)};
  }
  // A row without a path, as an insert leaves it that lost its last statement, gets one from the superior.
  if (Super_ == stored.superNo && !stored.path.empty()) {
    return Place{stored.path, Super_ == root ? trim(Name_) : joinNames(stored.superFullName, Name_)};
  }
  const auto superior = findSuper(connection);
  if (!superior) return std::nullopt;
  return Place{superior->path + own, superior->fullNameBelow};
}

void Department::updateRow(Connection& connection, const Place& place) {
  connection.Execute(sql("update departments "
                         "set deptNo=<deptNo>,"
                         "deptName=<deptName>,"
                         "fullName=<fullName>,"
                         "path=<path>,"
                         "superDept=<superDept>,"
                         "isOrg=" +
                         text(isOrg_) + " where deptId=<oldId>")
                         .number("superDept", superInnerId_)
                         .number("oldId", InnerId_)
                         .text("path", place.path)
                         .text("deptNo", Id_)
                         .text("deptName", Name_)
                         .text("fullName", place.fullName));
}

// The row itself is left out: updateRow wrote it.
void Department::rewriteSubtree(Connection& connection, const Stored& stored, const Place& place) {
  connection.Execute(sql("update departments set "
                         "path=replace(path,<path_old>,<path>),"
                         "fullName=replace(fullName,<fullName_old>,<fullName>)"
                         " where path like <pathPattern>"
                         " and deptId<>" +
                         text(InnerId_))
                         .text("path_old", stored.path)
                         .text("path", place.path)
                         .text("pathPattern", stored.path + "%")
                         .text("fullName_old", stored.fullName)
                         .text("fullName", place.fullName));
}

}  // namespace QVSa
