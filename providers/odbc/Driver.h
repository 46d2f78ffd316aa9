#pragma once

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

// The choice on this system: QVSA_ODBC_DRIVER names a driver or its library, which stands above what is registered.
Driver systemDriver();

// The ODBC connection string. Holds the password: for SQLDriverConnect alone. Throws 0x80004005 for a value that could
// not stand in it as it is.
String connectionText(const ConnectionOptions& options, const Driver& driver);

}  // namespace QVSa::odbc
