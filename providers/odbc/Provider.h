#pragma once

#include "providers/Provider.h"

namespace QVSa::odbc {

// SQL Server through the system's ODBC driver manager. For any thread.
Provider& provider();

}  // namespace QVSa::odbc
