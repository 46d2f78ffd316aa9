#include "providers/embedded/session/Rows.h"

#include "providers/embedded/session/Session.h"

namespace QVSa::embedded {

EmbeddedRows::EmbeddedRows(EmbeddedSession& session, std::shared_ptr<Plan> plan, Step& step, Prepared statement)
    : session_(&session), plan_(std::move(plan)), step_(step), statement_(std::move(statement)) {
  // The first row is fetched at once, so that a statement that fails does so when it is run.
  advance();
  session.attach(*this);
}

EmbeddedRows::~EmbeddedRows() {
  release();
  if (session_) session_->detach(*this);
}

void EmbeddedRows::advance() {
  ahead_ = statement_->step();
  if (!ahead_) release();
}

void EmbeddedRows::release() {
  if (!statement_) return;
  step_.main->giveBack(std::move(*statement_));
  statement_.reset();
  ahead_ = false;
}

EmbeddedRows::Row EmbeddedRows::read() const {
  Row row;
  const auto columns = static_cast<std::size_t>(statement_->columnCount());
  row.reserve(columns);
  for (std::size_t i = 0; i < columns; ++i) row.push_back(statement_->column(static_cast<int>(i)));
  return row;
}

bool EmbeddedRows::next() {
  if (!buffered_.empty()) {
    current_ = std::move(buffered_.front());
    buffered_.pop_front();
    return true;
  }
  if (statement_ && !ahead_) advance();
  if (!ahead_) return false;
  // A row set of one row lets its statement go before the caller looks at it.
  if (current_.empty()) {
    current_ = read();
    advance();
  } else {
    ahead_ = false;
  }
  return true;
}

Variant EmbeddedRows::value(std::size_t ordinal) const {
  const Type& type = step_.results.at(ordinal).type;
  if (statement_ && !ahead_) return variantOf(statement_->column(static_cast<int>(ordinal)), type);
  return variantOf(current_.at(ordinal), type);
}

void EmbeddedRows::update(const std::vector<std::pair<std::size_t, Variant>>& changes) {
  if (!session_ || !step_.updatable)
    throw Failure(number::readOnly, "QVSa",
                  "Current Recordset does not support updating. This may be a limitation of the provider, or of the "
                  "selected locktype.");
  // The session would do so before it writes, and the row's key has to be at hand.
  buffer();
  std::vector<std::pair<std::size_t, Value>> values;
  for (const auto& [ordinal, variant] : changes) {
    const auto column = step_.results.at(ordinal).tableColumn;
    if (!column) throw Failure(number::readOnly, "QVSa", "A computed column cannot be written back.");
    Value value = valueOf(variant, step_.table->columns[*column].type);
    current_[ordinal] = value;
    values.emplace_back(*column, std::move(value));
  }
  session_->writeRow(*step_.table, std::get<std::int64_t>(current_.back()), values);
}

void EmbeddedRows::buffer() {
  if (statement_ && !ahead_) {
    current_ = read();
    advance();
  }
  while (ahead_) {
    buffered_.push_back(read());
    advance();
  }
}

void EmbeddedRows::close() {
  release();
  buffered_.clear();
  session_ = nullptr;
}

}  // namespace QVSa::embedded
