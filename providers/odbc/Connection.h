#pragma once

#include <chrono>
#include <memory>

#include "QVSa/values/Failure.h"
#include "providers/odbc/Statement.h"

namespace QVSa::odbc {

class Rows;

// A connection handle. The server answers one statement at a time, so the row set that is still arriving is read into
// memory before anything else goes out. Going, it rolls back what is open and never throws.
class Connection {
 public:
  // `password` is not sent: it is what no failure's text may repeat.
  Connection(const String& odbcText, const String& password, std::chrono::seconds loginTimeout);
  ~Connection();
  Connection(const Connection&) = delete;
  Connection& operator=(const Connection&) = delete;

  std::shared_ptr<Statement> statement(std::chrono::seconds timeout);
  void begin();
  void end(SQLSMALLINT completion);
  // The server has rolled the open transaction back by itself. The next statement would begin another one and commit
  // alone: until that is ended by a rollback, everything is refused with 3930.
  void transactionLost() { lost_ = inTransaction_; }

  // These rows arrive from now on.
  void arriving(Rows& rows) { arriving_ = &rows; }
  void arrived(const Rows& rows);
  // Lets the arriving rows go unread.
  void abandon() noexcept;

 private:
  void refuseAfterLoss() const;
  void makeRoom();
  void autocommit(bool on);
  void check(SQLRETURN rc) const;

  SQLHDBC handle_ = SQL_NULL_HDBC;
  Rows* arriving_ = nullptr;
  bool inTransaction_ = false;
  bool lost_ = false;
};

}  // namespace QVSa::odbc
