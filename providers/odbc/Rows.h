#pragma once

#include <deque>
#include <memory>
#include <optional>

#include "providers/Provider.h"
#include "providers/odbc/Connection.h"
#include "providers/odbc/RowWriter.h"
#include "providers/odbc/Statement.h"

namespace QVSa::odbc {

// A row set: read from the server row by row, or kept in memory.
class Rows final : public QVSa::Rows {
 public:
  // The current result of the statement, its rows still to be fetched.
  Rows(const std::shared_ptr<Connection>& connection, std::shared_ptr<Statement> statement);
  ~Rows() override;

  const std::vector<Column>& columns() const override { return columns_; }
  bool next() override;
  Variant value(std::size_t ordinal) const override;
  void update(const std::vector<std::pair<std::size_t, Variant>>& changes) override;

  const std::vector<ColumnType>& types() const { return types_; }
  // Makes the rows updatable. Columns behind the first `visible` ones serve the writer and are not shown.
  void writeWith(RowWriter writer, std::size_t visible);

  // Reads the rows still to come into memory. A failure among them is kept for the step that meets it.
  void keep();
  // Lets the rows still to come go: the session ends.
  void abandon() noexcept;

 private:
  void readUpTo(std::size_t ordinal) const;
  void readRow() const { readUpTo(types_.size() - 1); }
  void detach();
  bool nextKept();

  std::weak_ptr<Connection> connection_;
  std::shared_ptr<Statement> statement_;  // empty once the rows are in memory, or there are no more
  std::vector<Column> columns_;
  std::vector<ColumnType> types_;
  std::optional<RowWriter> writer_;
  mutable std::vector<Variant> row_;  // the current row's values, as far as they were asked for
  std::deque<std::vector<Variant>> kept_;
  std::optional<Failure> failure_;
  bool onRow_ = false;
  bool cutOff_ = false;
};

}  // namespace QVSa::odbc
