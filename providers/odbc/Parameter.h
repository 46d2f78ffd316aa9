#pragma once

#include "providers/odbc/Column.h"

namespace QVSa::odbc {

// A value for a mark of a statement. It holds the data that the driver reads when the statement runs: it must stay in
// place until then.
class Parameter {
 public:
  // For the column of this type.
  Parameter(const Variant& value, const ColumnType& type);

  // To the mark at `position`, from 1. Throws the driver's failure.
  void bind(SQLHSTMT statement, SQLUSMALLINT position);

 private:
  template <class T>
  void hold(SQLSMALLINT cType, const T& value);
  void hold(SQLSMALLINT cType, const void* data, std::size_t size);
  void hold(const Variant& value);

  ColumnType type_;
  SQLSMALLINT cType_ = SQL_C_WCHAR;
  Bytes data_;
  SQLLEN length_ = SQL_NULL_DATA;
};

}  // namespace QVSa::odbc
