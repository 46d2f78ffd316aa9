#include "QVSa/hosting/internal/FirstAdministrator.h"

#include "QVSa/frame/Connection.h"
#include "QVSa/frame/ConnectionString.h"
#include "QVSa/identity/User.h"

namespace QVSa {

Boolean isAdministratorWaiting(const String& server) {
  Connection connection;
  connection.Open(buildConnString(server, "", false));
  return !connection
              .Execute("select userId from users where userLogin='Admin' and accstate<>0 and isnull(userPwd,'')=''")
              .EOF_();
}

void setAdministratorsPassword(const String& server, const String& password) {
  constexpr const char* job = "1";
  User admin;
  const Boolean loaded = admin.connect(server) && admin.GetOne(User::byLogin, "Admin");
  admin.Pwd(password);
  admin.regState(accountNormal);
  admin.setJobs(job);
  if (!loaded || !admin.Save()) throw Failure(admin.errNumber(), "Installation", admin.errDescription());
}

}  // namespace QVSa
