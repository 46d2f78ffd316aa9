#include "providers/embedded/storage/Prepared.h"

#include <utility>

#include "providers/embedded/storage/StorageFailure.h"
#include "providers/embedded/storage/StoredValue.h"

namespace QVSa::embedded {

Prepared::Prepared(sqlite3* handle, const std::string& text) {
  const int code = sqlite3_prepare_v3(handle, text.data(), static_cast<int>(text.size()), SQLITE_PREPARE_PERSISTENT,
                                      &statement_, nullptr);
  if (code != SQLITE_OK) throwStorageFailure(handle, code);
}

Prepared::~Prepared() { sqlite3_finalize(statement_); }

Prepared::Prepared(Prepared&& other) noexcept : statement_(std::exchange(other.statement_, nullptr)) {}

void Prepared::bind(int parameter, const Value& value) {
  const int code = bindValue(statement_, parameter, value);
  if (code != SQLITE_OK) fail(code);
}

void Prepared::bind(int parameter, std::shared_ptr<const ValueList> values) {
  bindList(statement_, parameter, std::move(values));
}

bool Prepared::step() {
  const int code = sqlite3_step(statement_);
  if (code != SQLITE_ROW && code != SQLITE_DONE) fail(code);
  return code == SQLITE_ROW;
}

void Prepared::reset() noexcept { sqlite3_reset(statement_); }

Value Prepared::column(int ordinal) const { return readColumn(statement_, ordinal); }

std::vector<Value> Prepared::row() const {
  std::vector<Value> values;
  for (int i = 0; i < columnCount(); ++i) values.push_back(column(i));
  return values;
}

void Prepared::runWith(const std::vector<Value>& values) {
  for (std::size_t i = 0; i < values.size(); ++i) bind(static_cast<int>(i + 1), values[i]);
  while (step()) continue;
  reset();
}

int Prepared::columnCount() const { return sqlite3_column_count(statement_); }

void Prepared::fail(int code) {
  // The handle keeps the text and the code of the failure over a reset.
  sqlite3_reset(statement_);
  throwStorageFailure(sqlite3_db_handle(statement_), code);
}

}  // namespace QVSa::embedded
