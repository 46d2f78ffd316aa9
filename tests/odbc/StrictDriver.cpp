// SQLite's ODBC driver with the manners of SQL Server's: a batch holds several statements, parted by semicolons, and
// the connection is busy while rows of a statement wait; N'text' is a text; a database may be used, nocount set, and a
// transaction rolled back where there is none; the catalogue knows of keys, and of a synonym x_synonym for each table
// x. The statement "deadlock" fails as one that the server has chosen as a deadlock's victim, "gone" as one that loses
// the connection. What a server would be asked is counted. Functions that are not here the driver manager finds in
// SQLite's driver, which this library is linked to. For one connection at a time.
#include <dlfcn.h>
#include <map>
#include <regex>
#include <sql.h>
#include <sqlext.h>
#include <string>

namespace {

std::map<SQLHSTMT, std::string> rest;  // what a statement has still to run of its batch
SQLHSTMT busy = SQL_NULL_HSTMT;
bool transaction = false;
bool lost = false;
int trips = 0;

template <class Function>
Function* next(Function*, const char* name) {
  return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}
#define NEXT(function) next(&(function), #function)

SQLRETURN execute(SQLHSTMT statement, const std::string& text) {
  std::string plain = std::regex_replace(text, std::regex("N(?=')|_synonym"), "");
  return NEXT(SQLExecDirect)(statement, reinterpret_cast<SQLCHAR*>(plain.data()), SQL_NTS);
}

void put(SQLHSTMT statement, const char* text) {
  execute(statement, text);
  NEXT(SQLFreeStmt)(statement, SQL_CLOSE);
}

void endTransaction(SQLHSTMT statement) {
  if (transaction) put(statement, "rollback");
  transaction = false;
}

std::string answerOfCatalogue(const std::string& question) {
  std::smatch name;
  std::regex_search(question, name, std::regex(R"(object_id\(N'\[?(\w+?)(_synonym)?\]?'\))"));
  if (name[2].matched) return "select null,'" + name[1].str() + "'";
  return "select name,null from pragma_table_info('" + name[1].str() + "') where pk>0";
}

// Does what SQLite has no words for at the beginning of a batch, and returns the rest of it in SQLite's words.
std::string translate(SQLHSTMT statement, std::string batch) {
  static const std::regex setting("^(use \\S+|set nocount (on|off)|(if @@trancount>0 rollback|begin) transaction) *");
  for (std::smatch found; std::regex_search(batch, found, setting); batch = found.suffix()) {
    if (found[1].str().find("rollback") != std::string::npos) endTransaction(statement);
    if (found[1] != "begin transaction") continue;
    put(statement, "begin");
    transaction = true;
  }
  if (batch == "commit transaction") transaction = false;
  if (batch == "deadlock") endTransaction(statement);
  if (batch == "gone") lost = true;
  if (batch == "select @@trancount") return transaction ? "select 1" : "select 0";
  return batch.find("sys.index_columns") == std::string::npos ? batch : answerOfCatalogue(batch);
}

SQLRETURN executeFirst(SQLHSTMT statement, std::string batch) {
  const auto end = batch.find(';');
  rest[statement] = end == std::string::npos ? "" : batch.substr(end + 1);
  const std::string first = translate(statement, batch.substr(0, end));
  if (lost) return execute(statement, "gone");
  if (first.empty()) return SQL_SUCCESS;
  const SQLRETURN rc = execute(statement, first);
  SQLSMALLINT columns = 0;
  NEXT(SQLNumResultCols)(statement, &columns);
  if (columns > 0) busy = statement;
  return rc;
}

}  // namespace

extern "C" {

// For the tests: what the server was asked since the last call, a log-in as one, and giving up in the middle too.
int strictRoundTrips() {
  const int result = trips;
  trips = 0;
  return result;
}

void strictLose() { lost = true; }

SQLRETURN SQLDriverConnect(SQLHDBC connection, SQLHWND window, SQLCHAR* text, SQLSMALLINT length, SQLCHAR* out,
                           SQLSMALLINT size, SQLSMALLINT* written, SQLUSMALLINT completion) {
  ++trips;
  transaction = lost = false;
  return NEXT(SQLDriverConnect)(connection, window, text, length, out, size, written, completion);
}

SQLRETURN SQLExecDirect(SQLHSTMT statement, SQLCHAR* text, SQLINTEGER length) {
  ++trips;
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
  const auto tells = [&](const char* word) {
    return SQL_SUCCEEDED(rc) && std::string(reinterpret_cast<const char*>(text)).find(word) != std::string::npos;
  };
  if (tells("deadlock")) *native = 1205;
  if (tells("gone")) *native = 20017;
  return rc;
}

SQLRETURN SQLFreeHandle(SQLSMALLINT type, SQLHANDLE handle) {
  if (handle == busy) {
    busy = SQL_NULL_HSTMT;
    ++trips;
  }
  rest.erase(handle);
  return NEXT(SQLFreeHandle)(type, handle);
}
}
