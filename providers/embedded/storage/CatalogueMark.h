#pragma once

#include <atomic>
#include <cstdint>
#include <filesystem>

namespace QVSa::embedded {

// A number in memory that all processes share which have an installation open: as long as it stays, what one of them
// read of the definitions and the log-ins still holds. Looking at it costs next to nothing, which counts because every
// operation of the library opens a session anew. It is odd while somebody changes definitions, and stays odd where he
// died in it, up to the next change: then it says nothing, and the files have to be asked.
class CatalogueMark {
 public:
  // Lies at the start of `file`, whose bytes nobody else writes. Throws 4060 where the file can't be used.
  explicit CatalogueMark(const std::filesystem::path& file);
  ~CatalogueMark();
  CatalogueMark(const CatalogueMark&) = delete;
  CatalogueMark& operator=(const CatalogueMark&) = delete;

  std::uint64_t value() const { return number().load(); }
  static bool isSettled(std::uint64_t value) { return value % 2 == 0; }

 private:
  friend class CatalogueChange;

  std::atomic_ref<std::uint64_t> number() const { return std::atomic_ref(*place_); }

  std::uint64_t* place_;
};

// From before the first definition until after the commit.
class CatalogueChange {
 public:
  explicit CatalogueChange(const CatalogueMark& mark);
  ~CatalogueChange();
  CatalogueChange(const CatalogueChange&) = delete;
  CatalogueChange& operator=(const CatalogueChange&) = delete;

 private:
  const CatalogueMark& mark_;
};

}  // namespace QVSa::embedded
