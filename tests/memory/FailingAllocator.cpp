#include "tests/memory/FailingAllocator.h"

#include <cerrno>
#include <cstdint>
#include <cstdlib>
#include <execinfo.h>
#include <limits>
#include <memory>
#include <new>
#include <openssl/crypto.h>
#include <sqlite3.h>
#include <stdexcept>
#include <unordered_set>
#include <utility>

namespace QVSa::test {

namespace {

constexpr long never = std::numeric_limits<long>::max();

long counted = 0;
long firstFailing = never;
Shortage kind = Shortage::once;

struct Notes {
  std::unordered_set<std::uint64_t> callers;
  std::vector<long> firsts;
};
// Not while notes are taken, which asks for memory as well.
Notes* notes = nullptr;

// FNV-1a.
std::uint64_t chainOfCallers() {
  constexpr int most = 64;
  void* callers[most];
  const int depth = ::backtrace(callers, most);
  std::uint64_t hash = 0xCBF29CE484222325U;
  for (int i = 0; i < depth; ++i) hash = (hash ^ reinterpret_cast<std::uintptr_t>(callers[i])) * 0x100000001B3U;
  return hash;
}

void note() {
  Notes* const taken = std::exchange(notes, nullptr);
  const long number = counted;
  if (taken->callers.insert(chainOfCallers()).second) taken->firsts.push_back(number);
  counted = number;
  notes = taken;
}

bool isShort() {
  ++counted;
  if (notes != nullptr) note();
  const bool fails = kind == Shortage::once ? counted == firstFailing : counted >= firstFailing;
  if (fails) errno = ENOMEM;
  return fails;
}

void* allocate(std::size_t size) { return isShort() ? nullptr : std::malloc(size); }

sqlite3_mem_methods ofSqlite;

}  // namespace

FailingAllocations::FailingAllocations(long first, Shortage shortage) {
  counted = 0;
  kind = shortage;
  firstFailing = first;
}

FailingAllocations::~FailingAllocations() { firstFailing = never; }

void startNoting() {
  notes = new Notes();
  counted = 0;
}

std::vector<long> stopNoting() {
  const std::unique_ptr<Notes> taken(std::exchange(notes, nullptr));
  return std::move(taken->firsts);
}

void installFailingAllocator() {
  sqlite3_config(SQLITE_CONFIG_GETMALLOC, &ofSqlite);
  sqlite3_mem_methods failing = ofSqlite;
  failing.xMalloc = [](int size) { return isShort() ? nullptr : ofSqlite.xMalloc(size); };
  failing.xRealloc = [](void* memory, int size) { return isShort() ? nullptr : ofSqlite.xRealloc(memory, size); };
  const auto allocateForOpenSsl = [](std::size_t size, const char*, int) { return allocate(size); };
  const auto reallocate = [](void* memory, std::size_t size, const char*, int) {
    return isShort() ? nullptr : std::realloc(memory, size);
  };
  const auto release = [](void* memory, const char*, int) { std::free(memory); };
  if (sqlite3_config(SQLITE_CONFIG_MALLOC, &failing) != SQLITE_OK ||
      CRYPTO_set_mem_functions(allocateForOpenSsl, reallocate, release) != 1)
    throw std::logic_error("SQLite or OpenSSL was used before");
}

void* allocateOrThrow(std::size_t size) {
  void* const memory = allocate(size);
  if (memory == nullptr) throw std::bad_alloc();
  return memory;
}

}  // namespace QVSa::test

void* operator new(std::size_t size) { return QVSa::test::allocateOrThrow(size); }
// AddressSanitizer has one of its own, which the delete below would not match.
void* operator new(std::size_t size, const std::nothrow_t&) noexcept { return QVSa::test::allocate(size); }
void operator delete(void* memory) noexcept { std::free(memory); }
void operator delete(void* memory, std::size_t) noexcept { std::free(memory); }
