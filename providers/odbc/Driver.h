#pragma once

#include <chrono>
#include <vector>

#include "providers/Provider.h"

namespace QVSa::odbc {

struct Driver {
  String name;  // as registered, or the path of its library
  bool freeTds = false;
};

// `wanted` where it is set, else Microsoft's newest driver of `registered`, else FreeTDS as registered, else FreeTDS's
// library at `library`. Throws 0x80004005 where all are empty.
Driver chooseDriver(const String& wanted, const std::vector<String>& registered, const String& library);

// The choice on this system.
Driver systemDriver(const String& wanted);

// What a connection is asked for, beside the server and the log-in: the settings of the machine by these names.
struct Access {
  Driver driver;
  String encryption;
  String certificate;
  String driverOptions;
  std::chrono::seconds keep{0};
};
Access systemAccess();

// The ODBC connection string without a database. Holds the password: for SQLDriverConnect alone, and as the identity
// that an open connection has. Throws 0x80004005 for a value that could not stand in it as it is, for a port that is no
// number from 1 to 65535, and for a check of the certificate that the driver can't be asked for.
String connectionText(const ConnectionOptions& options, const Access& access);
// The part behind it that names the database.
String databaseText(const String& database, const Driver& driver);

}  // namespace QVSa::odbc
