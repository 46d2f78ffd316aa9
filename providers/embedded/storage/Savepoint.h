#pragma once

#include "providers/embedded/storage/Handle.h"

namespace QVSa::embedded {

// Several statements of SQLite that are done all or not at all, within the handle's transaction or, where none is open,
// in one of their own. What was not released is undone.
class Savepoint {
 public:
  // Takes the write lock of the database first, so that what is read behind it is newer than the wait.
  Savepoint(Handle& handle, std::size_t database) : handle_(handle) {
    handle_.execute("savepoint whole");
    try {
      handle_.takeWriter(database);
    } catch (...) {
      undo();
      throw;
    }
  }
  ~Savepoint() {
    if (!released_) undo();
  }
  Savepoint(const Savepoint&) = delete;
  Savepoint& operator=(const Savepoint&) = delete;

  void release() {
    handle_.execute("release whole");
    released_ = true;
  }

 private:
  void undo() noexcept {
    // A failure that ended the whole transaction has undone this, too.
    if (handle_.inTransaction())
      sqlite3_exec(handle_.get(), "rollback to whole; release whole", nullptr, nullptr, nullptr);
  }

  Handle& handle_;
  bool released_ = false;
};

}  // namespace QVSa::embedded
