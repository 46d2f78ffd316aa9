#include "QVSa/maintenance/tmpSafe.h"

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/frame/Secrets.h"

namespace QVSa {

Boolean tmpSafe::connect(const String& ServerName, const String& DBName) {
  return operation(plain(), [&] {
    setServer(ServerName);
    setDBName(DBName);
    setConnectionString(buildConnString(ServerName, DBName, false));
    Connection connection = open();
    Recordset row = connection.Execute("select top 1 * from QVTmpSafe");
    if (row.EOF_()) return true;
    protectPwd_ = StoredPassword::read(row["protectPwd"].asText(), deploymentSecrets().templatePwdKey);
    loadedPwd_ = protectPwd_;
    return true;
  });
}

Boolean tmpSafe::Save(Boolean changeAll) {
  return operation(plain(), [&] {
    Connection connection = open();
    connection.Execute(sql(" update QVTmpSafe set protectPwd = <Pwd>")
                           .secret("Pwd", protectPwd_.encrypted(deploymentSecrets().templatePwdKey)));
    if (changeAll) {
      connection.Execute("update repTmps set rtpwd=''");
    } else if (loadedPwd_.is("")) {
      dropDefaultPasswords(connection);
    }
    return true;
  });
}

void tmpSafe::dropDefaultPasswords(Connection& connection) {
  Recordset row;
  row.Open("select rtUid,rtPwd from repTmps where rtPwd is not null and rtPwd<>''", connection, adOpenKeyset,
           adLockOptimistic);
  for (; !row.EOF_(); row.MoveNext()) {
    const auto own = StoredPassword::read(row["rtPwd"].asText(), deploymentSecrets().templatePwdKey);
    if (own.is(deploymentSecrets().defaultTemplatePwd)) row["rtPwd"].Value("");
  }
}

Boolean tmpSafe::getPwd(const String& SessionId, String& x) {
  return operation(plain(), [&] {
    Connection connection;
    connection.Open(buildConnString(server(), "", false));
    Recordset row = connection.Execute(sql(" select sesid from sesLog where sesId = <SesID>").text("SesID", SessionId));
    x.clear();
    if (row.EOF_()) fail("tmpSafe", message::readingIllegal);
    // A host would take the empty text for a template without protection.
    if (!protectPwd_.isReadable()) fail("tmpSafe", message::readingFailed);
    x = protectPwd_.text();
    return true;
  });
}

}  // namespace QVSa
