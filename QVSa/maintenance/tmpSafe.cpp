#include "QVSa/maintenance/tmpSafe.h"

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/frame/DeploymentSecrets.h"
#include "platform/SecretMessage.h"

namespace QVSa {

Boolean tmpSafe::connect(const String& ServerName, const String& DBName) {
  return operation(plain(), [&] {
    setServer(ServerName);
    setDBName(DBName);
    setConnectionString(buildConnString(ServerName, DBName, false));
    Connection connection = open();
    Recordset row = connection.Execute("select top 1 * from QVTmpSafe");
    if (row.EOF_()) return true;
    protectPwd_ = Password(platform::decryptText(row["protectPwd"].asText(), secrets::templatePwdKey));
    loadedPwd_ = protectPwd_;
    return true;
  });
}

Boolean tmpSafe::Save(Boolean changeAll) {
  return operation(plain(), [&] {
    Connection connection = open();
    connection.Execute(sql(" update QVTmpSafe set protectPwd = <Pwd>")
                           .text("Pwd", platform::encryptText(protectPwd_.text(), secrets::templatePwdKey)));
    if (changeAll) {
      connection.Execute("update repTmps set rtpwd=''");
    } else if (loadedPwd_.text().empty()) {
      dropDefaultPasswords(connection);
    }
    return true;
  });
}

void tmpSafe::dropDefaultPasswords(Connection& connection) {
  Recordset row;
  row.Open("select rtUid,rtPwd from repTmps where rtPwd is not null and rtPwd<>''", connection, 1, 3);
  for (; !row.EOF_(); row.MoveNext()) {
    const Password own(platform::decryptText(row["rtPwd"].asText(), secrets::templatePwdKey));
    if (own.text() == secrets::defaultTemplatePwd) row["rtPwd"].Value("");
  }
}

Boolean tmpSafe::getPwd(const String& SessionId, String& x) {
  return operation(plain(), [&] {
    Connection connection;
    connection.Open(buildConnString(server(), "", false));
    Recordset row = connection.Execute(sql(" select sesid from sesLog where sesId = <SesID>").text("SesID", SessionId));
    if (row.EOF_()) {
      x.clear();
      fail("tmpSafe", 33301);
    }
    x = protectPwd_.text();
    return true;
  });
}

}  // namespace QVSa
