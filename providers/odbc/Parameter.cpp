#include "providers/odbc/Parameter.h"

#include <algorithm>
#include <cstring>

#include "providers/odbc/Failure.h"

namespace QVSa::odbc {

namespace {

// The longest that a server takes as an ordinary text or binary value.
constexpr std::size_t longestText = 4000;
constexpr std::size_t longestBinary = 8000;

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

// The value goes out as what it is, with its own size: the server converts it to the column's type, and refuses what
// does not fit. A driver that were told the column's size would cut it without a word.
Parameter::Parameter(const Variant& value, const ColumnType& type) {
  if (isBinary(type)) {
    holdBytes(value.isNull() ? Bytes() : value.toBytes());
  } else if (type.type == SQL_BIT && !value.isNull()) {
    hold<unsigned char>(SQL_C_BIT, SQL_BIT, value.toBoolean() ? 1 : 0);
  } else if (value.isDate()) {
    constexpr SQLULEN digitsOfMoment = 23;
    constexpr SQLSMALLINT milliseconds = 3;
    hold(SQL_C_TYPE_TIMESTAMP, SQL_TYPE_TIMESTAMP, moment(value.toDate()));
    size_ = digitsOfMoment;
    digits_ = milliseconds;
  } else if (value.isNull() || value.isText() || isText(type)) {
    holdText(value.isNull() ? String() : value.toText());
  } else if (isFractional(type)) {
    hold<double>(SQL_C_DOUBLE, SQL_DOUBLE, value.toDouble());
  } else {
    hold<SQLINTEGER>(SQL_C_SLONG, SQL_INTEGER, value.toLong());
  }
  if (value.isNull()) length_ = SQL_NULL_DATA;
}

template <class T>
void Parameter::hold(SQLSMALLINT cType, SQLSMALLINT type, const T& value) {
  hold(cType, type, &value, sizeof value);
}

void Parameter::hold(SQLSMALLINT cType, SQLSMALLINT type, const void* data, std::size_t size) {
  cType_ = cType;
  type_ = type;
  length_ = static_cast<SQLLEN>(size);
  // One byte more than needed: an empty text must have an address, or drivers take it for NULL.
  data_.resize(size + 1);
  if (size > 0) std::memcpy(data_.data(), data, size);
}

void Parameter::holdText(const String& text) {
  const std::u16string wide = toUtf16(text);
  hold(SQL_C_WCHAR, wide.size() > longestText ? SQL_WLONGVARCHAR : SQL_WVARCHAR, wide.data(),
       wide.size() * sizeof(char16_t));
  size_ = std::max<SQLULEN>(wide.size(), 1);
}

void Parameter::holdBytes(const Bytes& bytes) {
  hold(SQL_C_BINARY, bytes.size() > longestBinary ? SQL_LONGVARBINARY : SQL_VARBINARY, bytes.data(), bytes.size());
  size_ = std::max<SQLULEN>(bytes.size(), 1);
}

void Parameter::bind(SQLHSTMT statement, SQLUSMALLINT position) {
  const SQLRETURN rc = SQLBindParameter(statement, position, SQL_PARAM_INPUT, cType_, type_, size_, digits_,
                                        data_.data(), static_cast<SQLLEN>(data_.size()), &length_);
  if (!SQL_SUCCEEDED(rc)) throw failure(diagnostics(SQL_HANDLE_STMT, statement));
}

}  // namespace QVSa::odbc
