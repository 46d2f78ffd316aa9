#pragma once

#include "QVSa/frame/Frame.h"
#include "QVSa/frame/Password.h"

namespace QVSa {

// The one password that protects report templates. It can be set, and read by who holds a live session.
//   tmpSafe safe;  safe.connect(server);  safe.protectPwd("Secret-1");  safe.Save();
class QVSA_EXPORT tmpSafe : private Frame {
 public:
  // Takes effect with Save.
  void protectPwd(const String& value) { protectPwd_ = StoredPassword(value); }
  using Frame::errNumber;
  String errDesc() const { return errDescription(); }

  // Keeps both names and reads the password.
  Boolean connect(const String& ServerName, const String& DBName = "");
  // Stores the password. With `changeAll` every template loses the password of its own; else, where there was none at
  // the time of `connect`, the templates that still have the default one do. Not one transaction: a failure behind the
  // first step leaves the new password in place.
  Boolean Save(Boolean changeAll = false);
  // Gives the password to the holder of session `SessionId`. An empty `x` and readingIllegal (0x80048215) for no such
  // session, readingFailed (0x80048216) where the stored password does not decrypt.
  Boolean getPwd(const String& SessionId, String& x);

 private:
  void dropDefaultPasswords(Connection& connection);

  StoredPassword protectPwd_;
  StoredPassword loadedPwd_;  // as it stood after connect
};

}  // namespace QVSa
