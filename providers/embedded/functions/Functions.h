#pragma once

#include <cstdint>
#include <functional>

struct sqlite3;

namespace QVSa::embedded {

// What the functions need to know of the session whose handle runs them.
struct FunctionContext {
  std::int64_t statementTicks = 0;  // getdate(): one moment for the whole statement
  std::int64_t scopeIdentity = 0;   // the session's last identity value
  bool hasScopeIdentity = false;
};

// Registers, on an SQLite connection, all that the emitter's texts call: the collation tsql; the functions that the
// tables at the ends of TextFunctions.cpp, DateFunctions.cpp and NumberFunctions.cpp and in Functions.cpp name; the
// aggregates; and list(?), a table with one column, value, of the Values that bindList bound. A failure inside a
// function is kept as an exception and rethrown by rethrowFailure (throwStorageFailure calls it).
void registerFunctions(sqlite3* handle, FunctionContext& context);

// Rethrows the failure that a function raised while the handle's last step ran; nothing otherwise.
void rethrowFailure(sqlite3* handle);

}  // namespace QVSa::embedded
