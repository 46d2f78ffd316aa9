#pragma once

#include <array>

#include "QVSa/values/Values.h"

namespace QVSa {

// The secrets that the installations of one site share: the password of the log-in QVUser, in pieces, and the keys of
// texts that are no user's own. What each one is for, DeploymentSecrets.h tells.
struct Secrets {
  bool builtIn = false;  // those that come with the source, which everybody knows
  String connPwdHead;
  Long connPwdNumber = 0;
  String connPwdWordA;
  String connPwdWordB;
  String connPwdTail;
  std::array<unsigned char, 10> rotatedKeyCharacters{};
  Long backupLockKeyStart = 0;
  String templatePwdKey;
  String defaultTemplatePwd;

  // Of this build, out of its header.
  static Secrets ofBuild();
  static Secrets madeUp();
  // As `fileText` writes them. Throws Failure: 5 a line is unknown, missing or can't be used, named by its number or
  // name and never by its value; else as platform::readPrivateFile.
  static Secrets ofFile(const String& path);
  String fileText() const;

  // The password of QVUser, put together at each call and never stored whole.
  String loginPassword() const;
  // The ten characters of the rotated key, read from position `start` (0 to 9; anything else is taken as the nearer of
  // the two) to their end and then from their beginning.
  String rotatedKey(Integer start) const;
  // What the lock of a backup is encrypted under.
  String backupLockKey() const { return rotatedKey(static_cast<Integer>(backupLockKeyStart)); }
};

// The file that the secrets of this process come from: QVSA_SECRETS where that is set, else /etc/qvsa/secrets. Empty
// where QVSA_SECRETS is set to nothing: those of the build.
String secretsFile();

// The secrets of this process: those of its file or, where there is no /etc/qvsa/secrets, of the build. Read at the
// first call that succeeds, and kept. For any thread. Throws as Secrets::ofFile does.
const Secrets& deploymentSecrets();

}  // namespace QVSa
