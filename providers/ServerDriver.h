#pragma once

#include "QVSa/values/Values.h"

namespace QVSa::odbc {

// The name or the library of the driver that reaches SQL Server from this machine. Throws 0x80004005 where there is
// none.
String serverDriver();

}  // namespace QVSa::odbc
