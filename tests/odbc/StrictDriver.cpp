// SQLite's ODBC driver with the manners of SQL Server's: a batch holds several statements, parted by semicolons, and
// the connection is busy while rows of a statement wait; N'text' is a text; the statement "deadlock" fails as one that
// the server has chosen as a deadlock's victim. Functions that are not here the driver
// manager finds in SQLite's driver, which this library is linked to. For one connection at a time.
#include <dlfcn.h>
#include <map>
#include <sql.h>
#include <sqlext.h>
#include <string>

namespace {

std::map<SQLHSTMT, std::string> rest;  // what a statement has still to run of its batch
SQLHSTMT busy = SQL_NULL_HSTMT;

template <class Function>
Function* next(Function*, const char* name) {
  return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}
#define NEXT(function) next(&(function), #function)

SQLRETURN execute(SQLHSTMT statement, std::string text) {
  for (auto at = text.find("N'"); at != std::string::npos; at = text.find("N'", at)) text.erase(at, 1);
  return NEXT(SQLExecDirect)(statement, reinterpret_cast<SQLCHAR*>(text.data()), SQL_NTS);
}

SQLRETURN executeFirst(SQLHSTMT statement, std::string batch) {
  const auto end = batch.find(';');
  rest[statement] = end == std::string::npos ? "" : batch.substr(end + 1);
  const SQLRETURN rc = execute(statement, batch.substr(0, end));
  SQLSMALLINT columns = 0;
  NEXT(SQLNumResultCols)(statement, &columns);
  if (columns > 0) busy = statement;
  return rc;
}

}  // namespace

extern "C" {

SQLRETURN SQLExecDirect(SQLHSTMT statement, SQLCHAR* text, SQLINTEGER length) {
  // The driver has no call to set a diagnostic, but a syntax error tells the text.
  if (busy != SQL_NULL_HSTMT && busy != statement) return execute(statement, "connection_is_busy");
  const auto* batch = reinterpret_cast<const char*>(text);
  return executeFirst(statement, length == SQL_NTS ? batch : std::string(batch, static_cast<std::size_t>(length)));
}

SQLRETURN SQLMoreResults(SQLHSTMT statement) {
  if (busy == statement) busy = SQL_NULL_HSTMT;
  if (rest[statement].empty()) return SQL_NO_DATA;
  NEXT(SQLFreeStmt)(statement, SQL_CLOSE);
  return executeFirst(statement, rest[statement]);
}

SQLRETURN SQLFetch(SQLHSTMT statement) {
  const SQLRETURN rc = NEXT(SQLFetch)(statement);
  if (rc == SQL_NO_DATA && rest[statement].empty() && busy == statement) busy = SQL_NULL_HSTMT;
  return rc;
}

SQLRETURN SQLError(SQLHENV environment, SQLHDBC connection, SQLHSTMT statement, SQLCHAR* state, SQLINTEGER* native,
                   SQLCHAR* text, SQLSMALLINT size, SQLSMALLINT* length) {
  const SQLRETURN rc = NEXT(SQLError)(environment, connection, statement, state, native, text, size, length);
  if (SQL_SUCCEEDED(rc) && std::string(reinterpret_cast<const char*>(text)).find("deadlock") != std::string::npos)
    *native = 1205;
  return rc;
}

SQLRETURN SQLEndTran(SQLSMALLINT type, SQLHANDLE handle, SQLSMALLINT completion) {
  return busy == SQL_NULL_HSTMT ? NEXT(SQLEndTran)(type, handle, completion) : SQLRETURN{SQL_ERROR};
}

SQLRETURN SQLFreeHandle(SQLSMALLINT type, SQLHANDLE handle) {
  if (handle == busy) busy = SQL_NULL_HSTMT;
  rest.erase(handle);
  return NEXT(SQLFreeHandle)(type, handle);
}
}
