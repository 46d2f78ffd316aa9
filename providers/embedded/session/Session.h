#pragma once

#include <functional>
#include <map>
#include <set>
#include <vector>

#include "providers/Provider.h"
#include "providers/embedded/session/Plan.h"
#include "providers/embedded/storage/Pool.h"

namespace QVSa::embedded {

class EmbeddedRows;

// A session of the engine: one handle, its current database, its transaction.
//
// Isolation is read committed. `begin` only marks: SQLite's transaction starts with the first write, after
// open row sets were read into memory and the write lock was taken, so that what a statement reads is newer than its
// wait. A read before that would end the transaction in a failure that no retry mends.
//
// A write that meets rows which another session has claimed waits for them, and that session may need the write lock to
// get on: so the lock is given back meanwhile, and what the transaction has written is undone and written again
// afterwards. Where its work was seen already, the statement fails with 1205 instead. A transaction that has lost its
// writes, by that or by a failure of SQLite, takes nothing but a rollback (3930).
class EmbeddedSession : public ProviderSession {
 public:
  EmbeddedSession(PooledHandle handle, std::size_t database, bool administrator);
  ~EmbeddedSession() override;
  EmbeddedSession(const EmbeddedSession&) = delete;
  EmbeddedSession& operator=(const EmbeddedSession&) = delete;

  BatchResult run(const Batch& batch) override;
  void begin() override;
  void commit() override;
  void rollback() override;

  // Brings the current database up to this build's layout, in one transaction. The session has it alone. Throws 4060
  // where a step fails: the database is left as it was.
  void upgrade();

  // For this session's row sets.
  void attach(EmbeddedRows& rows) { rows_.push_back(&rows); }
  void detach(EmbeddedRows& rows);
  void writeRow(const TableInfo& table, std::int64_t key, const std::vector<std::pair<std::size_t, Value>>& values);

 private:
  struct Cache;

  // A write: how it runs, once or again, and how many rows it wrote.
  struct Change {
    std::size_t database;
    std::string table;
    bool inserts;
    std::function<Long()> run;
    Long rows = 0;
  };

  template <class Work>
  auto guarded(Work work);
  BatchResult runStatements(const Batch& batch);
  std::shared_ptr<Plan> planFor(const Batch& batch, std::vector<tsql::Token>& tokens);
  // `tokens` are the literals of the batch from here on, each in the place of its number.
  // A batch that changes names on its way is bound statement by statement, as it runs.
  BatchResult runUncached(std::vector<tsql::Statement> statements, const Batch& batch,
                          const std::vector<tsql::Token>& tokens);
  void runStep(const std::shared_ptr<Plan>& plan, Step& step, const std::vector<tsql::Token>& tokens,
               BatchResult& result);
  std::unique_ptr<Rows> query(const std::shared_ptr<Plan>& plan, Step& step, const std::vector<tsql::Token>& tokens);
  Long write(const std::shared_ptr<Plan>& plan, Step& step, const std::vector<tsql::Token>& tokens);
  Long runWrite(Step& step, const std::vector<tsql::Token>& tokens);
  Long runOnce(Step& step, const std::vector<tsql::Token>& tokens);
  Long moveKeys(Step& step, const std::vector<tsql::Token>& tokens);
  void refusePassedOver(Step& step, const std::vector<tsql::Token>& tokens);
  void control(const tsql::Statement& statement);
  void setOption(const tsql::SetOption& option);
  void use(const std::string& database);
  void defineObject(const tsql::Statement& statement);

  void bind(Prepared& statement, const Compiled& compiled, const std::vector<Parameter>& parameters,
            const std::vector<tsql::Token>& tokens, const std::shared_ptr<const ValueList>& locked = nullptr);
  ValueList candidates(Step& step, const std::vector<tsql::Token>& tokens);
  std::shared_ptr<const ValueList> claimRows(Step& step, const std::vector<tsql::Token>& tokens);
  void useHandle(PooledHandle handle);
  void refreshCatalogue();
  void enter(std::size_t database);
  void leaveOthers();

  // SessionTransaction.cpp
  Long change(Change change);
  Long changeInTransaction(Change change);
  void settle();
  void changeAgain();
  void prepareWrite(std::size_t database);
  void takeWriteLock(std::size_t database);
  void giveWriteLockBack();
  void bufferRows();
  void endTransaction();
  void afterFailure(Long native);
  void refuseAfterLoss() const;

  // SessionAdministration.cpp
  bool administer(const tsql::Statement& statement);
  void alterDatabase(const tsql::AlterDatabase& alter);
  void backUpDatabase(const tsql::BackupDatabase& backup);
  void restoreDatabase(const tsql::RestoreDatabase& restore);
  void verifyBackup(const tsql::VerifyBackup& verify);
  bool callProcedure(const tsql::Call& call);
  void changeOwner(const tsql::Call& call);
  void takeApplicationLock(const tsql::Call& call);
  void reopen();
  void requireNoTransaction() const;

  PooledHandle retired_;  // until the end of the session: a statement on its way knows it
  PooledHandle handle_;
  std::shared_ptr<Cache> cache_;
  std::size_t database_;
  bool administrator_;
  bool marked_ = false;                    // begin was called
  std::size_t inner_ = 0;                  // transactions within the one that counts
  bool started_ = false;                   // SQLite's transaction is open
  std::set<std::size_t> writing_;          // databases whose write lock is taken
  std::vector<Change> changes_;            // of the transaction, as long as they can be made again
  bool settled_ = false;                   // they cannot: something was read or defined behind them
  bool undone_ = false;                    // they have to be, before anything else is written
  bool lost_ = false;                      // the transaction has lost its writes
  std::optional<CatalogueChange> change_;  // from the transaction's first definition on
  std::map<std::pair<std::size_t, std::string>, ValueList> passedOver_;  // rows that others held, by table
  std::vector<EmbeddedRows*> rows_;
  std::set<std::size_t> entered_;                       // databases that this session uses now, its current one always
  std::pair<std::size_t, std::string> identityInsert_;  // the table that takes identity values as they are given
};

}  // namespace QVSa::embedded
