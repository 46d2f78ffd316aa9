#pragma once

#include "providers/odbc/Wide.h"

namespace QVSa::odbc {

// The process's one ODBC environment, made at first use and kept. For any thread. Throws 0x80004005.
SQLHENV environment();

}  // namespace QVSa::odbc
