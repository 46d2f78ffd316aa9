#pragma once

#include <chrono>
#include <memory>

#include "QVSa/values/Failure.h"
#include "providers/odbc/Link.h"
#include "providers/odbc/Statement.h"
#include "providers/odbc/WireBatch.h"

namespace QVSa::odbc {

class Rows;

// What a connection is opened for.
struct Target {
  String odbcText;      // the driver manager's connection string without a database
  String database;      // the part of it that names the database
  String databaseName;  // empty: the log-in's own
  String password;      // what no failure's text may repeat
  std::chrono::seconds loginTimeout{15};
  std::chrono::seconds keep{0};  // how long it is kept open afterwards
  String identity{};             // whose connection it is: none is given to another one
};

// A session's hold of an open connection: one that was kept, or a new one. The server answers one statement at a time,
// so the row set that is still arriving is read into memory before anything else goes out. Going, it rolls back what is
// open, gives the connection back to those that are kept, and never throws.
class Connection {
 public:
  explicit Connection(Target target);
  ~Connection();
  Connection(const Connection&) = delete;
  Connection& operator=(const Connection&) = delete;

  // For a text with parameters, or one that must be a batch of its own.
  std::shared_ptr<Statement> statement(std::chrono::seconds timeout);
  // Runs a batch and stands at its first result. Nothing for one that waits for the next.
  std::shared_ptr<Statement> execute(const WireBatch& batch, std::chrono::seconds timeout);
  void begin();
  void commit();
  void rollback();

  // What a statement of this connection met.
  void failed(const Failure& failure);
  bool isOwn() const { return link_->isOwn(); }

  // These rows arrive from now on.
  void arriving(Rows& rows) { arriving_ = &rows; }
  void arrived(const Rows& rows);
  // Lets the arriving rows go unread.
  void abandon() noexcept;

 private:
  bool adoptKept();
  void makeReady();
  void refuseAfterLoss();
  void makeRoom();
  std::shared_ptr<Statement> newStatement(std::chrono::seconds timeout);
  void sendAhead(std::chrono::seconds timeout);
  void run(const String& text, std::chrono::seconds timeout);
  void giveBack();

  Target target_;
  std::unique_ptr<Link> link_;
  Rows* arriving_ = nullptr;
  // Settings of the session that go out with the next batch, in front of it: they are no round trip of their own.
  String ahead_;
  bool inTransaction_ = false;
  bool inDoubt_ = false;  // a statement has failed, and with it perhaps the transaction has ended
  bool lost_ = false;     // it has: the next statement would commit alone
  bool keepable_ = true;
};

}  // namespace QVSa::odbc
