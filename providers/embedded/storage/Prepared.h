#pragma once

#include <memory>
#include <sqlite3.h>
#include <string>

#include "providers/embedded/bind/Types.h"
#include "providers/embedded/functions/ListTable.h"

namespace QVSa::embedded {

// A prepared SQLite statement. Throws the failure that belongs to a result code; the statement is reset
// then.
class Prepared {
 public:
  Prepared(sqlite3* handle, const std::string& text);
  ~Prepared();
  Prepared(Prepared&& other) noexcept;
  Prepared& operator=(Prepared&&) = delete;

  // Parameters count from 1. The statement has to be reset.
  void bind(int parameter, const Value& value);
  void bind(int parameter, std::shared_ptr<const ValueList> values);
  // True while there is a row.
  bool step();
  void reset() noexcept;
  // Of the current row, counted from 0.
  Value column(int ordinal) const;
  int columnCount() const;
  std::vector<Value> row() const;
  // Runs a statement that gives no rows, with values for its first parameters.
  void runWith(const std::vector<Value>& values);
  sqlite3_stmt* get() const { return statement_; }

 private:
  [[noreturn]] void fail(int code);

  sqlite3_stmt* statement_ = nullptr;
};

}  // namespace QVSa::embedded
