#include "providers/odbc/Pool.h"

#include <algorithm>
#include <functional>

namespace QVSa::odbc {

namespace {

using Clock = std::chrono::steady_clock;

// More callers at one time than this are rare, and each open connection costs the server memory.
constexpr std::size_t mostKept = 16;

}  // namespace

Pool& Pool::instance() {
  // Never destroyed: a host may call with its last statics.
  static auto& pool = *new Pool();
  return pool;
}

std::optional<KeptLink> Pool::take(const String& identity) {
  std::vector<Entry> stale;
  const std::lock_guard guard(mutex_);
  stale = removeStale();
  const auto found =
      std::find_if(entries_.rbegin(), entries_.rend(), [&](const Entry& entry) { return entry.identity == identity; });
  if (found == entries_.rend()) return std::nullopt;
  std::optional<KeptLink> result(std::move(found->kept));
  entries_.erase(std::next(found).base());
  return result;
}

void Pool::give(const String& identity, std::unique_ptr<Link> link, std::chrono::seconds keep) {
  const auto now = Clock::now();
  std::vector<Entry> stale;
  const std::lock_guard guard(mutex_);
  stale = removeStale();
  if (entries_.size() == mostKept) {
    stale.push_back(std::move(entries_.front()));
    entries_.erase(entries_.begin());
  }
  entries_.push_back({identity, {std::move(link), now}, now + keep});
}

void Pool::clear() {
  std::vector<Entry> all;
  const std::lock_guard guard(mutex_);
  all.swap(entries_);
}

std::vector<Pool::Entry> Pool::removeStale() {
  const auto now = Clock::now();
  const auto isStale = [&](const Entry& entry) { return entry.end <= now || !entry.kept.link->isOwn(); };
  const auto first = std::stable_partition(entries_.begin(), entries_.end(), std::not_fn(isStale));
  std::vector<Entry> result(std::make_move_iterator(first), std::make_move_iterator(entries_.end()));
  entries_.erase(first, entries_.end());
  return result;
}

}  // namespace QVSa::odbc
