#include "providers/odbc/Column.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <optional>

#include "providers/odbc/Failure.h"

namespace QVSa::odbc {

namespace {

// SQL Server's own time of day, which ODBC has no number for.
constexpr SQLSMALLINT serverTime = -154;
constexpr SQLSMALLINT serverTimeWithZone = -155;

SQLRETURN getData(SQLHSTMT statement, std::size_t ordinal, SQLSMALLINT type, void* buffer, std::size_t size,
                  SQLLEN& length) {
  const SQLRETURN rc =
      SQLGetData(statement, static_cast<SQLUSMALLINT>(ordinal + 1), type, buffer, static_cast<SQLLEN>(size), &length);
  if (!SQL_SUCCEEDED(rc) && rc != SQL_NO_DATA) throw failure(diagnostics(SQL_HANDLE_STMT, statement));
  return rc;
}

template <class T>
std::optional<T> readFixed(SQLHSTMT statement, std::size_t ordinal, SQLSMALLINT type) {
  T value{};
  SQLLEN length = 0;
  getData(statement, ordinal, type, &value, sizeof value, length);
  if (length == SQL_NULL_DATA) return std::nullopt;
  return value;
}

template <class Held, class T>
Variant held(const std::optional<T>& value) {
  return value ? Variant(static_cast<Held>(*value)) : Variant::null();
}

// Reads a value of any length in growing pieces; false for NULL. A piece that is not the last one ends with `reserved`
// bytes of terminator.
template <class Container>
bool readPieces(SQLHSTMT statement, std::size_t ordinal, SQLSMALLINT type, std::size_t reserved, Container& value) {
  constexpr std::size_t unit = sizeof(typename Container::value_type);
  for (std::size_t filled = 0;;) {
    value.resize(filled + std::clamp<std::size_t>(filled, 512, 65536));
    const std::size_t room = (value.size() - filled) * unit;
    SQLLEN length = 0;
    const SQLRETURN rc = getData(statement, ordinal, type, value.data() + filled, room, length);
    if (length == SQL_NULL_DATA) return false;
    const std::size_t most = room - reserved;
    const bool more =
        rc == SQL_SUCCESS_WITH_INFO && (length == SQL_NO_TOTAL || static_cast<std::size_t>(length) > most);
    const std::size_t got = rc == SQL_NO_DATA ? 0 : more ? most : static_cast<std::size_t>(length);
    filled += got / unit;
    value.resize(filled);
    if (!more) return true;
  }
}

Variant readText(SQLHSTMT statement, std::size_t ordinal) {
  std::u16string value;
  if (!readPieces(statement, ordinal, SQL_C_WCHAR, sizeof(SQLWCHAR), value)) return Variant::null();
  return fromUtf16(value);
}

Variant readBytes(SQLHSTMT statement, std::size_t ordinal) {
  Bytes value;
  if (!readPieces(statement, ordinal, SQL_C_BINARY, 0, value)) return Variant::null();
  value.shrink_to_fit();
  return value;
}

Variant wholeOrDouble(const std::optional<double>& value) {
  if (!value) return Variant::null();
  constexpr double lowest = std::numeric_limits<Long>::min();
  constexpr double highest = std::numeric_limits<Long>::max();
  const bool fits = *value >= lowest && *value <= highest && std::trunc(*value) == *value;
  return fits ? Variant(static_cast<Long>(*value)) : Variant(*value);
}

Variant readMoment(SQLHSTMT statement, std::size_t ordinal) {
  const auto at = readFixed<SQL_TIMESTAMP_STRUCT>(statement, ordinal, SQL_C_TYPE_TIMESTAMP);
  if (!at) return Variant::null();
  constexpr double nanosecondsADay = 86400e9;
  return Date(at->year, at->month, at->day, at->hour, at->minute, at->second).addDays(at->fraction / nanosecondsADay);
}

// ODBC would put today before a bare time that is read as a moment.
Variant readTime(SQLHSTMT statement, std::size_t ordinal) {
  const auto at = readFixed<SQL_TIME_STRUCT>(statement, ordinal, SQL_C_TYPE_TIME);
  if (!at) return Variant::null();
  constexpr double secondsADay = 86400;
  return Date((at->hour * 3600 + at->minute * 60 + at->second) / secondsADay);
}

}  // namespace

bool isText(const ColumnType& type) {
  switch (type.type) {
    case SQL_CHAR:
    case SQL_VARCHAR:
    case SQL_LONGVARCHAR:
    case SQL_WCHAR:
    case SQL_WVARCHAR:
    case SQL_WLONGVARCHAR:
      return true;
    default:
      return false;
  }
}

bool isBinary(const ColumnType& type) {
  return type.type == SQL_BINARY || type.type == SQL_VARBINARY || type.type == SQL_LONGVARBINARY;
}

bool isLong(const ColumnType& type) {
  constexpr SQLULEN longestInRow = 8000;
  const bool declaredLong =
      type.type == SQL_LONGVARCHAR || type.type == SQL_WLONGVARCHAR || type.type == SQL_LONGVARBINARY;
  // nvarchar(max) and varbinary(max) come as the ordinary types with the size 0, or with a very large one.
  return declaredLong || ((isText(type) || isBinary(type)) && (type.size == 0 || type.size > longestInRow));
}

Variant readColumn(SQLHSTMT statement, std::size_t ordinal, const ColumnType& type) {
  switch (type.type) {
    case SQL_BIT: {
      const auto bit = readFixed<unsigned char>(statement, ordinal, SQL_C_BIT);
      return bit ? Variant(*bit != 0) : Variant::null();
    }
    case SQL_TINYINT:
    case SQL_SMALLINT:
      return held<Integer>(readFixed<SQLSMALLINT>(statement, ordinal, SQL_C_SSHORT));
    case SQL_INTEGER:
      return held<Long>(readFixed<SQLINTEGER>(statement, ordinal, SQL_C_SLONG));
    case SQL_BIGINT:
    case SQL_DECIMAL:
    case SQL_NUMERIC:
      return wholeOrDouble(readFixed<double>(statement, ordinal, SQL_C_DOUBLE));
    case SQL_REAL:
    case SQL_FLOAT:
    case SQL_DOUBLE:
      return held<double>(readFixed<double>(statement, ordinal, SQL_C_DOUBLE));
    case SQL_TYPE_DATE:
    case SQL_TYPE_TIMESTAMP:
    case serverTimeWithZone:
      return readMoment(statement, ordinal);
    case SQL_TYPE_TIME:
    case serverTime:
      return readTime(statement, ordinal);
    default:
      return isBinary(type) ? readBytes(statement, ordinal) : readText(statement, ordinal);
  }
}

}  // namespace QVSa::odbc
