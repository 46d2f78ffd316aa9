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

// Registers, on an SQLite connection, all that the emitter's texts call:
//   collation tsql: no case, no trailing blanks, Unicode folding, then code order
//   t_convert(x, fromBase, toBase, size, purpose, style): see Conversions.h, bases and purpose as numbers
//   t_add(a, b) t_subtract(a, b) t_multiply(a, b) t_negate(a): int arithmetic, 8115 where the result has no 32 bits
//   t_divide(a, b) t_modulo(a, b): whole numbers or reals by storage class, 8134 for a zero divisor
//   t_like(value, pattern [, escape])
//   t_len(x) t_charindex(what, in [, start]) t_replace(x, what, with) t_substring(x, start, count)
//   t_left(x, n) t_right(x, n) t_ltrim(x) t_rtrim(x) t_upper(x) t_lower(x) t_str(x [, width [, decimals]])
//   t_replicate(x, n)
//   t_getdate() t_dateadd(part, n, ticks) t_datediff(part, from, to) t_datepart(part, ticks): parts by full names
//   t_scope_identity() t_abs(x) t_round(x, n) t_floor(x) t_ceiling(x)
//   list(?): a table-valued function with one column, value: the Values bound by bindList
// A failure inside a function is kept as an exception and rethrown by rethrowFailure (throwStorageFailure calls it).
void registerFunctions(sqlite3* handle, FunctionContext& context);

// Rethrows the failure that a function raised while the handle's last step ran; nothing otherwise.
void rethrowFailure(sqlite3* handle);

}  // namespace QVSa::embedded
