#include "providers/odbc/Link.h"

#include "providers/odbc/Environment.h"
#include "providers/odbc/Failure.h"

namespace QVSa::odbc {

Link::Link(const String& odbcText, const String& password, std::chrono::seconds loginTimeout) {
  if (!SQL_SUCCEEDED(SQLAllocHandle(SQL_HANDLE_DBC, environment(), &handle_))) {
    throw failure(diagnostics(SQL_HANDLE_ENV, environment()));
  }
  SQLSetConnectAttrW(handle_, SQL_ATTR_LOGIN_TIMEOUT, attributeValue(loginTimeout.count()), SQL_IS_UINTEGER);
  std::u16string text = toUtf16(odbcText);
  const SQLRETURN rc = SQLDriverConnectW(handle_, nullptr, wideData(text), static_cast<SQLSMALLINT>(text.size()),
                                         nullptr, 0, nullptr, SQL_DRIVER_NOPROMPT);
  if (SQL_SUCCEEDED(rc)) return;
  const Failure refused = connectFailure(diagnostics(SQL_HANDLE_DBC, handle_), password);
  SQLFreeHandle(SQL_HANDLE_DBC, handle_);
  throw refused;
}

Link::~Link() {
  if (!isOwn()) return;
  SQLDisconnect(handle_);
  SQLFreeHandle(SQL_HANDLE_DBC, handle_);
}

}  // namespace QVSa::odbc
