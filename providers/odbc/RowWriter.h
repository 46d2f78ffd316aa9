#pragma once

#include <chrono>
#include <vector>

#include "providers/odbc/Connection.h"

namespace QVSa::odbc {

// Writes columns of a row back to its table, where it is found again by its primary key.
struct RowWriter {
  String table;                   // as it stands in a statement
  std::vector<String> columns;    // the table's column behind each of the row set
  std::vector<ColumnType> types;  // of the same columns
  std::vector<std::size_t> key;   // positions of the primary key's columns
  std::chrono::seconds timeout{0};

  // `row` holds all values of the row as they were read.
  void write(Connection& connection, const std::vector<Variant>& row,
             const std::vector<std::pair<std::size_t, Variant>>& changes) const;
};

}  // namespace QVSa::odbc
