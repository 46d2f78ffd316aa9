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
  void hold(SQLSMALLINT cType, SQLSMALLINT type, const T& value);
  void hold(SQLSMALLINT cType, SQLSMALLINT type, const void* data, std::size_t size);
  void holdText(const String& text);
  void holdBytes(const Bytes& bytes);

  SQLSMALLINT cType_ = SQL_C_WCHAR;
  SQLSMALLINT type_ = SQL_WVARCHAR;
  SQLULEN size_ = 1;
  SQLSMALLINT digits_ = 0;
  Bytes data_;
  SQLLEN length_ = SQL_NULL_DATA;
};

}  // namespace QVSa::odbc
