#pragma once

#include <functional>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include "providers/embedded/session/Workspace.h"

namespace QVSa::embedded {

// The transaction of a session, and the rows that it has claimed.
//
// Isolation is read committed. `begin` only marks: SQLite's transaction starts with the first write, after open row
// sets were read into memory and the write lock was taken, so that what a statement reads is newer than its wait. A
// read before that would end the transaction in a failure that no retry mends.
//
// A write that meets rows which another session has claimed waits for them, and that session may need the write lock to
// get on: so the lock is given back meanwhile, and what the transaction has written is undone and written again
// afterwards. Where its work was seen already, the statement fails with 1205 instead. A transaction that has lost its
// writes, by that or by a failure of SQLite, takes nothing but a rollback (3930).
class Transaction {
 public:
  // A write: how it runs, once or again, and how many rows it wrote.
  struct Change {
    std::size_t database;
    std::string table;
    bool inserts;
    std::function<Long()> run;
    Long rows = 0;
  };

  explicit Transaction(Workspace& workspace) : workspace_(workspace) {}
  // Undoes what is not committed.
  ~Transaction();
  Transaction(const Transaction&) = delete;
  Transaction& operator=(const Transaction&) = delete;

  bool isOpen() const { return marked_; }
  // Throws 3988 where one is open. As a statement it counts, and only the outermost one ends by a commit.
  void begin();
  void beginInner() { ++inner_; }
  // Throws 3902 and 3903 without one.
  void commit();
  void rollback();

  // Throws 3930 where the transaction has lost its writes.
  void refuseAfterLoss() const;
  // To be called after each failure of a statement.
  void afterFailure(Long native);

  // Runs a write, in a transaction of its own where none is open and one is needed.
  Long change(Change change);
  // Something was read: what was written before can't be undone and written again without anybody's noticing.
  void noteRead();

  // Before a definition: others are told, and the write lock of the database is taken.
  void noteDefinition();
  void prepareDefinition(std::size_t database);
  // Takes the write lock of a database, and writes again what was undone.
  void prepareWrite(std::size_t database);

  // The rows of `keys` that no other session holds, claimed where `locks` says so; waits for the others, or passes over
  // them (`skips`). In order.
  std::shared_ptr<const ValueList> claim(const TableInfo& table, ValueList keys, bool locks, bool skips);
  // The rows of the table that this transaction has passed over; null for none.
  const ValueList* passedOver(const TableInfo& table) const;

 private:
  Handle& handle() const { return workspace_.handle(); }
  Long changeInTransaction(Change change);
  void settle();
  void changeAgain();
  void takeWriteLock(std::size_t database);
  void giveWriteLockBack();
  void end();

  Workspace& workspace_;
  bool marked_ = false;                         // begin was called
  std::size_t inner_ = 0;                       // transactions within the one that counts
  bool started_ = false;                        // SQLite's transaction is open
  std::set<std::size_t> writing_;               // databases whose write lock is taken
  std::vector<Change> changes_;                 // as long as they can be made again
  bool settled_ = false;                        // they cannot: something was read or defined behind them
  bool undone_ = false;                         // they have to be, before anything else is written
  bool lost_ = false;                           // the transaction has lost its writes
  std::optional<CatalogueChange> definitions_;  // from the first definition on
  std::map<TableKey, ValueList> passedOver_;    // rows that others held
};

}  // namespace QVSa::embedded
