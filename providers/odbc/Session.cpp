#include "providers/odbc/Session.h"

#include "providers/odbc/PrimaryKey.h"
#include "providers/odbc/Rows.h"
#include "providers/odbc/WireText.h"

namespace QVSa::odbc {

Session::Session(const String& odbcText, const String& password, std::chrono::seconds loginTimeout)
    : connection_(std::make_shared<Connection>(odbcText, password, loginTimeout)) {}

BatchResult Session::run(const Batch& batch) {
  if (batch.updatable) {
    if (auto select = UpdatableSelect::of(batch.text)) {
      if (auto rows = openUpdatable(*select, batch)) return {std::move(rows), -1};
    }
  }
  const auto statement = connection_->statement(batch.timeout);
  statement->execute(wireText(batch.text));
  return collect(statement, batch.text);
}

BatchResult Session::collect(const std::shared_ptr<Statement>& statement, const String& batch) {
  BatchResult result;
  do {
    if (statement->columnCount() == 0) {
      const Long affected = statement->affected();
      if (affected >= 0) result.affected = affected;
    } else if (!result.rows) {
      auto rows = std::make_unique<Rows>(connection_, statement);
      connection_->arriving(*rows);
      const bool last = endsWithItsRowSet(batch);
      if (!last) rows->keep();
      result.rows = std::move(rows);
      if (last) return result;
    }
  } while (statement->moreResults());
  return result;
}

// Empty for a table without a primary key. The rows arrive as any others: the first one written back brings the rest
// into memory, so that what is written does not change which rows come.
std::unique_ptr<Rows> Session::openUpdatable(UpdatableSelect& select, const Batch& batch) {
  const auto key = primaryKey(*connection_, select.table(), batch.timeout);
  if (key.empty()) return nullptr;
  select.addKey(key);
  const auto statement = connection_->statement(batch.timeout);
  statement->execute(select.added() == 0 ? batch.text : select.text());
  auto rows = std::make_unique<Rows>(connection_, statement);
  rows->writeWith(select.writer(rows->columns(), rows->types(), batch.timeout),
                  rows->columns().size() - select.added());
  connection_->arriving(*rows);
  return rows;
}

}  // namespace QVSa::odbc
