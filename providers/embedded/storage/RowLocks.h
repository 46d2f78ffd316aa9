#pragma once

#include <cstdint>
#include <filesystem>
#include <map>
#include <set>
#include <string>

#include "platform/FileDescriptor.h"

namespace QVSa::embedded {

// One session's row locks on one database: byte ranges of a lock file beside it, held by this object's own open file,
// so that they hold between connections and processes and vanish with either. A row's byte is 23 bits of its table's
// hash and 40 bits of its key (file offsets have 63 bits); rows that share a byte lock each other, which costs a wait
// and never a wrong result. The range of hash 0 belongs to no table: there a session tells that it uses the database,
// or that it has it alone. Above 1,000 rows of a table the whole table's range is locked, unless another session holds
// a row of it. The lock file is made with the installation and never renamed or made anew.
//
// A row is claimed by one session (xlock), or marked by whoever changes it. Marks stand beside each other, since only
// one session at a time has the write lock of the database and the marks of the last one may outlive its commit for a
// moment; what is marked can't be claimed, and what is claimed can't be marked by another.
class RowLocks {
 public:
  static constexpr std::size_t mostRows = 1000;

  // Throws 4060 where the file cannot be opened.
  explicit RowLocks(const std::filesystem::path& lockFile);
  RowLocks(const RowLocks&) = delete;
  RowLocks& operator=(const RowLocks&) = delete;

  // Claims the row, at once or not at all. A row claimed already counts as taken.
  bool tryLock(const std::string& table, std::int64_t row);
  // Marks a row, or all rows of a table, at once or not at all. What is claimed or marked already counts as marked.
  bool tryMark(const std::string& table, std::int64_t row);
  bool tryMark(const std::string& table);
  // Whether any other session holds this row, claimed or marked.
  bool othersHold(const std::string& table, std::int64_t row) const;
  // Lets every row go.
  void release();

  // Byte 0 tells who uses the database. A session that uses it stands in it; one may have it alone where no other
  // stands in it, and nobody else can enter then. Each of the two at once or not at all.
  bool tryEnter();
  void leave();
  bool tryTakeAlone();
  void endAlone();
  bool isAlone() const { return alone_; }
  bool empty() const { return held_.empty(); }

 private:
  struct Rows {
    std::set<std::int64_t> bytes;
    bool all = false;

    bool holds(std::int64_t byte) const { return all || bytes.contains(byte); }
  };
  struct Held {
    Rows claimed;
    Rows marked;
  };

  bool setLock(short type, std::int64_t start, std::int64_t length);
  bool take(short type, std::int64_t byte, Rows& rows);

  platform::FileDescriptor file_;
  std::map<std::int64_t, Held> held_;  // by the start of the table's range; made before the first lock in it
  bool entered_ = false;
  bool alone_ = false;
};

}  // namespace QVSa::embedded
