#include "providers/odbc/Parameter.h"

#include <cstring>

#include "providers/odbc/Failure.h"

namespace QVSa::odbc {

namespace {

SQL_TIMESTAMP_STRUCT moment(Date date) {
  SQL_TIMESTAMP_STRUCT result{};
  result.year = static_cast<SQLSMALLINT>(date.year());
  result.month = static_cast<SQLUSMALLINT>(date.month());
  result.day = static_cast<SQLUSMALLINT>(date.day());
  result.hour = static_cast<SQLUSMALLINT>(date.hour());
  result.minute = static_cast<SQLUSMALLINT>(date.minute());
  result.second = static_cast<SQLUSMALLINT>(date.second());
  result.fraction = static_cast<SQLUINTEGER>(date.millisecond()) * 1000000;
  return result;
}

bool isFractional(const ColumnType& type) {
  switch (type.type) {
    case SQL_DECIMAL:
    case SQL_NUMERIC:
    case SQL_REAL:
    case SQL_FLOAT:
    case SQL_DOUBLE:
      return true;
    default:
      return false;
  }
}

}  // namespace

Parameter::Parameter(const Variant& value, const ColumnType& type) : type_(type) {
  if (isBinary(type)) cType_ = SQL_C_BINARY;
  if (!value.isNull()) hold(value);
}

template <class T>
void Parameter::hold(SQLSMALLINT cType, const T& value) {
  hold(cType, &value, sizeof value);
}

void Parameter::hold(SQLSMALLINT cType, const void* data, std::size_t size) {
  cType_ = cType;
  length_ = static_cast<SQLLEN>(size);
  // One byte more than needed: an empty text must have an address, or drivers take it for NULL.
  data_.resize(size + 1);
  std::memcpy(data_.data(), data, size);
}

void Parameter::hold(const Variant& value) {
  if (isBinary(type_)) {
    const Bytes bytes = value.toBytes();
    if (bytes.empty()) return hold(SQL_C_BINARY, "", 0);
    return hold(SQL_C_BINARY, bytes.data(), bytes.size());
  }
  if (type_.type == SQL_BIT) return hold<unsigned char>(SQL_C_BIT, value.toBoolean() ? 1 : 0);
  if (value.isDate()) return hold(SQL_C_TYPE_TIMESTAMP, moment(value.toDate()));
  if (!value.isText() && !isText(type_) && isFractional(type_)) return hold<double>(SQL_C_DOUBLE, value.toDouble());
  if (!value.isText() && !isText(type_)) return hold<SQLINTEGER>(SQL_C_SLONG, value.toLong());
  const std::u16string text = toWide(value.toText());
  hold(SQL_C_WCHAR, text.data(), text.size() * sizeof(char16_t));
}

void Parameter::bind(SQLHSTMT statement, SQLUSMALLINT position) {
  const SQLRETURN rc = SQLBindParameter(statement, position, SQL_PARAM_INPUT, cType_, type_.type, type_.size,
                                        type_.digits, data_.data(), static_cast<SQLLEN>(data_.size()), &length_);
  if (!SQL_SUCCEEDED(rc)) throw failure(diagnostics(SQL_HANDLE_STMT, statement));
}

}  // namespace QVSa::odbc
