#pragma once

#include <vector>

#include "QVSa/values/Export.h"
#include "QVSa/values/Values.h"

namespace QVSa {

// A setting of this machine that tells how its hosts reach SQL Server; docs/sql-server.md has them in a table.
struct ServerSetting {
  String name;     // in /etc/qvsa/qvsa.conf
  String meaning;  // for a person
  String value;    // in force; of the driver, where none is set, the one that is chosen
  String source;   // "default", the path of the file, the name of the environment's variable, or "option"
};

// The settings in force. Throws 0x80004005 for a setting or a value that is none, and where there is no driver.
QVSA_EXPORT std::vector<ServerSetting> serverAccess();
// Their names and meanings alone. Never throws for what is set.
QVSA_EXPORT std::vector<ServerSetting> serverAccessNames();
// What the program itself was told stands above the environment and the file. For the start of a program: not while
// another thread works with the library. Throws 0x80004005.
QVSA_EXPORT void setServerAccess(const String& name, const String& value);

}  // namespace QVSa
