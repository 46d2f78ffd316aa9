#pragma once

#include <chrono>
#include <vector>

#include "providers/Provider.h"
#include "providers/odbc/Column.h"
#include "providers/odbc/Parameter.h"

namespace QVSa::odbc {

class Connection;

// A statement handle; gives up its results when it goes. Throws the failures of the driver and the server.
class Statement {
 public:
  Statement(Connection& connection, SQLHDBC handle, std::chrono::seconds timeout);
  ~Statement();
  Statement(const Statement&) = delete;
  Statement& operator=(const Statement&) = delete;

  void execute(const String& text);
  // With the parameters' values for the marks of the text, in order.
  void execute(const String& text, std::vector<Parameter>& parameters);
  // 0 where the current result is no row set.
  std::size_t columnCount() const;
  // Of the column at a position from 0.
  std::pair<Column, ColumnType> describe(std::size_t ordinal) const;
  // Rows that the current result wrote; -1 where the server did not count.
  Long affected() const;
  // Steps to the next result of the batch; false behind the last one.
  bool moreResults();

  // Steps to the next row of the current result; false behind the last one.
  bool fetch();
  // Steps over the rows behind the current one if they are few.
  void readOut() noexcept;
  Variant value(std::size_t ordinal, const ColumnType& type) const { return readColumn(handle_, ordinal, type); }

 private:
  // False for SQL_NO_DATA.
  bool check(SQLRETURN rc) const;

  Connection& connection_;
  SQLHSTMT handle_ = SQL_NULL_HSTMT;
};

}  // namespace QVSa::odbc
