#pragma once

#include <set>
#include <vector>

#include "QVSa/frame/Provider.h"
#include "providers/embedded/Plan.h"
#include "providers/embedded/Pool.h"

namespace QVSa::embedded {

class EmbeddedRows;

// A session of the engine: one handle, its current database, its transaction.
//
// Isolation is read committed. `begin` only marks: the storage library's transaction starts with the first write, after
// open row sets were read into memory and the writer's place was taken, so that what a statement reads is newer than
// its wait. A read before that would end the transaction in a failure that no retry mends.
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

  // For this session's row sets.
  void attach(EmbeddedRows& rows) { rows_.push_back(&rows); }
  void detach(EmbeddedRows& rows);
  void writeRow(const TableInfo& table, std::int64_t key, const std::vector<std::pair<std::size_t, Value>>& values);

 private:
  struct Cache;

  BatchResult runStatements(const Batch& batch);
  std::shared_ptr<Plan> planFor(const Batch& batch, std::vector<tsql::Token>& tokens);
  // `tokens` are the literals of the batch from here on, each in the place of its number.
  // A batch that changes names on its way is bound statement by statement, as it runs.
  BatchResult runUncached(std::vector<tsql::Statement> statements, const Batch& batch,
                          const std::vector<tsql::Token>& tokens);
  void runStep(const std::shared_ptr<Plan>& plan, Step& step, const std::vector<tsql::Token>& tokens,
               BatchResult& result);
  std::unique_ptr<Rows> query(const std::shared_ptr<Plan>& plan, Step& step, const std::vector<tsql::Token>& tokens);
  Long write(Step& step, const std::vector<tsql::Token>& tokens);
  Long runWrite(Step& step, const std::vector<tsql::Token>& tokens);
  Long moveKeys(Step& step, const std::vector<tsql::Token>& tokens);
  void control(const tsql::Statement& statement);
  void setOption(const tsql::SetOption& option);
  void use(const std::string& database);
  void defineObject(const tsql::Statement& statement);

  void bind(Prepared& statement, const Compiled& compiled, const std::vector<Parameter>& parameters,
            const std::vector<tsql::Token>& tokens, const std::shared_ptr<const ValueList>& locked = nullptr);
  ValueList candidates(Step& step, const std::vector<tsql::Token>& tokens);
  std::shared_ptr<const ValueList> claimRows(Step& step, const std::vector<tsql::Token>& tokens);
  void awaitRows(Step& step, const std::vector<tsql::Token>& tokens);
  void takeWriter(std::size_t database);
  void prepareWrite(std::size_t database);
  void endTransaction();
  void refreshCatalogue();
  void enter(std::size_t database);
  void leaveOthers();

  // SessionAdministration.cpp
  bool administer(const tsql::Statement& statement);
  void alterDatabase(const tsql::AlterDatabase& alter);
  void backUpDatabase(const tsql::BackupDatabase& backup);
  void restoreDatabase(const tsql::RestoreDatabase& restore);
  void verifyBackup(const tsql::VerifyBackup& verify);
  bool callProcedure(const tsql::Call& call);
  void changeOwner(const tsql::Call& call);
  void takeApplicationLock(const tsql::Call& call);
  void requireNoTransaction() const;

  PooledHandle handle_;
  std::shared_ptr<Cache> cache_;
  std::size_t database_;
  bool administrator_;
  bool marked_ = false;                    // begin was called
  std::size_t inner_ = 0;                  // transactions within the one that counts
  bool started_ = false;                   // the storage library's transaction is open
  std::set<std::size_t> writing_;          // databases whose writer's place is taken
  std::optional<CatalogueChange> change_;  // from the transaction's first definition on
  std::vector<EmbeddedRows*> rows_;
  std::set<std::size_t> entered_;                       // databases that this session uses now, its current one always
  std::pair<std::size_t, std::string> identityInsert_;  // the table that takes identity values as they are given
};

}  // namespace QVSa::embedded
