#include "providers/odbc/Environment.h"

#include "QVSa/values/Failure.h"

namespace QVSa::odbc {

namespace {

SQLHENV makeEnvironment() {
  SQLHENV handle = SQL_NULL_HENV;
  if (!SQL_SUCCEEDED(SQLAllocHandle(SQL_HANDLE_ENV, SQL_NULL_HANDLE, &handle)) ||
      !SQL_SUCCEEDED(SQLSetEnvAttr(handle, SQL_ATTR_ODBC_VERSION, attributeValue(SQL_OV_ODBC3), 0))) {
    throw Failure(number::general, "ODBC", "The ODBC driver manager is not available.");
  }
  return handle;
}

}  // namespace

SQLHENV environment() {
  static const SQLHENV handle = makeEnvironment();
  return handle;
}

}  // namespace QVSa::odbc
