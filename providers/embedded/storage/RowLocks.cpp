#include "providers/embedded/storage/RowLocks.h"

#include <cerrno>
#include <fcntl.h>
#include <system_error>
#include <unistd.h>

#include "providers/embedded/functions/CaseFolding.h"
#include "providers/embedded/functions/Utf8.h"
#include "providers/embedded/storage/OpeningFailure.h"

namespace QVSa::embedded {

namespace {

constexpr int keyBits = 40;
constexpr int hashBits = 23;
constexpr std::int64_t rangeLength = std::int64_t{1} << keyBits;
constexpr std::int64_t usersByte = 0;
constexpr std::int64_t toTheEnd = 0;

// FNV-1a. Every program that opens the installation has to come to the same number.
std::int64_t rangeOf(const std::string& table) {
  std::uint64_t hash = 0xCBF29CE484222325U;
  const char* const end = table.data() + table.size();
  for (const char* at = table.data(); at < end;) hash = (hash ^ foldCase(nextSymbol(at, end))) * 0x100000001B3U;
  const std::uint64_t folded = (hash ^ hash >> 32) % ((std::uint64_t{1} << hashBits) - 1) + 1;
  return static_cast<std::int64_t>(folded << keyBits);
}

std::int64_t byteOf(std::int64_t range, std::int64_t row) { return range + (row & (rangeLength - 1)); }

struct flock rangeLock(short type, std::int64_t start, std::int64_t length) {
  struct flock lock {};  // open file description locks want l_pid to be 0
  lock.l_type = type;
  lock.l_whence = SEEK_SET;
  lock.l_start = start;
  lock.l_len = length;
  return lock;
}

[[noreturn]] void throwLockFailure() {
  throw Failure(number::general, "SQL Server",
                "The lock file cannot be used: " + std::generic_category().message(errno));
}

}  // namespace

RowLocks::RowLocks(const std::filesystem::path& lockFile) : file_(::open(lockFile.c_str(), O_RDWR | O_CLOEXEC)) {
  if (!file_.isOpen()) throw cannotOpenLockFile(lockFile);
}

bool RowLocks::tryLock(const std::string& table, std::int64_t row) {
  const std::int64_t range = rangeOf(table);
  const std::int64_t byte = byteOf(range, row);
  Rows& claimed = held_[range].claimed;
  if (claimed.holds(byte)) return true;
  if (claimed.bytes.size() >= mostRows && setLock(F_WRLCK, range, rangeLength)) return claimed.all = true;
  return take(F_WRLCK, byte, claimed);
}

bool RowLocks::tryMark(const std::string& table, std::int64_t row) {
  const std::int64_t range = rangeOf(table);
  const std::int64_t byte = byteOf(range, row);
  Held& held = held_[range];
  if (held.claimed.holds(byte) || held.marked.holds(byte)) return true;
  if (held.marked.bytes.size() >= mostRows && tryMark(table)) return true;
  return take(F_RDLCK, byte, held.marked);
}

bool RowLocks::tryMark(const std::string& table) {
  const std::int64_t range = rangeOf(table);
  Held& held = held_[range];
  if (held.claimed.all || held.marked.all) return true;
  // A mark over this session's own claims would let them go.
  if (!held.claimed.bytes.empty()) return held.claimed.all = setLock(F_WRLCK, range, rangeLength);
  return held.marked.all = setLock(F_RDLCK, range, rangeLength);
}

bool RowLocks::othersHold(const std::string& table, std::int64_t row) const {
  struct flock lock = rangeLock(F_WRLCK, byteOf(rangeOf(table), row), 1);
  if (::fcntl(file_.get(), F_OFD_GETLK, &lock) != 0) throwLockFailure();
  return lock.l_type != F_UNLCK;
}

void RowLocks::release() {
  if (held_.empty()) return;
  setLock(F_UNLCK, rangeLength, toTheEnd);
  held_.clear();
}

bool RowLocks::tryEnter() {
  entered_ = entered_ || alone_ || setLock(F_RDLCK, usersByte, 1);
  return entered_;
}

void RowLocks::leave() {
  if (entered_ && !alone_) setLock(F_UNLCK, usersByte, 1);
  entered_ = false;
}

bool RowLocks::tryTakeAlone() {
  alone_ = alone_ || setLock(F_WRLCK, usersByte, 1);
  return alone_;
}

void RowLocks::endAlone() {
  if (alone_) setLock(entered_ ? F_RDLCK : F_UNLCK, usersByte, 1);
  alone_ = false;
}

bool RowLocks::setLock(short type, std::int64_t start, std::int64_t length) {
  struct flock lock = rangeLock(type, start, length);
  if (::fcntl(file_.get(), F_OFD_SETLK, &lock) == 0) return true;
  if (errno == EAGAIN || errno == EACCES) return false;
  throwLockFailure();
}

bool RowLocks::take(short type, std::int64_t byte, Rows& rows) {
  // Noted first: a lock that nobody knows of would never be let go.
  const auto noted = rows.bytes.insert(byte).first;
  if (setLock(type, byte, 1)) return true;
  rows.bytes.erase(noted);
  return false;
}

}  // namespace QVSa::embedded
