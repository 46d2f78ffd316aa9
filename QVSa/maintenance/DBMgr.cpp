#include "QVSa/maintenance/DBMgr.h"

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/maintenance/internal/BackupLock.h"

namespace QVSa {

Boolean DBMgr::BackUpDB(const String& ServerName, const String& sysFile, const String& appFile, const String&,
                        const String& tpPwd) {
  return operation(prefixed(message::notBackedUp).number(messageNumber(message::notBackedUp)), [&] {
    Connection connection;
    connection.Open(buildConnString(ServerName, "master", false));
    BackupLock before;
    if (!tpPwd.empty()) {
      connection.Execute("use QVSys");
      readBackupLock(connection, before);
      writeBackupLock(connection, {"", tpPwd});
    }
    connection.Execute("use master");
    connection.CommandTimeout(7200);
    connection.Execute(" backup database QVApp to DISK = '" + appFile + "' with init");
    connection.Execute(" backup database QVSys to DISK = '" + sysFile + "' with init");
    connection.Execute("restore verifyonly from disk='" + sysFile + "'");
    connection.Execute("restore verifyonly from disk='" + appFile + "'");
    // Master is the current database and has no roles: the lock stays as it was set above.
    if (!tpPwd.empty()) writeBackupLock(connection, before);
    return true;
  });
}

// What fails in the next two is passed over; but a backup that want of memory left unlocked must not be called done.

// The server refuses this statement for its isnull of one argument, so that the lock reads as empty.
Boolean DBMgr::readBackupLock(Connection& connection, BackupLock& lock) try {
  if (connection.State() != 1) return false;
  Recordset row;
  row.Open("select isnull(roleSpec) from roles where roleId=4", connection);
  if (row.EOF_()) return false;
  const auto found = BackupLock::read(row[0].asText());
  if (!found) return false;
  lock = *found;
  return true;
} catch (const Failure&) {
  return false;
}

Boolean DBMgr::writeBackupLock(Connection& connection, BackupLock lock) try {
  if (connection.State() != 1) return false;
  if (lock.list.empty()) {
    std::vector<String> reports;
    for (Recordset row = connection.Execute("select repId from reports"); !row.EOF_(); row.MoveNext())
      reports.push_back(row[0].asText());
    lock.list = join(reports, ".");
  }
  if (lock.list.empty()) return true;
  connection.Execute(sql("update roles set roleSpec=<s> where roleId=4").text("s", lock.cipher()));
  return true;
} catch (const Failure&) {
  return false;
}

Boolean DBMgr::decryptTmps(const String& server, const String& Pwd) {
  return operation(plain(), [&]() -> Boolean {
    Connection connection;
    connection.Open(buildConnString(server, "", false));
    Recordset row;
    row.Open("select isnull(roleSpec,'') from roles where roleName='Report Owners'", connection);
    const auto lock = BackupLock::read(row.EOF_() ? String() : row[0].asText());
    if (!lock) return true;
    if (lock->pwd != Pwd) return refuse(message::protectionPasswordWrong);
    connection.Execute("update roles set roleSpec='' where roleName='Report Owners'");
    return true;
  });
}

}  // namespace QVSa
