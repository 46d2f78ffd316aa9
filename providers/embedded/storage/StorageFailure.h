#pragma once

#include <string>

#include "providers/tsql/SqlFailure.h"

struct sqlite3;

namespace QVSa::embedded {

// Throws std::bad_alloc where an SQLite result code means want of memory.
void requireMemory(int code);

// Throws the failure for an SQLite result code, with SQL Server's number where it has one: a function's
// own failure first, then 2627 and 2601 (unique), 515 (not null), 1205 (the write lock is taken while this handle
// writes, or the rows read are old), the time-out, 1105 (no room), 3906 (read-only), 823 (input or output error), 824
// (damaged), 208 (another session dropped the table), 7119 (a value too large). The library's own texts never get out:
// what has no number there is one failure with the native number 0, which no statement should come to.
[[noreturn]] void throwStorageFailure(sqlite3* handle, int code);

using tsql::timeExpired;

// 40515: something of T-SQL that the engine does not have.
Failure unsupported(const std::string& what);

// A value is larger than SQLite can hold.
Failure valueTooLarge();

// 1205: the transaction stands in the way of another one, and is undone.
Failure deadlock();

// 2627 for a row of a table that has the key of one that is there.
Failure duplicateKey(const std::string& table);

}  // namespace QVSa::embedded
