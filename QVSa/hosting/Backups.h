#pragma once

#include "QVSa/frame/Frame.h"

namespace QVSa {

// Backups and restores of both databases by a folder: sys.bak and app.bak in it, on the machine of the database server.
// A path with a quote, which would end the file's name in DBMgr's statements, is refused with 5.
//   Backups backups;  backups.connect(server);  if (!backups.backUp("/var/backups/qvsa")) ...
class QVSA_EXPORT Backups : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // DBMgr::BackUpDB; with a password, the copy's reports are locked.
  Boolean backUp(const String& folder, const String& lockPassword = "");
  // DBMgr::RestoreDB, with the password of the log-in `login`; 5 for a semicolon in either.
  Boolean restore(const String& folder, const String& password, const String& login = "sa");
  // Whether the reports of the running system are locked, and so those of its copies.
  Boolean isLocked(Boolean& locked);

  // The files, as the last of these operations named them.
  const String& sysFile() const { return sysFile_; }
  const String& appFile() const { return appFile_; }

 private:
  void nameFiles(const String& folder);

  String sysFile_;
  String appFile_;
};

}  // namespace QVSa
