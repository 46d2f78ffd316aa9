#include "console/UserKeeping.h"

#include "QVSa/frame/Connection.h"
#include "QVSa/frame/ConnectionString.h"

namespace QVSa::console {

namespace {

// No public class lists the jobs of a user yet, and guessing would cost him his jobs: hence the one statement here.
bool holdsJobs(const Console& console, Long userId) {
  Connection connection;
  connection.Open(buildConnString(console.place().server, console.place().database, false));
  Recordset row = connection.Execute("select count(*) from userJob where userId=" + std::to_string(userId));
  return row[0].asLong() > 0;
}

// A stored password that can't be decrypted here reads as an empty one.
bool hasReadablePassword(const Console& console, const String& login) {
  constexpr const char* digestOfNothing = "D41D8CD98F00B204E9800998ECF8427E";
  User user;
  console.connect(user);
  return !user.loginAuth_1(login, digestOfNothing);
}

}  // namespace

String lossOfSave(const Console& console, const User& user) {
  if (!user.builtIn() && holdsJobs(console, user.Id())) return "holds jobs, which would be lost";
  if (user.grpName().find(',') != String::npos) return "is in several groups, of which all would be lost";
  if (!hasReadablePassword(console, user.Login())) return "has no password that can be read here; it would be lost";
  return "";
}

}  // namespace QVSa::console
