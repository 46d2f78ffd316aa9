#pragma once

#include <vector>

#include "providers/Provider.h"
#include "providers/embedded/administration/Administration.h"
#include "providers/embedded/session/Transaction.h"

namespace QVSa::embedded {

// A session of the engine: it compiles and runs batches in its current database.
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

  // Brings a database up to this build's layout, in one transaction. The session has it alone. Throws 4060 where a step
  // fails: the database is left as it was.
  void upgrade(std::size_t database);

  // For this session's row sets.
  void attach(EmbeddedRows& rows) { workspace_.attach(rows); }
  void detach(EmbeddedRows& rows);
  void writeRow(const TableInfo& table, std::int64_t key, const std::vector<std::pair<std::size_t, Value>>& values);

 private:
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
  void bind(Prepared& statement, const Compiled& compiled, const std::vector<Parameter>& parameters,
            const std::vector<tsql::Token>& tokens, const std::shared_ptr<const ValueList>& locked = nullptr);
  ValueList candidates(Step& step, const std::vector<tsql::Token>& tokens);
  void control(const tsql::Statement& statement);
  void setOption(const tsql::SetOption& option);
  void use(const std::string& database);
  void defineObject(const tsql::Statement& statement);
  void upgradeCurrent();

  Workspace workspace_;
  Transaction transaction_;
  Administration administration_;
  TableKey identityInsert_;  // the table that takes identity values as they are given
  bool nocount_ = false;
};

}  // namespace QVSa::embedded
