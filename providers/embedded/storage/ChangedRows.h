#pragma once

#include <cstdint>
#include <exception>
#include <sqlite3.h>
#include <string>
#include <vector>

#include "providers/embedded/storage/RowLocks.h"

namespace QVSa::embedded {

// While it lives, each row of the table that a statement of the handle updates or deletes is marked, as it is changed:
// the session has the write lock and runs no other write meanwhile.
class ChangedRows {
 public:
  ChangedRows(sqlite3* handle, RowLocks& locks, const std::string& table);
  ~ChangedRows();
  ChangedRows(const ChangedRows&) = delete;
  ChangedRows& operator=(const ChangedRows&) = delete;

  // To be called when the statement has run, with the number of rows that it changed. Whether all of them are marked;
  // else other sessions have claimed some.
  bool areMarked(std::int64_t changes);
  // Tries to mark the rows that others had claimed. Whether all are marked now.
  bool markRest();

 private:
  static void onChange(void* self, int operation, const char* database, const char* table, sqlite3_int64 row);
  void mark(std::int64_t row);

  sqlite3* handle_;
  RowLocks& locks_;
  const std::string& table_;
  std::int64_t seen_ = 0;
  std::vector<std::int64_t> claimed_;
  bool anyClaimed_ = false;  // somewhere in the table
  std::exception_ptr failure_;
};

}  // namespace QVSa::embedded
