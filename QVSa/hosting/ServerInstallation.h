#pragma once

#include "QVSa/frame/Frame.h"

namespace QVSa {

// Makes the databases on a SQL Server, the log-in QVUser, and the administrator's password.
//   ServerInstallation installation;
//   if (!installation.make("db1,1433", "sa", saPassword, adminPassword)) complain(installation.errDescription());
//   user.connect("db1,1433", "QVApp");
class QVSA_EXPORT ServerInstallation : private Frame {
 public:
  using Frame::errDescription;
  using Frame::errNumber;

  // Does what is not done yet, as a log-in that may make databases and log-ins; after a failure it may be called again.
  // A database is filled as a whole or not at all, and one that holds tables is left alone. QVUser gets the password
  // that `server` has behind a "|", else the one of the deployment secrets; if it is there already, its password stays.
  // `adminPassword` is that of the user Admin, who gets it as long as he has none, and has to pass the policy. 5 a ";"
  // in a log-in or a password; 0x80040E14 and 50000 a database's texts heed case; else the number of what failed.
  Boolean make(const String& server, const String& login, const String& password, const String& adminPassword);

  // Whether `server` has all of it. False also where it can't be asked.
  Boolean isComplete(const String& server);

  // Whether the database compares texts without regard to case, as it has to. False also after a failure.
  Boolean ignoresCase(const String& server, const String& database);

  // What `make` sends before it sets the administrator's password, as T-SQL with GO between the batches, for an
  // administrator who wants to read it first. It holds the password of QVUser.
  static String script(const String& server);
  // What brings databases that an earlier release has filled to the layout of this one. The library works without it.
  static String upgradeScript();
};

}  // namespace QVSa
