#pragma once

#include "QVSa/frame/Frame.h"

namespace QVSa {

struct BackupLock;

// Full backups of QVSys and QVApp as one pair of files, and the way back.
//   DBMgr manager;
//   if (!manager.BackUpDB(server, "D:\\bak\\sys.bak", "D:\\bak\\app.bak")) report(manager.errDescription());
// File paths are those of the database server; they go into the statements as they are and must hold no quote.
class QVSA_EXPORT DBMgr : private Frame {
 public:
  using Frame::errDescription;
  using Frame::errNumber;

  // Writes both files, what they held before is gone, and checks them. With a `tpPwd` the copy is locked: its reports
  // count as hidden until decryptTmps; the lock stays on the running system as well. `regPwd` plays no part.
  // False with notBackedUp (0x80040B5A) for any failure; nothing is undone, a file that was written stays.
  Boolean BackUpDB(const String& ServerName, const String& sysFile, const String& appFile, const String& regPwd = "",
                   const String& tpPwd = "");

  // Replaces QVSys, then QVApp, with the login `saUid`, whose name and password must hold no semicolon; waits without
  // limit until everybody else has left each of them. An older system database is brought up to the present tables,
  // sessions and check-outs are cleared. `flag` plays no part. Each database is restored whole or not at all, the two
  // not together: the system database stays restored where the application database fails. applicationBackupMissing
  // (0x80040B57) or systemBackupMissing (0x80040B58) a file is missing, as seen from here.
  Boolean RestoreDB(const String& ServerName, const String& sysFile, const String& appFile, const String& saPwd,
                    Boolean flag = false, const String& saUid = "sa");

  // Lifts the lock of a restored copy. True as well where there is none; protectionPasswordWrong (0x80040B5D) for a
  // wrong password.
  Boolean decryptTmps(const String& server, const String& Pwd);

 private:
  Boolean readBackupLock(Connection& connection, BackupLock& lock);
  Boolean writeBackupLock(Connection& connection, BackupLock lock);
  // DBMgrRestore.cpp
  Boolean restoreOneDB(const String& DBName, const String& bakFile);
  static String restoreStatement(const String& DBName, const String& bakFile,
                                 const std::vector<std::vector<Variant>>& files);
  void upgradeSysDB(const String& ServerName);
  void clearTransient(const String& ServerName);

  String saConnString_;
};

}  // namespace QVSa
