#include "QVSa/frame/ConnectionString.h"
#include "QVSa/identity/User.h"
#include "QVSa/settings/MachineSettings.h"
#include "platform/Services.h"

namespace QVSa {

Boolean User::isWindowsUser(const String& Pwd) const {
  const auto& ntlmLogon = platform::services().ntlmLogon;
  return ntlmLogon && ntlmLogon(Login_, Domain_, Pwd);
}

Boolean User::isInDirectory(Connection& connection, const String& Pwd, Boolean authLd) {
  String ldHost;
  Long ldPort = 0;
  String ldBindDN;
  Password ldPasswd;
  {
    Recordset row = connection.Execute(sql("select ldHost=isnull(ldHost,''),ldPort=isnull(ldPort,389)"
                                           ",ldBaseDN=isnull(ldBaseDN,'')"
                                           ",ldBindDN=isnull(ldBindDN,''),ldPasswd=isnull(ldPasswd,'')"
                                           " from homeInfo"
                                           " where id=1 and ldEnable=1")
                                           .text("ldsName", ldsName_));
    if (!row.EOF_()) {
      ldHost = row["ldHost"].asText();
      ldPort = row["ldPort"].asLong();
      ldBindDN = row["ldBindDN"].asText();
      ldPasswd = Password(unscrambleText(row["ldPasswd"].asText()));
    }
  }
  Boolean ok = false;
  if (authLd) {
    ldapBind(ldHost, ldPort, ldBindDN, ldPasswd.text(), dn_, ok);
  } else if (!dn_.empty() && !Pwd.empty()) {
    // Without a name or a password a directory takes the bind as nobody's: it would prove nothing.
    ldapBind(ldHost, ldPort, dn_, Pwd, dn_, ok);
  }
  return ok;
}

// Whether the bind succeeds and the search finds somebody.
void User::ldapBind(const String& host, Long port, const Variant& bindDn, const String& password, String& dn,
                    Boolean& ok) {
  ok = false;
  const auto& getUsersFromLD = platform::services().getUsersFromLD;
  const auto security = directorySecurity();
  if (!getUsersFromLD || !security) return;
  platform::DirectoryQuery query;
  query.host = host;
  query.port = port;
  query.bindDn = bindDn.toText();
  query.searchText = dn.empty() ? query.bindDn : dn;
  query.security = *security;
  Integer status = 0;
  ok = !getUsersFromLD(query, password, status).empty();
}

}  // namespace QVSa
