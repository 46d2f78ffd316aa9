#pragma once

#include "QVSa/frame/Frame.h"

namespace QVSa {

// Makes an embedded installation: a folder with the databases, as they are shipped, and the passwords of its first
// users.
//   Installation installation;
//   if (!installation.make("/var/lib/qvsa", adminPassword, saPassword)) complain(installation.errDescription());
//   user.connect(Installation::serverOf("/var/lib/qvsa"), "QVApp");
class QVSA_EXPORT Installation : private Frame {
 public:
  using Frame::errDescription;
  using Frame::errNumber;

  // The folder has to be missing or empty; it is there complete or not at all. `adminPassword` is that of the user
  // Admin and has to pass the policy of a fresh installation; `saPassword` that of the log-in sa, which restores
  // backups. 5 the path can't be one (see canLieIn) or a ";" in `saPassword`; 58 the folder is not empty; 70, 75 it
  // can't be made; 0x80004005 it would lie on a network file system.
  Boolean make(const String& folder, const String& adminPassword, const String& saPassword);

  // Whether the path of `folder` holds none of ";" and "|", which end a server text, "'", which ends the name of a file
  // in the statement of a restore, and "\", which parts folders in the paths of backups.
  static Boolean canLieIn(const String& folder);
  // Whether `folder` holds an installation.
  static Boolean isThere(const String& folder);
  // The server text of the installation in `folder`.
  static String serverOf(const String& folder);
  // Whether this process uses the deployment secrets that come with the source, which everybody knows. Throws Failure
  // where a file of secrets is there and can't be used.
  static Boolean hasBuiltInSecrets();
};

}  // namespace QVSa
