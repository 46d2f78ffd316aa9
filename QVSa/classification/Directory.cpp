#include "QVSa/classification/Directory.h"

#include "platform/XmlElement.h"

namespace QVSa {
namespace {

String textOr(const Field& field, const String& forNull) { return field.isNull() ? forNull : field.asText(); }

platform::XmlElement elementOf(Recordset& row) {
  platform::XmlElement element("d");
  element.setAttribute("super", row["superClass"].asText());
  element.setAttribute("path", row["path"].asText());
  element.setAttribute("full", row["fullName"].asText());
  element.setAttribute("creUserId", textOr(row["CreUId"], "0"));
  element.setAttribute("creUserName", row["CreUName"].asText());
  element.setAttribute("createTime", textOr(row["CreateTime"], "0"));
  element.setAttribute("updUserId", textOr(row["UpdUId"], "0"));
  element.setAttribute("updUserName", row["UpdUName"].asText());
  element.setAttribute("updTime", textOr(row["UpdTime"], "0"));
  element.setAttribute("OtherCanDesign", row["OtherCanUpd"].asText());
  element.setAttribute("ordno", row["ordNo"].asText());
  element.setAttribute("ordpath", row["ordPath"].asText());
  element.setText(row["class"].asText());
  return element;
}

}  // namespace

String Directory::GetAll(const String& SuperDir) {
  return operation(plain(), [&] {
    platform::XmlElement list("ds");
    Connection connection = open();
    const String condition = SuperDir.empty()         ? ""
                             : trim(SuperDir).empty() ? " where superClass = '' or superClass is null "
                                                      : " where superClass = <SD> ";
    Recordset row = connection.Execute(
        sql(" select class , isnull( superClass , '' ) as superClass "
            " , isnull( path , '' ) as path "
            " , isnull( fullName , '' ) as fullName , CreUId , CreUName , CreateTime , UpdUId , UpdUName , UpdTime "
            ", OtherCanUpd "
            " , isnull( ordNo , 0 ) as ordNo , isnull( ordPath , '' ) as ordPath "
            " from RptDirectory " +
            condition + " order by ( len( path ) - len( replace( path , '.' , '' ))) , ordpath , ordNo ")
            .text("SD", SuperDir));
    for (; !row.EOF_(); row.MoveNext()) list.append(elementOf(row));
    return list.text();
  });
}

Boolean Directory::GetOne(Integer, const Variant& keyValue) {
  return operation(plain(), [&] {
    Connection connection = open();
    Recordset row = connection.Execute(sql("select * from RptDirectory "
                                           " where class=<KeyValue>")
                                           .text("KeyValue", keyValue));
    if (!row.EOF_()) read(row);
    return true;
  });
}

void Directory::read(Recordset& row) {
  Class_ = oldClass_ = row["class"].asText();
  superClass_ = oldSuperClass_ = row["superClass"].asText();
  fullName_ = row["fullName"].asText();
  path_ = row["path"].asText();
  otherCanDesign_ = row["OtherCanUpd"].asBoolean();
  creUserId_ = row["CreUId"].asLong();
  creUserName_ = row["CreUName"].asText();
  createTime_ = row["CreateTime"].asDate();
  updUserId_ = row["UpdUId"].asLong();
  upduserName_ = row["UpdUName"].asText();
  updTime_ = row["UpdTime"].asDate();
  ordNo_ = row["ordNo"].asInteger();
  ordPath_ = row["ordPath"].asText();
}

// The commas around the deleted name, and the dots of its path, stay as what was above it: ".,C" and ".C.".
Boolean Directory::Delete(const String& Class) {
  return operation(plain(), [&] {
    const String name = Class.empty() ? Class_ : Class;
    Connection connection = open();
    String path, fullName;
    {
      Recordset row =
          connection.Execute(sql("select path,fullName from RptDirectory where class=<class>").text("class", name));
      if (row.EOF_()) fail("Directory", message::classUnknown, {name});
      path = row["path"].asText();
      fullName = row["fullName"].asText();
    }
    connection.BeginTrans();
    connection.Execute(sql("delete from RptDirectory where class=<class>").text("class", name));
    connection.Execute(sql("update RptDirectory set "
                           " path=replace(path,<oldpath>,<path>) "
                           " ,fullName=substring(replace(','+fullName+',',<oldfullname>,<fullname>),2,"
                           "len(replace(','+fullName+',',<oldfullname>,<fullname>) )-2) "
                           " where path like <oldpath%> ")
                           .text("oldpath", path)
                           .text("path", ".")
                           .text("oldfullname", "," + fullName + ",")
                           .text("fullname", ",.,")
                           .text("oldpath%", path + "%"));
    connection.CommitTrans();
    return true;
  });
}

}  // namespace QVSa
