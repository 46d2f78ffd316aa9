#pragma once

#include <map>

#include "QVSa/frame/internal/Providers.h"

namespace QVSa::test {

struct FakeTable {
  std::vector<Column> columns;
  std::vector<std::vector<Variant>> rows;
};

// A server in memory, standing in for every provider while it lives. It answers the statements that it was told, with a
// row set or a failure, and anything else with success; `log` keeps what reached it, in order.
class FakeServer {
 public:
  FakeServer() : before_(interposeOpener([this](const ConnectionOptions& options) { return open(options); })) {}
  ~FakeServer() { interposeOpener(std::move(before_)); }
  FakeServer(const FakeServer&) = delete;
  FakeServer& operator=(const FakeServer&) = delete;

  // Updates of the row set land in the table.
  FakeTable& answer(const String& statement, FakeTable table) { return tables_[statement] = std::move(table); }
  // "open", "begin", "commit" and "rollback" can fail as well.
  void fail(const String& statement, const Failure& failure) { failures_.insert_or_assign(statement, failure); }

  std::vector<String> log;
  ConnectionOptions lastOptions;
  Batch lastBatch;
  int sessions = 0;     // open at this moment
  int rowSets = 0;      // alive at this moment
  int fetchedRows = 0;  // by all row sets so far

 private:
  class FakeRows;
  class FakeSession;

  std::unique_ptr<ProviderSession> open(const ConnectionOptions& options);
  void record(const String& statement) {
    log.push_back(statement);
    const auto failure = failures_.find(statement);
    if (failure != failures_.end()) throw failure->second;
  }

  SessionOpener before_;
  std::map<String, FakeTable> tables_;
  std::map<String, Failure> failures_;
};

class FakeServer::FakeRows : public Rows {
 public:
  FakeRows(FakeServer& server, FakeTable& table) : server_(server), table_(table) { ++server_.rowSets; }
  ~FakeRows() override { --server_.rowSets; }
  const std::vector<Column>& columns() const override { return table_.columns; }
  bool next() override {
    if (next_ == table_.rows.size()) return false;
    ++next_;
    ++server_.fetchedRows;
    return true;
  }
  Variant value(std::size_t ordinal) const override { return table_.rows[next_ - 1][ordinal]; }
  void update(const std::vector<std::pair<std::size_t, Variant>>& changes) override {
    server_.record("update");
    for (const auto& [ordinal, value] : changes) table_.rows[next_ - 1][ordinal] = value;
  }

 private:
  FakeServer& server_;
  FakeTable& table_;
  std::size_t next_ = 0;
};

class FakeServer::FakeSession : public ProviderSession {
 public:
  explicit FakeSession(FakeServer& server) : server_(server) { ++server_.sessions; }
  ~FakeSession() override {
    server_.log.push_back("close");
    --server_.sessions;
  }
  BatchResult run(const Batch& batch) override {
    server_.lastBatch = batch;
    server_.record(batch.text);
    const auto table = server_.tables_.find(batch.text);
    if (table == server_.tables_.end()) return {nullptr, 1};
    return {std::make_unique<FakeRows>(server_, table->second), -1};
  }
  void begin() override { server_.record("begin"); }
  void commit() override { server_.record("commit"); }
  void rollback() override { server_.record("rollback"); }

 private:
  FakeServer& server_;
};

inline std::unique_ptr<ProviderSession> FakeServer::open(const ConnectionOptions& options) {
  lastOptions = options;
  record("open");
  return std::make_unique<FakeSession>(*this);
}

}  // namespace QVSa::test
