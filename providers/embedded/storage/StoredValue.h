#pragma once

#include "providers/embedded/bind/Types.h"

struct sqlite3_context;
struct sqlite3_stmt;
struct sqlite3_value;

namespace QVSa::embedded {

// Values on their way into and out of SQLite.
Value readValue(sqlite3_value* value);
Value readColumn(sqlite3_stmt* statement, int ordinal);
void giveResult(sqlite3_context* context, const Value& value);
// Gives the library's result code.
int bindValue(sqlite3_stmt* statement, int parameter, const Value& value);

}  // namespace QVSa::embedded
