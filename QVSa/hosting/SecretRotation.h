#pragma once

#include "QVSa/frame/Frame.h"

namespace QVSa {

struct Secrets;

// Moves an installation from the deployment secrets of this process to those of a file: the password of the log-in
// QVUser, and every text that is encrypted under a deployment key. From then on only a process with the new secrets
// can use it.
//   SecretRotation rotation;  rotation.connect(server);
//   if (!rotation.rotate("/etc/qvsa/secrets.new", saPassword)) complain(rotation.errDescription());
class QVSA_EXPORT SecretRotation : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // One transaction, by the log-in sa: whole or not at all. A text that the present secrets can't read stays as it is.
  // 5 the file can't be used, a ";" in the password, or the log-in has the new secrets' password already;
  // else as reading a file of secrets fails.
  Boolean rotate(const String& newFile, const String& saPassword);
  // The texts alone, for a system database that was restored from a backup of before the log-in was moved.
  Boolean rotateTexts(const String& newFile, const String& saPassword);

  // How many texts the last of these moved, and what it could not read, by name.
  Long moved() const { return moved_; }
  const std::vector<String>& unread() const { return unread_; }

 private:
  Connection openSystem(const String& saPassword) const;
  Boolean logsIn(const Secrets& secrets) const;
  void moveTexts(Connection& connection, const Secrets& to);
  // The one text that `query` gives; NULL and an empty one stay.
  void moveText(Connection& connection, const String& query, const String& update, const String& oldKey,
                const String& newKey, const String& name);
  void moveTemplates(Connection& connection, const Secrets& to);
  // The text in the new key; `cipher` itself where the old one can't read it, which is noted under `name`.
  String movedText(const String& cipher, const String& oldKey, const String& newKey, const String& name);

  Long moved_ = 0;
  std::vector<String> unread_;
};

}  // namespace QVSa
