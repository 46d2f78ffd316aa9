#include "providers/odbc/Environment.h"

#include "QVSa/frame/Failure.h"

namespace QVSa::odbc {

namespace {

SQLHENV makeEnvironment() {
  SQLHENV handle = SQL_NULL_HENV;
  const auto version = reinterpret_cast<SQLPOINTER>(SQLULEN{SQL_OV_ODBC3});
  if (!SQL_SUCCEEDED(SQLAllocHandle(SQL_HANDLE_ENV, SQL_NULL_HANDLE, &handle)) ||
      !SQL_SUCCEEDED(SQLSetEnvAttr(handle, SQL_ATTR_ODBC_VERSION, version, 0))) {
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
