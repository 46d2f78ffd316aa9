#pragma once

#include <chrono>
#include <memory>
#include <mutex>
#include <optional>
#include <vector>

#include "providers/odbc/Link.h"

namespace QVSa::odbc {

// An open connection that nobody uses. It stands in master, outside a transaction, as a new one would.
struct KeptLink {
  std::unique_ptr<Link> link;
  std::chrono::steady_clock::time_point since;
};

// The connections that this process keeps open for the next session of the same identity. One whose time is over is
// closed by the next call of anybody; a child of a fork has none. For any thread.
class Pool {
 public:
  static Pool& instance();

  // The one that was given back last.
  std::optional<KeptLink> take(const String& identity);
  void give(const String& identity, std::unique_ptr<Link> link, std::chrono::seconds keep);
  // Closes all.
  void clear();

 private:
  struct Entry {
    String identity;
    KeptLink kept;
    std::chrono::steady_clock::time_point end;
  };
  // Those that are to be closed, once the lock is open again.
  std::vector<Entry> removeStale();

  std::mutex mutex_;
  std::vector<Entry> entries_;  // in the order of their return
};

}  // namespace QVSa::odbc
