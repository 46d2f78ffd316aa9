#include "QVSa/numbering/IdMgr.h"

#include "QVSa/resources/Messages.h"
#include "platform/Services.h"
#include "platform/XmlElement.h"

namespace QVSa {

Boolean IdMgr::GetOne(const String& idName) {
  return operation(plain(), [&] {
    Connection connection = open();
    connection.Execute("set nocount on");
    Recordset row = connection.Execute(sql("select * from idRule where idName=<idName>").text("idName", idName));
    if (row.EOF_()) fail("IdMgr", message::numberRuleUnknown, {idName});
    idName_ = idName;
    preFix_ = trim(row["prefix"].asText());
    DateFormat_ = row["ymdStyle"].asInteger();
    numPlace_ = oldNumPlace_ = row["noStyle"].asInteger();
    reuseStyle_ = row["reuseStyle"].asInteger();
    whenSave_ = row["nws"].asInteger();
    oldName_ = idName;
    return true;
  });
}

Boolean IdMgr::Delete(const String& idName) {
  return operation(prefixed(message::numberRuleNotDeleted), [&] {
    Connection connection = open();
    connection.Execute("set nocount on");
    connection.Execute(
        sql("delete from idRule where idName=<idName>").text("idName", idName.empty() ? idName_ : idName));
    return true;
  });
}

Boolean IdMgr::Save() {
  return operation(prefixed(message::numberRuleNotSaved).onIntegrity(message::numberRuleExists), [&] {
    Connection connection;
    connection.CursorLocation(adUseClient);
    connection.Open(connectionString());
    connection.Execute("set nocount on");
    connection.BeginTrans();
    const bool isNew =
        connection.Execute(sql("select idName from idRule where idName=<oldName>").text("oldName", oldName_)).EOF_();
    if (isNew) {
      insertRule(connection);
    } else {
      updateRule(connection);
    }
    connection.CommitTrans();
    oldName_ = idName_;
    return true;
  });
}

void IdMgr::insertRule(Connection& connection) {
  connection.Execute(sql("insert into idRule(idName,preFix,ymdStyle,noStyle,reuseStyle,nws) values"
                         "(<idName>,<preFix>," +
                         text(DateFormat_) + "," + text(numPlace_) + "," + text(reuseStyle_) + "," + text(whenSave_) +
                         ")")
                         .text("idName", idName_)
                         .text("preFix", preFix_));
}

void IdMgr::updateRule(Connection& connection) {
  if (numPlace_ < oldNumPlace_) {
    Recordset used =
        connection.Execute(sql("select count(*) from idRec where idName=<idName>").text("idName", idName_));
    if (used[0].asLong() > 0) fail("IdMgr", message::numbersIssued);
  }
  connection.Execute(sql("Update idRule set "
                         "IdName=<idName>"
                         ",preFix=<preFix>"
                         ",ymdstyle=" +
                         text(DateFormat_) + ",noStyle=" + text(numPlace_) + ",reuseStyle=" + text(reuseStyle_) +
                         ",nws=" + text(whenSave_) + " where idname=<oldName>")
                         .text("idName", idName_)
                         .text("preFix", preFix_)
                         .text("oldName", oldName_));
  if (numPlace_ <= oldNumPlace_) return;
  const String zeros(static_cast<std::size_t>(numPlace_ - oldNumPlace_), '0');
  connection.Execute(sql("update idRec set maxId="
                         " substring(maxId,1,len(maxId)-<l>)"
                         "+'" +
                         zeros +
                         "'"
                         "+substring(maxId,len(maxId)-<l>+1,len(maxId))"
                         " where idName=<idName>")
                         .text("idName", idName_)
                         .number("l", oldNumPlace_));
}

Boolean IdMgr::Rename(const String& strOld, const String& strNew) {
  return operation(plain(), [&] {
    oldName_ = strOld;
    if (!GetOne(strOld)) return false;
    idName_ = strNew;
    return Save();
  });
}

String IdMgr::GetSample() const {
  const std::size_t width = numPlace_ > 1 ? static_cast<std::size_t>(numPlace_) : 1;
  return preFix_ + GetDatePart(DateFormat_, platform::services().localTime()) + String(width - 1, '0') + "1";
}

String IdMgr::InvalidNumbers(const String& Name) {
  return operation(silent(), String("fail"), [&](String& result) {
    platform::XmlElement list("ns");
    Connection connection = open();
    connection.Execute("set nocount on");
    Recordset row = connection.Execute(sql("select theId,ymd from idDel where idName=<idName>"
                                           " and (rcid is null or rcId='')")
                                           .text("idName", Name.empty() ? idName_ : Name));
    const bool none = row.EOF_();
    for (; !row.EOF_(); row.MoveNext()) {
      platform::XmlElement number("n");
      number.setAttribute("ymd", row["ymd"].asText());
      number.setText(row["theId"].asText());
      list.append(std::move(number));
    }
    result = none ? "" : list.text();
  });
}

}  // namespace QVSa
