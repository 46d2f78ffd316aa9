#pragma once

#include "QVSa/frame/Connection.h"

namespace QVSa {

// Has a name for itself, among all hosts of an installation, while it lives. It keeps an open transaction without
// writes, so that the server lets go what a host that died had held.
class ApplicationLock {
 public:
  // Takes over a connection to QVSys. Throws 0x80040E31 where somebody else has the name for all of `seconds`.
  ApplicationLock(Connection connection, const String& name, Long seconds);

 private:
  Connection connection_;
};

}  // namespace QVSa
