#pragma once

#include "providers/Provider.h"
#include "providers/odbc/Connection.h"
#include "providers/odbc/UpdatableSelect.h"

namespace QVSa::odbc {

// A session on a SQL Server through a driver of the system's driver manager.
class Session final : public ProviderSession {
 public:
  explicit Session(Target target);

  BatchResult run(const Batch& batch) override;
  void begin() override { connection_->begin(); }
  void commit() override { connection_->commit(); }
  void rollback() override { connection_->rollback(); }

 private:
  BatchResult collect(const std::shared_ptr<Statement>& statement, const WireBatch& batch);
  std::unique_ptr<Rows> openUpdatable(UpdatableSelect& select, const Batch& batch);

  std::shared_ptr<Connection> connection_;
};

}  // namespace QVSa::odbc
