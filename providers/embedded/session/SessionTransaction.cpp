#include "providers/embedded/session/Rows.h"
#include "providers/embedded/session/Session.h"
#include "providers/embedded/storage/ChangedRows.h"
#include "providers/embedded/storage/StorageFailure.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

constexpr Long deadlocked = 1205;
// A longer transaction than any of the library's own is not kept to be made again.
constexpr std::size_t mostChanges = 100;

}  // namespace

void EmbeddedSession::begin() {
  refuseAfterLoss();
  if (marked_) throw tsql::sqlFailure(3988, "New transaction is not allowed because another one is open.");
  marked_ = true;
}

void EmbeddedSession::commit() {
  if (!marked_) throw tsql::sqlFailure(3902, "The COMMIT TRANSACTION request has no corresponding BEGIN TRANSACTION.");
  refuseAfterLoss();
  if (inner_ > 0) return static_cast<void>(--inner_);
  try {
    if (started_) handle_->commit();
  } catch (...) {
    afterFailure(0);
    throw;
  }
  endTransaction();
}

void EmbeddedSession::rollback() {
  if (!marked_)
    throw tsql::sqlFailure(3903, "The ROLLBACK TRANSACTION request has no corresponding BEGIN TRANSACTION.");
  bufferRows();
  if (handle_->inTransaction()) handle_->execute("rollback");
  endTransaction();
  refreshCatalogue();
}

void EmbeddedSession::endTransaction() {
  marked_ = started_ = settled_ = undone_ = lost_ = false;
  inner_ = 0;
  changes_.clear();
  passedOver_.clear();
  change_.reset();
  writing_.clear();
  handle_->releaseLocks();
  leaveOthers();
}

void EmbeddedSession::refuseAfterLoss() const {
  if (lost_) throw tsql::transactionLost();
}

// SQLite ends its transaction by itself where it had no room or no memory, and where a write ran over its
// time. What is written next would be committed alone.
void EmbeddedSession::afterFailure(Long native) {
  const bool hasWritten = settled_ || !changes_.empty();
  const bool ended = started_ && !handle_->inTransaction();
  if (marked_ && (native == deadlocked || undone_ || (ended && hasWritten))) {
    lost_ = true;
    rollback();
    marked_ = lost_ = true;
  } else if (ended) {
    started_ = false;
    writing_.clear();
  }
  leaveOthers();
}

void EmbeddedSession::bufferRows() {
  for (auto* rows : rows_) rows->buffer();
}

void EmbeddedSession::prepareWrite(std::size_t database) {
  bufferRows();
  takeWriteLock(database);
  if (undone_) changeAgain();
}

void EmbeddedSession::takeWriteLock(std::size_t database) {
  if (writing_.contains(database)) return;
  if (!started_) handle_->begin();
  started_ = true;
  try {
    handle_->takeWriter(database);
  } catch (...) {
    // Whatever is read next would begin a snapshot that lasts as long as this transaction.
    if (writing_.empty()) {
      handle_->execute("rollback");
      started_ = false;
    }
    throw;
  }
  writing_.insert(database);
}

void EmbeddedSession::giveWriteLockBack() {
  if (settled_) throw deadlock();
  bufferRows();
  handle_->execute("rollback");
  started_ = false;
  writing_.clear();
  undone_ = !changes_.empty();
}

// What was written up to now cannot be undone and made again any more without anybody's noticing.
void EmbeddedSession::settle() {
  settled_ = true;
  changes_.clear();
}

void EmbeddedSession::changeAgain() {
  for (const Change& change : changes_) {
    takeWriteLock(change.database);
    ChangedRows rows(handle_->get(), handle_->locks(change.database), change.table);
    const Long written = change.run();
    if (written != change.rows || !rows.areMarked(written)) throw deadlock();
  }
  undone_ = false;
}

Long EmbeddedSession::change(Change change) {
  if (marked_) return changeInTransaction(std::move(change));
  bufferRows();
  if (change.inserts) return change.run();
  RowLocks& locks = handle_->locks(change.database);
  const bool own = !locks.tryMark(change.table);
  // Somebody has claimed rows of the table: it matters which ones this write changes, which only a transaction can
  // tell.
  if (own) begin();
  try {
    const Long rows = own ? changeInTransaction(std::move(change)) : change.run();
    own ? commit() : locks.release();
    return rows;
  } catch (...) {
    own ? rollback() : locks.release();
    throw;
  }
}

Long EmbeddedSession::changeInTransaction(Change change) {
  if (changes_.size() >= mostChanges) settle();
  changes_.reserve(changes_.size() + 1);
  while (true) {
    prepareWrite(change.database);
    ChangedRows rows(handle_->get(), handle_->locks(change.database), change.table);
    change.rows = change.run();
    if (rows.areMarked(change.rows)) break;
    giveWriteLockBack();
    while (!rows.markRest()) handle_->waitShortly();
  }
  const Long rows = change.rows;
  if (!settled_) changes_.push_back(std::move(change));
  return rows;
}

}  // namespace QVSa::embedded
