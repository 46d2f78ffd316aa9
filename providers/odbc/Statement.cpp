#include "providers/odbc/Statement.h"

#include <algorithm>
#include <limits>

#include "providers/odbc/Connection.h"
#include "providers/odbc/Environment.h"
#include "providers/odbc/Failure.h"

namespace QVSa::odbc {

Statement::Statement(Connection& connection, SQLHDBC handle, std::chrono::seconds timeout) : connection_(connection) {
  if (!SQL_SUCCEEDED(SQLAllocHandle(SQL_HANDLE_STMT, handle, &handle_))) {
    throw failure(diagnostics(SQL_HANDLE_DBC, handle));
  }
  // A driver that has no time-out, or sends texts unread anyway, refuses these; nothing is lost by that.
  SQLSetStmtAttrW(handle_, SQL_ATTR_QUERY_TIMEOUT, attributeValue(timeout.count()), SQL_IS_UINTEGER);
  SQLSetStmtAttrW(handle_, SQL_ATTR_NOSCAN, attributeValue(SQL_NOSCAN_ON), SQL_IS_UINTEGER);
}

Statement::~Statement() {
  if (connection_.isOwn()) SQLFreeHandle(SQL_HANDLE_STMT, handle_);
}

// Giving up in the middle costs a round trip, as the server must be told to stop; the last rows of a small row set are
// mostly there already.
void Statement::readOut() noexcept {
  constexpr int few = 50;
  try {
    for (int rows = 0; rows < few && connection_.isOwn() && fetch(); ++rows) {
    }
  } catch (...) {
    // Nobody waits for these rows; the connection has heard of it.
  }
}

bool Statement::check(SQLRETURN rc) const {
  if (rc == SQL_NO_DATA) return false;
  if (SQL_SUCCEEDED(rc)) return true;
  const Failure told = failure(diagnostics(SQL_HANDLE_STMT, handle_));
  connection_.failed(told);
  throw told;
}

void Statement::execute(const String& text) {
  std::u16string wide = toUtf16(text);
  // SQL_NO_DATA is a write that met no row.
  check(SQLExecDirectW(handle_, wideData(wide), static_cast<SQLINTEGER>(wide.size())));
}

void Statement::execute(const String& text, std::vector<Parameter>& parameters) {
  SQLUSMALLINT position = 0;
  for (Parameter& parameter : parameters) parameter.bind(handle_, ++position);
  execute(text);
}

std::size_t Statement::columnCount() const {
  SQLSMALLINT count = 0;
  check(SQLNumResultCols(handle_, &count));
  return static_cast<std::size_t>(count);
}

std::pair<Column, ColumnType> Statement::describe(std::size_t ordinal) const {
  std::u16string name(256, u'\0');
  SQLSMALLINT length = 0;
  SQLSMALLINT nullable = 0;
  ColumnType type;
  check(SQLDescribeColW(handle_, static_cast<SQLUSMALLINT>(ordinal + 1), wideData(name),
                        static_cast<SQLSMALLINT>(name.size()), &length, &type.type, &type.size, &type.digits,
                        &nullable));
  name.resize(std::min(static_cast<std::size_t>(length), name.size() - 1));
  return {Column{fromUtf16(name), isLong(type)}, type};
}

Long Statement::affected() const {
  SQLLEN count = -1;
  check(SQLRowCount(handle_, &count));
  return static_cast<Long>(std::clamp<SQLLEN>(count, -1, std::numeric_limits<Long>::max()));
}

bool Statement::moreResults() { return check(SQLMoreResults(handle_)); }

bool Statement::fetch() { return check(SQLFetch(handle_)); }

}  // namespace QVSa::odbc
