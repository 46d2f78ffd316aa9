#pragma once

#include "QVSa/frame/Frame.h"

namespace QVSa {

// The log-ins of the database server: QVUser, which every host opens its connections with, and the administrator's.
//   Logins logins;  logins.connect(server);
//   if (!logins.setPassword("QVUser", newPassword, "sa", saPassword)) complain(logins.errDescription());
class QVSA_EXPORT Logins : private Frame {
 public:
  using Frame::connect;
  using Frame::errDescription;
  using Frame::errNumber;

  // As the administrator `asLogin`. Hosts open no connection as QVUser any more until their server text has the new
  // password behind a "|", scrambled. 5 a ";" in a password, or one of QVUser that can't be scrambled; 0x80040E4D
  // `asPassword` is wrong; 0x80040E14 there is no such log-in, or the server wants a stronger password.
  Boolean setPassword(const String& login, const String& password, const String& asLogin, const String& asPassword);
};

}  // namespace QVSa
