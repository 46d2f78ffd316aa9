#include <optional>

#include "QVSa/classification/Directory.h"

namespace QVSa {

// What those below a node build their own texts on; nothing for NULL.
struct Directory::Ancestry {
  std::optional<String> path;
  std::optional<String> fullName;
  String ordPath;
};

// Where a save puts the node.
struct Directory::Place {
  String path;
  String fullName;
  bool isRoot;
  String superOrdPath;
  Long ordNo = 0;

  // Below a node without a place in the order there is none either.
  bool isOrdered() const { return isRoot || !superOrdPath.empty(); }
  String ordPath() const { return (isRoot ? "" : superOrdPath + ".") + threeDigits(ordNo); }
};

Boolean Directory::Save() { return oldClass_.empty() ? InsertDir() : UpdateDir(); }

Boolean Directory::InsertDir() {
  return operation(plain(), [&] {
    Connection connection = open();
    Ancestry superior;
    if (!superClass_.empty()) {
      Recordset row = connection.Execute(
          sql(" select path , fullName , ordPath from RptDirectory where class = <class> ").text("class", superClass_));
      if (row.EOF_()) fail("Directory", message::classUnknown, {superClass_});
      superior = readAncestry(row);
    }
    Place place = placeBelow(superior);
    place.ordNo = nextPosition(connection);
    insertRow(connection, place);
    oldClass_ = Class_;
    fullName_ = place.fullName;
    return true;
  });
}

Boolean Directory::UpdateDir() {
  return operation(plain(), [&] {
    Connection connection = open();
    Ancestry superior;
    if (!superClass_.empty()) {
      Recordset row = connection.Execute(
          sql("select path,fullName , ordPath from RptDirectory where class=<class>").text("class", superClass_));
      if (!row.EOF_()) superior = readAncestry(row);
    }
    Place place = placeBelow(superior);
    place.ordNo = nextPosition(connection);

    std::optional<Ancestry> stored;
    if (Class_ != oldClass_ || superClass_ != oldSuperClass_) {
      Recordset row = connection.Execute(
          sql("select path,fullName from RptDirectory where class=<class>").text("class", oldClass_));
      if (row.EOF_()) fail("Directory", message::classUnknown, {oldClass_});
      stored = Ancestry{row["path"].asText(), row["fullName"].asText(), ""};
    }

    connection.BeginTrans();
    updateRow(connection, place);
    if (stored) rewriteBelow(connection, *stored, place);
    reorderBelow(connection, Class_);
    if (ordNo_ > 0) closeGap(connection);
    connection.CommitTrans();

    oldClass_ = Class_;
    oldSuperClass_ = superClass_;
    fullName_ = place.fullName;
    path_ = place.path;
    return true;
  });
}

Directory::Ancestry Directory::readAncestry(Recordset& row) {
  Ancestry ancestry;
  if (!row["path"].isNull()) ancestry.path = row["path"].asText();
  if (!row["fullName"].isNull()) ancestry.fullName = row["fullName"].asText();
  ancestry.ordPath = row["ordPath"].asText();
  return ancestry;
}

Directory::Place Directory::placeBelow(const Ancestry& superior) const {
  return {superior.path.value_or(".") + Class_ + ".", superior.fullName ? *superior.fullName + "," + Class_ : Class_,
          superClass_.empty(), superior.ordPath};
}

// The node itself is counted too where it stays below the same superior.
Long Directory::nextPosition(Connection& connection) {
  const String condition =
      superClass_.empty() ? " where superclass = '' or superclass is null " : " where superclass = <SC> ";
  Recordset row = connection.Execute(sql(" select count(*) from rptdirectory " + condition).text("SC", superClass_));
  return row[0].asLong() + 1;
}

void Directory::insertRow(Connection& connection, const Place& place) {
  const bool ordered = place.isOrdered();
  SqlText statement =
      sql(String("insert into RptDirectory ( "
                 " class , superClass , fullName , path ") +
          (ordered ? " , ordNo , ordPath " : "") +
          " , CreUId , CreUName , CreateTime , UpdUId , UpdUName , UpdTime , OtherCanUpd ) "
          " values ( "
          " <class> , <superClass> , <fullName> , <path> " +
          (ordered ? " , <ordNo> , <ordPath> " : "") +
          " , <CreUId> , <CreUName> , <CreateTime> , <UpdUId> , <UpdUName> , <UpdTime> , <OtherCanUpd> ) ");
  fill(statement.number("ordNo", place.ordNo).text("ordPath", place.ordPath()), place);
  connection.Execute(statement);
}

void Directory::updateRow(Connection& connection, const Place& place) {
  SqlText statement =
      sql(String(" update RptDirectory set ") + (Class_ != oldClass_ ? " class = <class> , " : "") +
          " superClass = <superClass> , "
          " fullName = <fullName> , "
          " path = <path> "
          " , CreUId = <CreUId> , "
          " CreUName = <CreUName> , "
          " CreateTime = <CreateTime> , "
          " UpdUId = <UpdUId> , "
          " UpdUName = <UpdUName> , "
          " UpdTime = <UpdTime> , "
          " OtherCanUpd = <OtherCanUpd> " +
          (place.isOrdered() ? " , ordNo = <OrdNo> , ordPath = <OrdPath> " : "") + " where class = <oldclass> ");
  fill(statement.number("OrdNo", place.ordNo).text("OrdPath", place.ordPath()).text("oldclass", oldClass_), place);
  connection.Execute(statement);
}

void Directory::fill(SqlText& statement, const Place& place) const {
  statement.text("class", Class_)
      .text("superClass", superClass_)
      .text("fullName", place.fullName)
      .text("path", place.path)
      .number("CreUId", creUserId_)
      .text("CreUName", creUserName_)
      .date("CreateTime", createTime_)
      .number("UpdUId", updUserId_)
      .text("UpdUName", upduserName_)
      .date("UpdTime", updTime_)
      .number("OtherCanUpd", otherCanDesign_ ? 1 : 0);
}

// The commas around both names let whole names match alone. The row itself was written before and matches no longer.
void Directory::rewriteBelow(Connection& connection, const Ancestry& stored, const Place& place) {
  connection.Execute(sql(" update RptDirectory set "
                         " path = replace( path , <oldpath> , <path> ) "
                         " , fullName = substring( replace( ',' + fullName + ',' , <oldfullname> , <fullname> ) , 2 , "
                         "len( replace(','+fullName+',',<oldfullname>,<fullname>) )-2) "
                         " where path like <oldpath%> ")
                         .text("oldpath", *stored.path)
                         .text("path", place.path)
                         .text("oldfullname", "," + *stored.fullName + ",")
                         .text("fullname", "," + place.fullName + ",")
                         .text("oldpath%", *stored.path + "%"));
}

}  // namespace QVSa
