#pragma once

#include "providers/Provider.h"
#include "providers/odbc/Connection.h"
#include "providers/odbc/UpdatableSelect.h"

namespace QVSa::odbc {

// A session on a SQL Server through a driver of the system's driver manager.
class Session final : public ProviderSession {
 public:
  // `odbcText` is the driver manager's connection string. A failure's text repeats neither it nor the password.
  explicit Session(const String& odbcText, const String& password = {},
                   std::chrono::seconds loginTimeout = std::chrono::seconds(15));

  BatchResult run(const Batch& batch) override;
  void begin() override { connection_->begin(); }
  void commit() override { connection_->end(SQL_COMMIT); }
  void rollback() override { connection_->end(SQL_ROLLBACK); }

 private:
  BatchResult collect(const std::shared_ptr<Statement>& statement, const String& batch);
  std::unique_ptr<Rows> openUpdatable(UpdatableSelect& select, const Batch& batch);

  std::shared_ptr<Connection> connection_;
};

}  // namespace QVSa::odbc
