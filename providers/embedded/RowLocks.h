#pragma once

#include <cstdint>
#include <filesystem>
#include <map>
#include <set>
#include <string>

namespace QVSa::embedded {

// One session's row locks on one database: byte ranges of a lock file beside it, held by this object's own open file,
// so that they hold between connections and processes and vanish with either. A row's byte is 23 bits of its table's
// hash and 40 bits of its key (file offsets have 63 bits); rows that share a byte lock each other, which costs a wait
// and never a wrong result. The range of hash 0 belongs to no table: there
// a session tells that it uses the database, or that it has it alone. Above 1,000 rows of a table the whole table's
// range is locked, unless another session holds a row of it. The lock file is made with the installation and never
// renamed or made anew.
class RowLocks {
 public:
  static constexpr std::size_t mostRows = 1000;

  // Throws 4060 where the file cannot be opened.
  explicit RowLocks(const std::filesystem::path& lockFile);
  ~RowLocks();
  RowLocks(const RowLocks&) = delete;
  RowLocks& operator=(const RowLocks&) = delete;

  // Takes the row's lock at once or not at all. A row locked already counts as taken.
  bool tryLock(const std::string& table, std::int64_t row);
  // Whether any other session holds a row of the table.
  bool othersHold(const std::string& table) const;
  // Whether any other session holds this row.
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
  struct Held {
    std::set<std::int64_t> rows;
    bool whole = false;
  };

  bool setLock(short type, std::int64_t start, std::int64_t length);
  bool take(std::int64_t start, std::int64_t length);
  bool isTaken(std::int64_t start, std::int64_t length) const;

  int file_;
  std::map<std::int64_t, Held> held_;  // by the start of the table's range
  bool entered_ = false;
  bool alone_ = false;
};

}  // namespace QVSa::embedded
