#pragma once

#include <deque>
#include <functional>
#include <memory>

#include "providers/Provider.h"
#include "providers/embedded/session/Plan.h"

namespace QVSa::embedded {

class EmbeddedSession;

// A row set of the engine. It streams from its statement until the session needs the handle for a write, and then goes
// on from memory.
class EmbeddedRows : public Rows {
 public:
  EmbeddedRows(EmbeddedSession& session, std::shared_ptr<Plan> plan, Step& step, Prepared statement);
  ~EmbeddedRows() override;
  EmbeddedRows(const EmbeddedRows&) = delete;
  EmbeddedRows& operator=(const EmbeddedRows&) = delete;

  const std::vector<Column>& columns() const override { return step_.columns; }
  bool next() override;
  Variant value(std::size_t ordinal) const override;
  void update(const std::vector<std::pair<std::size_t, Variant>>& changes) override;

  // Reads what is left into memory and lets the statement go.
  void buffer();
  bool isStreaming() const { return statement_.has_value(); }
  // The session ends: what is left is gone.
  void close();

 private:
  using Row = std::vector<Value>;
  Row read() const;
  void advance();
  void release();

  EmbeddedSession* session_;
  std::shared_ptr<Plan> plan_;
  Step& step_;
  std::optional<Prepared> statement_;
  bool ahead_ = false;  // the statement stands on a row that next() has not given yet; else on the current row
  std::deque<Row> buffered_;
  Row current_;  // where the statement does not stand on it
};

}  // namespace QVSa::embedded
