#pragma once

#include <array>
#include <map>

#include "QVSa/values/Values.h"

namespace QVSa::platform {

// A setting of this machine: how its hosts reach SQL Server.
struct ServerSetting {
  const char* name;      // in the file
  const char* variable;  // in the environment
  const char* standard;  // where nobody says anything
  const char* choices;   // the values that it may have, a blank between two; empty: any text
  const char* meaning;   // for a person
};

inline constexpr std::array<ServerSetting, 5> serverSettings{{
    {"encryption", "QVSA_ENCRYPTION", "required", "required optional off", "Encryption of connections"},
    {"certificate", "QVSA_CERTIFICATE", "unchecked", "unchecked checked driver", "Who checks the server's certificate"},
    {"odbc-driver", "QVSA_ODBC_DRIVER", "", "", "A registered ODBC driver, or its library"},
    {"driver-options", "QVSA_DRIVER_OPTIONS", "", "", "More keywords for the driver: \"Key=value;Key=value\""},
    {"keep-seconds", "QVSA_KEEP_SECONDS", "60", "", "How long an idle connection is kept; 0: not at all"},
}};

struct SettingInForce {
  String value;
  String source;  // "default", the path of the file, the name of the variable, or "option"
};

// What holds at this moment, by name. The nearest place wins: what the program itself was told (setServerSetting), the
// environment, the file /etc/qvsa/qvsa.conf (QVSA_CONF names another one) with a "name = value" in each line and
// comments behind "#", the default. Throws 0x80004005 for a name or a value that is none, 53 where the file that
// QVSA_CONF names is missing, 70 or 75 where it can't be read.
std::map<String, SettingInForce> serverSettingsInForce();

// For the start of a program: not while another thread opens a connection. Throws 0x80004005 as above.
void setServerSetting(const String& name, const String& value);

}  // namespace QVSa::platform
