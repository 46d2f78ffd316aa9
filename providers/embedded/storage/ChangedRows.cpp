#include "providers/embedded/storage/ChangedRows.h"

namespace QVSa::embedded {

ChangedRows::ChangedRows(sqlite3* handle, RowLocks& locks, const std::string& table)
    : handle_(handle), locks_(locks), table_(table) {
  sqlite3_update_hook(handle_, onChange, this);
}

ChangedRows::~ChangedRows() { sqlite3_update_hook(handle_, nullptr, nullptr); }

bool ChangedRows::areMarked(std::int64_t changes) {
  if (failure_) std::rethrow_exception(failure_);
  // A delete of all rows empties the table without a look at each.
  if (seen_ < changes) anyClaimed_ = !locks_.tryMark(table_);
  return claimed_.empty() && !anyClaimed_;
}

bool ChangedRows::markRest() {
  while (!claimed_.empty() && locks_.tryMark(table_, claimed_.back())) claimed_.pop_back();
  anyClaimed_ = anyClaimed_ && !locks_.tryMark(table_);
  return claimed_.empty() && !anyClaimed_;
}

// Called by SQLite, which no exception may pass through.
void ChangedRows::onChange(void* self, int operation, const char*, const char*, sqlite3_int64 row) {
  auto& rows = *static_cast<ChangedRows*>(self);
  ++rows.seen_;
  if (operation == SQLITE_INSERT || rows.failure_) return;
  try {
    rows.mark(row);
  } catch (...) {
    rows.failure_ = std::current_exception();
  }
}

void ChangedRows::mark(std::int64_t row) {
  if (!locks_.tryMark(table_, row)) claimed_.push_back(row);
}

}  // namespace QVSa::embedded
