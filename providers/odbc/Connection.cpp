#include "providers/odbc/Connection.h"

#include "providers/odbc/Environment.h"
#include "providers/odbc/Failure.h"
#include "providers/odbc/Rows.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::odbc {

Connection::Connection(const String& odbcText, const String& password, std::chrono::seconds loginTimeout) {
  if (!SQL_SUCCEEDED(SQLAllocHandle(SQL_HANDLE_DBC, environment(), &handle_))) {
    throw failure(diagnostics(SQL_HANDLE_ENV, environment()));
  }
  SQLSetConnectAttrW(handle_, SQL_ATTR_LOGIN_TIMEOUT, attributeValue(loginTimeout.count()), SQL_IS_UINTEGER);
  std::u16string text = toWide(odbcText);
  const SQLRETURN rc = SQLDriverConnectW(handle_, nullptr, wideData(text), static_cast<SQLSMALLINT>(text.size()),
                                         nullptr, 0, nullptr, SQL_DRIVER_NOPROMPT);
  if (SQL_SUCCEEDED(rc)) return;
  const Failure refused = connectFailure(diagnostics(SQL_HANDLE_DBC, handle_), password);
  SQLFreeHandle(SQL_HANDLE_DBC, handle_);
  throw refused;
}

Connection::~Connection() {
  abandon();
  if (inTransaction_) SQLEndTran(SQL_HANDLE_DBC, handle_, SQL_ROLLBACK);
  SQLDisconnect(handle_);
  SQLFreeHandle(SQL_HANDLE_DBC, handle_);
}

std::shared_ptr<Statement> Connection::statement(std::chrono::seconds timeout) {
  refuseAfterLoss();
  makeRoom();
  return std::make_shared<Statement>(*this, handle_, timeout);
}

void Connection::begin() {
  refuseAfterLoss();
  makeRoom();
  autocommit(false);
  inTransaction_ = true;
}

void Connection::end(SQLSMALLINT completion) {
  if (completion == SQL_COMMIT) refuseAfterLoss();
  makeRoom();
  check(SQLEndTran(SQL_HANDLE_DBC, handle_, completion));
  // Only behind a transaction that is over: with one open, this would commit it.
  autocommit(true);
  inTransaction_ = lost_ = false;
}

void Connection::refuseAfterLoss() const {
  if (lost_) throw tsql::transactionLost();
}

void Connection::arrived(const Rows& rows) {
  if (arriving_ == &rows) arriving_ = nullptr;
}

void Connection::abandon() noexcept {
  if (arriving_) arriving_->abandon();
  arriving_ = nullptr;
}

void Connection::makeRoom() {
  if (arriving_) arriving_->keep();
}

void Connection::autocommit(bool on) {
  check(SQLSetConnectAttrW(handle_, SQL_ATTR_AUTOCOMMIT, attributeValue(on ? SQL_AUTOCOMMIT_ON : SQL_AUTOCOMMIT_OFF),
                           SQL_IS_UINTEGER));
}

void Connection::check(SQLRETURN rc) const {
  if (!SQL_SUCCEEDED(rc)) throw failure(diagnostics(SQL_HANDLE_DBC, handle_));
}

}  // namespace QVSa::odbc
