#pragma once

#include "providers/embedded/session/Transaction.h"
#include "providers/tsql/Tree.h"

namespace QVSa::embedded {

class EmbeddedSession;

// A session's statements that look after databases: backup and restore, single-user mode, owners, application locks.
class Administration {
 public:
  Administration(EmbeddedSession& session, Workspace& workspace, Transaction& transaction, bool administrator)
      : session_(session), workspace_(workspace), transaction_(transaction), administrator_(administrator) {}

  // Whether the statement was one of these.
  bool run(const tsql::Statement& statement);
  // Throws 229.
  void requireAdministrator() const;

 private:
  Handle& handle() const { return workspace_.handle(); }
  void requireNoTransaction() const;
  void alterDatabase(const tsql::AlterDatabase& alter);
  void backUpDatabase(const tsql::BackupDatabase& backup);
  void restoreDatabase(const tsql::RestoreDatabase& restore);
  void verifyBackup(const tsql::VerifyBackup& verify);
  bool callProcedure(const tsql::Call& call);
  void changeOwner(const tsql::Call& call);
  void takeApplicationLock(const tsql::Call& call);

  EmbeddedSession& session_;
  Workspace& workspace_;
  Transaction& transaction_;
  bool administrator_;
};

}  // namespace QVSa::embedded
