#include "QVSa/frame/Connection.h"

#include "QVSa/frame/ConnectionString.h"
#include "QVSa/frame/internal/Providers.h"
#include "providers/Provider.h"

namespace QVSa {

Connection::Connection() = default;
Connection::~Connection() { disconnect(); }
Connection::Connection(Connection&& other) noexcept = default;

Connection& Connection::operator=(Connection&& other) noexcept {
  if (this == &other) return *this;
  disconnect();
  session_ = std::move(other.session_);
  attached_ = std::move(other.attached_);
  cursorLocation_ = other.cursorLocation_;
  commandTimeout_ = other.commandTimeout_;
  inTransaction_ = other.inTransaction_;
  return *this;
}

void Connection::Open(const String& ConnectionString) {
  if (session_) throw Failure(number::open, "Connection", "Operation is not allowed when the object is open.");
  session_ = openSession(parseConnectionString(ConnectionString));
  inTransaction_ = false;
}

Recordset Connection::Execute(const String& CommandText, Long* RecordsAffected) {
  BatchResult result = run(CommandText, false);
  if (RecordsAffected != nullptr) *RecordsAffected = result.affected;
  Recordset rows;
  if (result.rows) rows.start(attach(std::move(result.rows)), cursorLocation_ == adUseClient);
  return rows;
}

void Connection::Close() {
  session();
  disconnect();
}

Long Connection::State() const { return session_ ? 1 : 0; }

void Connection::BeginTrans() {
  session();
  if (inTransaction_)
    throw Failure(number::inTransaction, "Connection", "Only one transaction can be active on this session.");
  session_->begin();
  inTransaction_ = true;
}

void Connection::CommitTrans() {
  requireTransaction();
  session_->commit();
  inTransaction_ = false;
}

void Connection::RollbackTrans() {
  requireTransaction();
  session_->rollback();
  inTransaction_ = false;
}

Long Connection::CursorLocation() const { return cursorLocation_; }
void Connection::CursorLocation(Long value) { cursorLocation_ = value; }
Long Connection::CommandTimeout() const { return commandTimeout_; }
void Connection::CommandTimeout(Long value) { commandTimeout_ = value; }

ProviderSession& Connection::session() const {
  if (!session_) throw Failure(number::closed, "Connection", "Operation is not allowed when the object is closed.");
  return *session_;
}

void Connection::requireTransaction() const {
  session();
  if (!inTransaction_) throw Failure(number::noTransaction, "Connection", "No transaction is active.");
}

BatchResult Connection::run(const String& text, bool updatable) {
  return session().run({text, updatable, std::chrono::seconds(commandTimeout_)});
}

AttachedRows Connection::attach(std::unique_ptr<Rows> rows) {
  std::erase_if(attached_, [](const auto& entry) { return entry.expired(); });
  AttachedRows shared = std::make_shared<std::unique_ptr<Rows>>(std::move(rows));
  attached_.push_back(shared);
  return shared;
}

// The row sets go first: they stand on the session.
void Connection::disconnect() noexcept {
  if (!session_) return;
  if (inTransaction_) {
    try {
      session_->rollback();
    } catch (...) {
      // The session's own end discards what this could not.
    }
  }
  inTransaction_ = false;
  for (const auto& entry : attached_) {
    if (const AttachedRows rows = entry.lock()) rows->reset();
  }
  attached_.clear();
  session_.reset();
}

}  // namespace QVSa
