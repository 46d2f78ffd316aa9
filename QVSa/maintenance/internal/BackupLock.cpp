#include "QVSa/maintenance/internal/BackupLock.h"

#include "QVSa/frame/Secrets.h"
#include "platform/SecretMessage.h"

namespace QVSa {

std::optional<BackupLock> BackupLock::read(const String& cipher) {
  const String text = platform::decryptText(cipher, deploymentSecrets().backupLockKey());
  if (text.empty()) return std::nullopt;
  const std::size_t bar = text.find('|');
  if (bar == String::npos) return BackupLock{text, ""};
  return BackupLock{text.substr(0, bar), text.substr(bar + 1)};
}

String BackupLock::cipher() const {
  return platform::encryptText(list + "|" + pwd, deploymentSecrets().backupLockKey());
}

}  // namespace QVSa
