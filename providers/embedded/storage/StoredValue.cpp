#include "providers/embedded/storage/StoredValue.h"

#include <new>
#include <sqlite3.h>

namespace QVSa::embedded {

namespace {

// SQLite gives no bytes where it had no memory to make them ready.
std::string textFrom(const unsigned char* text, int size) {
  if (text == nullptr) throw std::bad_alloc();
  return std::string(reinterpret_cast<const char*>(text), static_cast<std::size_t>(size));
}

Bytes bytesFrom(const void* bytes, int size) {
  if (bytes == nullptr && size > 0) throw std::bad_alloc();
  const auto* const first = static_cast<const std::uint8_t*>(bytes);
  return Bytes(first, first + size);
}

}  // namespace

Value readValue(sqlite3_value* value) {
  switch (sqlite3_value_type(value)) {
    case SQLITE_INTEGER:
      return std::int64_t{sqlite3_value_int64(value)};
    case SQLITE_FLOAT:
      return sqlite3_value_double(value);
    case SQLITE_TEXT: {
      const unsigned char* const text = sqlite3_value_text(value);
      return textFrom(text, sqlite3_value_bytes(value));
    }
    case SQLITE_BLOB: {
      const void* const bytes = sqlite3_value_blob(value);
      return bytesFrom(bytes, sqlite3_value_bytes(value));
    }
    default:
      return {};
  }
}

// Any use of the library's value is safe here: a handle belongs to one thread at a time.
Value readColumn(sqlite3_stmt* statement, int ordinal) { return readValue(sqlite3_column_value(statement, ordinal)); }

void giveResult(sqlite3_context* context, const Value& value) {
  if (const auto* whole = std::get_if<std::int64_t>(&value))
    sqlite3_result_int64(context, *whole);
  else if (const auto* real = std::get_if<double>(&value))
    sqlite3_result_double(context, *real);
  else if (const auto* text = std::get_if<std::string>(&value))
    sqlite3_result_text64(context, text->data(), text->size(), SQLITE_TRANSIENT, SQLITE_UTF8);
  else if (const auto* bytes = std::get_if<Bytes>(&value))
    bytes->empty() ? sqlite3_result_zeroblob(context, 0)
                   : sqlite3_result_blob64(context, bytes->data(), bytes->size(), SQLITE_TRANSIENT);
  else
    sqlite3_result_null(context);
}

int bindValue(sqlite3_stmt* statement, int parameter, const Value& value) {
  if (const auto* whole = std::get_if<std::int64_t>(&value)) return sqlite3_bind_int64(statement, parameter, *whole);
  if (const auto* real = std::get_if<double>(&value)) return sqlite3_bind_double(statement, parameter, *real);
  if (const auto* text = std::get_if<std::string>(&value))
    return sqlite3_bind_text64(statement, parameter, text->data(), text->size(), SQLITE_TRANSIENT, SQLITE_UTF8);
  const auto* bytes = std::get_if<Bytes>(&value);
  if (bytes == nullptr) return sqlite3_bind_null(statement, parameter);
  if (bytes->empty()) return sqlite3_bind_zeroblob(statement, parameter, 0);
  return sqlite3_bind_blob64(statement, parameter, bytes->data(), bytes->size(), SQLITE_TRANSIENT);
}

}  // namespace QVSa::embedded
