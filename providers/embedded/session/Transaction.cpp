#include "providers/embedded/session/Transaction.h"

#include <algorithm>

#include "providers/embedded/storage/ChangedRows.h"
#include "providers/embedded/storage/StorageFailure.h"
#include "providers/tsql/SqlFailure.h"

namespace QVSa::embedded {

namespace {

// A deadlock, and a text that does not convert: with these a server ends the batch and its transaction.
bool endsTransaction(Long native) {
  constexpr Long deadlocked = 1205;
  return native == deadlocked || tsql::failureNumber(native) == number::conversion;
}

// A longer transaction than any of the library's own is not kept to be made again.
constexpr std::size_t mostChanges = 100;

}  // namespace

Transaction::~Transaction() {
  // What it has defined and not committed is undone now.
  if (definitions_) workspace_.forgetCatalogue();
  try {
    end();
    if (handle().inTransaction()) handle().execute("rollback");
  } catch (...) {
    // The pool does not keep a handle whose transaction could not be ended.
  }
}

void Transaction::begin() {
  refuseAfterLoss();
  if (marked_) throw tsql::sqlFailure(3988, "New transaction is not allowed because another one is open.");
  marked_ = true;
}

void Transaction::commit() {
  if (!marked_) throw tsql::sqlFailure(3902, "The COMMIT TRANSACTION request has no corresponding BEGIN TRANSACTION.");
  refuseAfterLoss();
  if (inner_ > 0) return static_cast<void>(--inner_);
  try {
    if (started_) handle().commit();
  } catch (...) {
    afterFailure(0);
    throw;
  }
  end();
}

void Transaction::rollback() {
  if (!marked_)
    throw tsql::sqlFailure(3903, "The ROLLBACK TRANSACTION request has no corresponding BEGIN TRANSACTION.");
  workspace_.bufferRows();
  if (handle().inTransaction()) handle().execute("rollback");
  end();
  workspace_.refreshCatalogue();
}

void Transaction::end() {
  marked_ = started_ = settled_ = undone_ = lost_ = false;
  inner_ = 0;
  changes_.clear();
  passedOver_.clear();
  definitions_.reset();
  writing_.clear();
  handle().releaseLocks();
  workspace_.leaveOthers();
}

void Transaction::refuseAfterLoss() const {
  if (lost_) throw tsql::transactionLost();
}

// SQLite ends its transaction by itself where it had no room or no memory, and where a write ran over its
// time. What is written next would be committed alone.
void Transaction::afterFailure(Long native) {
  const bool hasWritten = settled_ || !changes_.empty();
  const bool ended = started_ && !handle().inTransaction();
  if (marked_ && (endsTransaction(native) || undone_ || (ended && hasWritten))) {
    lost_ = true;
    rollback();
    marked_ = lost_ = true;
  } else if (ended) {
    started_ = false;
    writing_.clear();
  }
  if (!marked_) workspace_.leaveOthers();
}

void Transaction::prepareWrite(std::size_t database) {
  workspace_.bufferRows();
  takeWriteLock(database);
  if (undone_) changeAgain();
}

void Transaction::takeWriteLock(std::size_t database) {
  if (writing_.contains(database)) return;
  if (!started_) handle().begin();
  started_ = true;
  try {
    handle().takeWriter(database);
  } catch (...) {
    // Whatever is read next would begin a snapshot that lasts as long as this transaction.
    if (writing_.empty()) {
      handle().execute("rollback");
      started_ = false;
    }
    throw;
  }
  writing_.insert(database);
}

void Transaction::giveWriteLockBack() {
  if (settled_) throw deadlock();
  workspace_.bufferRows();
  handle().execute("rollback");
  started_ = false;
  writing_.clear();
  undone_ = !changes_.empty();
}

void Transaction::noteRead() {
  if (started_) settle();
}

void Transaction::noteDefinition() {
  if (!definitions_) definitions_.emplace(handle().mark());
}

void Transaction::prepareDefinition(std::size_t database) {
  prepareWrite(database);
  settle();
}

// What was written up to now cannot be undone and made again any more without anybody's noticing.
void Transaction::settle() {
  settled_ = true;
  changes_.clear();
}

void Transaction::changeAgain() {
  for (const Change& change : changes_) {
    takeWriteLock(change.database);
    ChangedRows rows(handle().get(), handle().locks(change.database), change.table);
    const Long written = change.run();
    if (written != change.rows || !rows.areMarked(written)) throw deadlock();
  }
  undone_ = false;
}

Long Transaction::change(Change change) {
  if (marked_) return changeInTransaction(std::move(change));
  workspace_.bufferRows();
  if (change.inserts) return change.run();
  RowLocks& locks = handle().locks(change.database);
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

Long Transaction::changeInTransaction(Change change) {
  if (changes_.size() >= mostChanges) settle();
  changes_.reserve(changes_.size() + 1);
  while (true) {
    prepareWrite(change.database);
    ChangedRows rows(handle().get(), handle().locks(change.database), change.table);
    change.rows = change.run();
    if (rows.areMarked(change.rows)) break;
    giveWriteLockBack();
    while (!rows.markRest()) handle().waitShortly();
  }
  const Long rows = change.rows;
  if (!settled_) changes_.push_back(std::move(change));
  return rows;
}

std::shared_ptr<const ValueList> Transaction::claim(const TableInfo& table, ValueList keys, bool locks, bool skips) {
  RowLocks& rowLocks = handle().locks(table.database);
  const auto taken = [&](std::int64_t row) {
    if (!locks) return !rowLocks.othersHold(table.name, row);
    // Who has the write lock is the only one to change rows. One that waits for it may have marked them already.
    return writing_.contains(table.database) ? rowLocks.tryMark(table.name, row) : rowLocks.tryLock(table.name, row);
  };
  auto mine = std::make_shared<ValueList>();
  for (auto& key : keys) {
    const std::int64_t row = std::get<std::int64_t>(key);
    bool have = taken(row);
    for (; !have && !skips; have = taken(row)) {
      if (started_) giveWriteLockBack();
      handle().waitShortly();
    }
    if (have)
      mine->push_back(std::move(key));
    else if (marked_)
      passedOver_[keyOf(table)].push_back(std::move(key));
  }
  if (undone_) prepareWrite(table.database);
  std::ranges::sort(*mine);
  return mine;
}

const ValueList* Transaction::passedOver(const TableInfo& table) const {
  const auto passed = passedOver_.find(keyOf(table));
  return passed == passedOver_.end() ? nullptr : &passed->second;
}

}  // namespace QVSa::embedded
