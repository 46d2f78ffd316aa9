#pragma once

#include <cstdint>
#include <filesystem>
#include <sqlite3.h>
#include <string>
#include <string_view>
#include <vector>

namespace QVSa::bench {

// An installation's files on SQLite's C interface, opened as the engine opens them: attached under their
// names, WAL, full sync, the same page cache, the collation registered.
class Storage {
 public:
  explicit Storage(const std::filesystem::path& folder);
  ~Storage();
  Storage(const Storage&) = delete;
  Storage& operator=(const Storage&) = delete;

  sqlite3* get() const { return handle_; }
  void execute(const std::string& text);

 private:
  sqlite3* handle_ = nullptr;
};

// The columns of one row, taken out of the statement.
struct Row {
  std::vector<std::string> texts;
  std::vector<std::int64_t> numbers;
};

// A prepared statement. Texts that are bound have to live until it has run.
class Query {
 public:
  Query(const Storage& storage, const std::string& text);
  ~Query();
  Query(const Query&) = delete;
  Query& operator=(const Query&) = delete;

  // Binds all parameters in order and starts anew.
  template <class... Values>
  Query& start(const Values&... values) {
    sqlite3_reset(statement_);
    int place = 0;
    (bind(++place, values), ...);
    return *this;
  }
  bool step();
  // Steps to the end: for a write.
  void run();
  // Steps to the one row that there has to be, reads it and resets.
  Row one();
  Row row() const;

 private:
  void bind(int place, std::string_view text);
  void bind(int place, std::int64_t number);

  sqlite3_stmt* statement_ = nullptr;
};

// Now as the files hold it: 1/300 s since 1900-01-01, local time.
std::int64_t nowTicks();
constexpr std::int64_t ticksPerDay = 300LL * 86'400;

}  // namespace QVSa::bench
