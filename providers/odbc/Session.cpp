#include "providers/odbc/Session.h"

#include "providers/odbc/Pool.h"
#include "providers/odbc/PrimaryKey.h"
#include "providers/odbc/Rows.h"

namespace QVSa::odbc {

Session::Session(Target target) : connection_(std::make_shared<Connection>(std::move(target))) {}

BatchResult Session::run(const Batch& batch) {
  if (batch.updatable) {
    if (auto select = UpdatableSelect::of(batch.text)) {
      if (auto rows = openUpdatable(*select, batch)) return {std::move(rows), -1};
    }
  }
  const WireBatch wire = wireBatch(batch.text);
  if (wire.wantsDatabaseAlone) Pool::instance().clear();
  const auto statement = connection_->execute(wire, batch.timeout);
  return statement ? collect(statement, wire) : BatchResult{};
}

BatchResult Session::collect(const std::shared_ptr<Statement>& statement, const WireBatch& batch) {
  BatchResult result;
  do {
    if (statement->columnCount() == 0) {
      const Long affected = statement->affected();
      if (affected >= 0) result.affected = affected;
    } else if (!result.rows) {
      auto rows = std::make_unique<Rows>(connection_, statement);
      connection_->arriving(*rows);
      if (!batch.endsWithItsRowSet) rows->keep();
      result.rows = std::move(rows);
      if (batch.endsWithItsRowSet) return result;
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
  const WireBatch wire = wireBatch(select.added() == 0 ? batch.text : select.text());
  const auto statement = connection_->execute(wire, batch.timeout);
  auto rows = std::make_unique<Rows>(connection_, statement);
  rows->writeWith(select.writer(rows->columns(), rows->types(), batch.timeout),
                  rows->columns().size() - select.added());
  connection_->arriving(*rows);
  return rows;
}

}  // namespace QVSa::odbc
