#include "providers/odbc/Rows.h"

namespace QVSa::odbc {

namespace {

Failure closed() { return Failure(number::closed, "ODBC", "Operation is not allowed when the object is closed."); }

}  // namespace

Rows::Rows(const std::shared_ptr<Connection>& connection, std::shared_ptr<Statement> statement)
    : connection_(connection), statement_(std::move(statement)) {
  const std::size_t count = statement_->columnCount();
  for (std::size_t ordinal = 0; ordinal < count; ++ordinal) {
    auto [column, type] = statement_->describe(ordinal);
    columns_.push_back(std::move(column));
    types_.push_back(type);
  }
}

Rows::~Rows() {
  if (statement_) statement_->readOut();
  detach();
}

bool Rows::next() {
  if (cutOff_) throw closed();
  row_.clear();
  onRow_ = statement_ ? statement_->fetch() : nextKept();
  if (!onRow_) detach();
  return onRow_;
}

bool Rows::nextKept() {
  if (kept_.empty()) {
    if (failure_) throw *failure_;
    return false;
  }
  row_ = std::move(kept_.front());
  kept_.pop_front();
  return true;
}

Variant Rows::value(std::size_t ordinal) const {
  if (!onRow_) {
    throw Failure(number::noRow, "ODBC",
                  "Either BOF or EOF is True, or the current record has been deleted. Requested operation requires a "
                  "current record.");
  }
  readUpTo(ordinal);
  if (ordinal < row_.size()) return row_[ordinal];
  throw failure_ ? *failure_ : runtimeFailure(number::position);
}

void Rows::update(const std::vector<std::pair<std::size_t, Variant>>& changes) {
  if (!writer_) {
    throw Failure(number::readOnly, "ODBC",
                  "Current Recordset does not support updating. This may be a limitation of the provider, or of the "
                  "selected locktype.");
  }
  const auto connection = connection_.lock();
  if (!connection) throw closed();
  if (!onRow_) throw Failure(number::noRow, "ODBC", "Requested operation requires a current record.");
  readRow();
  writer_->write(*connection, row_, changes);
  for (const auto& [ordinal, value] : changes) row_[ordinal] = value;
}

void Rows::writeWith(RowWriter writer, std::size_t visible) {
  writer_ = std::move(writer);
  columns_.resize(visible);
}

void Rows::keep() {
  if (!statement_) return;
  std::vector<Variant> current;
  try {
    if (onRow_) readRow();
    current = std::move(row_);
    for (row_.clear(); statement_->fetch(); row_.clear()) {
      readRow();
      kept_.push_back(std::move(row_));
    }
  } catch (const Failure& failure) {
    failure_ = failure;
  }
  if (!current.empty()) row_ = std::move(current);
  detach();
}

void Rows::abandon() noexcept {
  if (statement_) statement_->readOut();
  statement_.reset();
  cutOff_ = true;
}

void Rows::readUpTo(std::size_t ordinal) const {
  if (!statement_) return;
  for (std::size_t at = row_.size(); at <= ordinal && at < types_.size(); ++at) {
    row_.push_back(statement_->value(at, types_[at]));
  }
}

void Rows::detach() {
  statement_.reset();
  if (const auto connection = connection_.lock()) connection->arrived(*this);
}

}  // namespace QVSa::odbc
