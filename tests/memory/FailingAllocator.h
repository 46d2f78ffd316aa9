#pragma once

#include <vector>

namespace QVSa::test {

// The allocations of this program are those of C++, of SQLite and of OpenSSL, counted together from 1.

// Which allocations of a call fail: one alone, or that one and every later one.
enum class Shortage { once, lasting };

// Fails allocations while it lives. One at a time.
class FailingAllocations {
 public:
  FailingAllocations(long first, Shortage shortage);
  ~FailingAllocations();
  FailingAllocations(const FailingAllocations&) = delete;
  FailingAllocations& operator=(const FailingAllocations&) = delete;
};

// From the one to the other the first allocation of each chain of callers is noted. Their numbers, in order.
void startNoting();
std::vector<long> stopNoting();

// Puts the allocator into SQLite and OpenSSL. Before the first use of either.
void installFailingAllocator();

}  // namespace QVSa::test
