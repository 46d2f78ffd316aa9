#include "providers/odbc/Connection.h"

#include "providers/odbc/Pool.h"
#include "providers/odbc/Rows.h"
#include "providers/tsql/Printer.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::odbc {

namespace {

constexpr std::chrono::seconds ordinary{30};
constexpr std::chrono::seconds unlimited{0};

// The answer to the text that ended its last use is younger than this: the server is there.
constexpr std::chrono::seconds fresh{1};

}  // namespace

Connection::Connection(Target target) : target_(std::move(target)) {
  if (adoptKept()) return;
  link_ = std::make_unique<Link>(target_.odbcText + target_.database, target_.password, target_.loginTimeout);
}

// Where the database can't be used any more, the attempt to open it afresh tells why.
bool Connection::adoptKept() {
  if (target_.keep.count() == 0) return false;
  while (auto kept = Pool::instance().take(target_.identity)) {
    link_ = std::move(kept->link);
    if (!target_.databaseName.empty()) ahead_ = "use " + tsql::printName(target_.databaseName) + " ";
    if (std::chrono::steady_clock::now() - kept->since < fresh) return true;
    try {
      if (ahead_.empty()) run("set nocount off", target_.loginTimeout);
      sendAhead(target_.loginTimeout);
      return true;
    } catch (const Failure&) {
      ahead_.clear();
      keepable_ = true;
      link_.reset();
    }
  }
  return false;
}

Connection::~Connection() {
  abandon();
  try {
    if (isOwn()) giveBack();
  } catch (...) {
    // It is closed instead, and the server discards what is open.
  }
}

// A session that stood in a database would hold up a restore, which waits for all of them.
void Connection::giveBack() {
  const bool keep = keepable_ && target_.keep.count() > 0;
  if (keep) {
    run("if @@trancount>0 rollback transaction set nocount off use master", ordinary);
    if (keepable_) Pool::instance().give(target_.identity, std::move(link_), target_.keep);
  } else if (inTransaction_) {
    run("if @@trancount>0 rollback transaction", unlimited);
  }
}

std::shared_ptr<Statement> Connection::statement(std::chrono::seconds timeout) {
  makeReady();
  sendAhead(timeout);
  return newStatement(timeout);
}

std::shared_ptr<Statement> Connection::execute(const WireBatch& batch, std::chrono::seconds timeout) {
  makeReady();
  keepable_ = keepable_ && batch.leavesNoTrace;
  if (batch.isNocount) {
    ahead_ += batch.text + " ";
    return nullptr;
  }
  if (!batch.canFollow) sendAhead(timeout);
  auto statement = newStatement(timeout);
  statement->execute(ahead_ + batch.text);
  ahead_.clear();
  return statement;
}

// The texts are T-SQL and not the driver manager's calls, for which drivers make up to three round trips.
void Connection::begin() {
  makeReady();
  run(ahead_ + "begin transaction", ordinary);
  ahead_.clear();
  inTransaction_ = true;
}

void Connection::commit() {
  makeReady();
  run("commit transaction", unlimited);
  inTransaction_ = false;
}

void Connection::rollback() {
  makeRoom();
  run("if @@trancount>0 rollback transaction", unlimited);
  inTransaction_ = inDoubt_ = lost_ = false;
}

void Connection::failed(const Failure& failure) {
  // What is not the server's own word may be a connection that is no good any more.
  if (failure.native() == 0) keepable_ = false;
  inDoubt_ = inTransaction_;
}

void Connection::makeReady() {
  makeRoom();
  refuseAfterLoss();
}

void Connection::refuseAfterLoss() {
  if (inDoubt_) {
    const auto count = newStatement(ordinary);
    count->execute("select @@trancount");
    lost_ = !count->fetch() || count->value(0, count->describe(0).second).toLong() == 0;
    count->readOut();
    inDoubt_ = false;
  }
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

std::shared_ptr<Statement> Connection::newStatement(std::chrono::seconds timeout) {
  return std::make_shared<Statement>(*this, link_->handle(), timeout);
}

void Connection::sendAhead(std::chrono::seconds timeout) {
  if (ahead_.empty()) return;
  run(ahead_, timeout);
  ahead_.clear();
}

void Connection::run(const String& text, std::chrono::seconds timeout) {
  const auto statement = newStatement(timeout);
  statement->execute(text);
  while (statement->moreResults()) {
  }
}

}  // namespace QVSa::odbc
